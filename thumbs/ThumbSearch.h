// The search as you type of the frame's search edit, over the drawing list and the grid.
#pragma once

#include <string>

// Finds the first drawing whose name starts with text (case ignored; a whole name matches too), clears
// every other selection, brings the match into view selected and makes it the current drawing with the
// title to match and the pick enabled. Without a match nothing is selected or current, the pick is
// disabled, the title shows the folder and the status bar says that no drawing starts with the text.
// An empty text or an empty list changes nothing but the status message. The window that had the focus
// keeps it.
void RunSearch(const std::string& text);

// Makes the drawing of that name (case ignored) the chosen one, as a search hit would; false when the
// list has no such drawing. The explorer chooses the drawing of the last run this way.
bool ChooseDrawing(const std::string& name);

// The status bar's message when no drawing name starts with text.
std::string NoMatchMessage(const std::string& text);
