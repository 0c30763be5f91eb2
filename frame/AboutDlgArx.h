// The about box (dialog resource 100).
#pragma once

#include "framework/afxwin.h"

#include "res/resource.h"

class CAboutDlgArx : public CDialog {
public:
    explicit CAboutDlgArx(CWnd* parent = nullptr) : CDialog(IDD_ABOUTBOX, parent) {}
};
