// The search as you type of the frame's search edit: CTessel3View::RunSearch and ChooseDrawing carry it
// out over the drawing list and the grid; this is the text it leaves in the status bar.
#pragma once

#include <string>

// The status bar's message when no drawing name starts with text.
std::string NoMatchMessage(const std::string& text);
