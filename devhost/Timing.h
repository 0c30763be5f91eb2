// --timing: "[timing] MS WHAT ..." lines that let a benchmark see how fast the library answers, MS being
// milliseconds (three decimals) since the running LISP call began, less the time devhost spent measuring
// (counting windows, writing these lines). Used on the user-interface thread, but for the script's input
// marks.
//
//   [timing] 0.000 call                   the call begins (the clock starts)
//   [timing] MS preview DRAWN/VISIBLE NAME a preview was drawn into a window, by the host's preview
//                                          operation or by the library from a picture it keeps in memory
//                                          (SetDIBitsToDevice, seen in its import table; NAME is then the
//                                          label under the window): VISIBLE windows of that window's class
//                                          are shown inside their parent's client area (the thumbnails one
//                                          can see), DRAWN of them have had a preview drawn since they were
//                                          created
//   [timing] MS opened N                  printed before each key line and at the call's end: N drawing
//                                          files opened in the process so far, on any thread (the
//                                          library's reads, the host's preview operation's)
//   [timing] MS key VK                    the user-interface thread took a key press (WM_KEYDOWN) from its
//                                          queue; VK is the virtual-key code in decimal
//   [timing] MS key-handled               the next message it took after that key: the key's handling
//                                          had ended
//   [timing] MS longest-unanswered W      at the call's end: the longest time W (ms) a WM_NULL sent to the
//                                          explorer's frame every 10 ms by a thread of devhost waited for
//                                          the user-interface thread to take it
//   [timing] MS call-end                  the call returned
//   [timing] MS create CLASS in PARENT    the thread is about to create a window of CLASS, child of a
//                                          window of PARENT ("-": a top-level window)
//   [timing] MS activate CLASS            a window of CLASS is about to be activated
//   [timing] MS show CLASS SW             one is about to be minimised, maximised or restored (SW_ code)
//   [timing] MS focus CLASS from OLD      the keyboard focus is about to move to a window of CLASS
//   [timing] MS paint CLASS               the thread took the first WM_PAINT of a window of CLASS
//   [timing] MS settings-look NAME        the library asked for the attributes of the settings file NAME
//                                          ("*.ini", last part of its path): the settings read begins
//   [timing] MS settings-open NAME        it opened that file to read it
//   [timing] MS scan-begin PATTERN        the library began a folder search
//   [timing] MS scan-end N entries        it closed the search after N entries
//   [timing] MS input key VK              the script sent a key press (from the script's thread)
#pragma once

#include <windows.h>

#include <string>

namespace devhost {

// Watches the library's settings file reads and folder scans through its import table.
void TimingWatchLibrary(HMODULE library);
void TimingCallBegins();
void TimingCallEnded();
void TimingPreviewDrawn(HWND window, const wchar_t* fileName);
// The script sent input (WHAT, e.g. "key 27"), during a call: "[timing] MS input WHAT". Any thread.
void TimingInputSent(const std::wstring& what);

} // namespace devhost
