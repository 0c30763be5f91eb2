// The left pane while the folder tree is not part of the build: an empty view.
#include "frame/FolderPaneLink.h"

#include "frame/LeftPaneView.h"

CView* NewFolderPaneView() {
    return new CLeftPaneView;
}

void ReselectFolderTree() {}

bool HasFolderTree() {
    return false;
}
