// What the frame uses of the left pane: its view, and the re-selection of the folder tree's current item
// when the explorer is shown. One source file implements it: the folder tree of tree/ when it is built,
// otherwise an empty pane.
#pragma once

class CView;

// Makes the left pane's view object (heap; it deletes itself with its window).
CView* NewFolderPaneView();
// When the tree has a selected item: selects it again as the first visible one, drops the drop highlight
// and the caret, in that order, and gives the tree the focus. Nothing without a tree.
void ReselectFolderTree();
// True when the left pane is the folder tree, which then picks the start folder itself.
bool HasFolderTree();
