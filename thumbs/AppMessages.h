// The explorer's own window messages, in one place for the library, its tests and the development host.
//
// The run dialog is the application's main window while the explorer is open: the explorer tells it what
// the user decided with WM_ORVEX_RESULT, and the dialog's loop ends the call with it. The grid view asks
// itself to rescan with WM_ORVEX_REFRESH once the message being handled is done, and to make the rows
// below its client area with WM_ORVEX_MORE_ROWS once it has drawn; the folder tree walks
// to the folder the explorer starts in with WM_ORVEX_WALK_START and opens it with WM_ORVEX_OPEN_TARGET
// once the first pictures are drawn, having taken the shell's icons with WM_ORVEX_TREE_ICONS.
#pragma once

#include <windows.h>

// Posted to the application's main window; wParam is an AppResult.
constexpr UINT WM_ORVEX_RESULT = WM_APP;
// Posted to the grid view: rescan the current folder and rebuild.
constexpr UINT WM_ORVEX_REFRESH = WM_USER + 0x321;
// Posted to the folder tree: open the node its walk reached, once the pictures are up.
constexpr UINT WM_ORVEX_OPEN_TARGET = WM_USER + 0x322;
// Posted to the folder tree: walk along the start folder's label path and select the folder reached.
constexpr UINT WM_ORVEX_WALK_START = WM_USER + 0x323;
// Posted to the grid view by itself: make the windows of the pool rows its layout left for later.
constexpr UINT WM_ORVEX_MORE_ROWS = WM_USER + 0x325;
// The grid tells its picture loader what the screen wants now, once the message being handled is done.
constexpr UINT WM_ORVEX_PICTURES = WM_USER + 0x326;
// Posted to the folder tree by itself when created: take the shell's image list of small icons.
constexpr UINT WM_ORVEX_TREE_ICONS = WM_USER + 0x324;

// What the user decided, as WM_ORVEX_RESULT carries it.
enum AppResult : WPARAM {
    kAppAccept = 1, // take the chosen drawing
    kAppCancel = 2, // leave without one
};

// Posts WM_ORVEX_RESULT with `result` to the application's main window; false when there is none.
bool PostAppResult(AppResult result);
