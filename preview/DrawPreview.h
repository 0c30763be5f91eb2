// Draws the preview stored in a drawing file into a device context (Windows build only).
#pragma once

#include <windows.h>

// Fills area with background and draws the file's preview in it, scaled to fit, centred, aspect kept.
// A file without a usable preview gets the background and a small "no preview" mark; false then.
bool DrawDwgPreview(HDC dc, const RECT& area, const wchar_t* fileName, COLORREF background);

// The same over the whole client area of window; false also when window is not a window.
bool DrawDwgPreviewInWindow(HWND window, const wchar_t* fileName, COLORREF background);

struct DwgPreview;
// The same for a preview already read.
bool DrawDwgPreviewImage(HDC dc, const RECT& area, const DwgPreview& preview, COLORREF background);
