// What the frame uses of the thumbnail grid: the view of the right pane, its rebuild after a scan, its
// picture size, and the search by name prefix. One source file implements it: the grid of thumbs/ when
// it is built, otherwise an empty pane so the frame stands without it.
#pragma once

#include <string>

class CView;
class CWnd;
class CTessel3View;

// Makes the right pane's view object (heap; it deletes itself with its window).
CView* NewGridView();
// The grid view's window while it exists, else nullptr.
CWnd* GridViewWindow();
// The grid view itself, nullptr when there is none.
CTessel3View* GridView();
// Lays out the drawings of the freshly scanned list again.
void RebuildGrid();
// The grid's current picture size (0 × 0 without a grid).
void GridPictureSize(int& width, int& height);
// Runs the search edit's search by name prefix.
void SearchDrawings(const std::string& text);
// Chooses the drawing of that name, as a search hit would (the drawing of the last run).
void ChooseSavedDrawing(const std::string& name);
