// The search as you type of the frame's search edit, over the drawing list and the grid.
#pragma once

#include <string>

// Finds the first drawing whose name starts with text (case ignored, the name strictly longer), clears
// every other selection, brings the match into view selected, makes it (or the first drawing when
// nothing matched) the current drawing with the title to match, and enables the pick. An empty text or
// an empty list changes nothing. The window that had the focus keeps it.
void RunSearch(const std::string& text);
