// What the thumbnail browser asks of the explorer frame, in one place: the sort mode, the pick button,
// the title, the status, the messages to the user, the folder pane and the frame window itself. The explorer
// links frame/GridLinkThumbs.cpp, which goes through g_pMainFrame; test programs link a stand-in of their
// own. Every function copes with a missing frame (there is none outside a call of the LISP function).
#pragma once

#include <windows.h>

#include <string>

class CWnd;

// Sort mode kept by the frame: 0 by name, 1 by date, 2 by size.
int FrameSortMode();
// Enables or disables the pick (the accept button and its label).
void FrameEnablePick(bool enable);
// Sets the frame's window text.
void FrameSetTitle(const std::string& text);
// Refreshes what the frame shows about the current folder (the layer label).
void FrameUpdateStatus();
// Puts a message in the status bar (empty clears it).
void FrameSetStatusText(const std::string& text);
// Tells the user something that needs an answer before going on (a message box over the frame).
void FrameTellUser(const std::string& text);
// Gives the keyboard focus to the folder tree in the frame's left pane.
void FrameFocusFolderTree();
// The frame window the grid lives in (resized by the grid's alignment), or null.
HWND FrameWindow();
