// Shows a drawing's preview in a thumbnail window (Windows build only).
#pragma once

#include <windows.h>

#include <cstdint>

// Through the host's preview operation when the host has one; otherwise the library draws the picture
// itself, so a host without the operation still shows previews (said once on the command line).
// fileName as the host takes it: a bare name is resolved against the current directory.
bool ShowDwgPreview(HWND window, const wchar_t* fileName, std::uint32_t background);

// Says once on the command line when the host lacks its preview operation, that the library draws the
// previews itself (the picture loader draws them without the operation, so nothing else would say it).
void NoteHostPreviewOperation();
