// The invisible modal dialog whose loop the explorer lives in. The explorer ends it by posting the
// first application message with 1 (picked) or 2 (cancelled).
#pragma once

#include "framework/afxwin.h"

#include "res/resource.h"

constexpr UINT WM_ORVEX_RESULT = WM_APP; // wParam: 1 accept, 2 cancel

class CDialogRun : public CDialog {
public:
    CDialogRun() : CDialog(IDD_DIALOG_RUN, nullptr) {}
    // Stops being the application's main window: the next run must not take it for its owner.
    ~CDialogRun() override;

protected:
    bool OnInitDialog() override;
    bool PreTranslateMessage(MSG* pMsg) override;
};
