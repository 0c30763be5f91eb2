// The left pane of the explorer's splitter until the folder tree takes its place: an empty view.
#pragma once

#include "framework/afxview.h"

class CLeftPaneView : public CView {};
