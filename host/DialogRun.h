// The invisible modal dialog whose loop the explorer lives in. The explorer ends it by posting
// WM_ORVEX_RESULT with kAppAccept (picked) or kAppCancel (cancelled).
#pragma once

#include "framework/afxwin.h"

#include "res/resource.h"

class CDialogRun : public CDialog {
public:
    // Shown without activation: the keyboard stays in the explorer the dialog has opened.
    CDialogRun() : CDialog(IDD_DIALOG_RUN, nullptr) { m_nShowCommand = SW_SHOWNA; }
    // Stops being the application's main window: the next run must not take it for its owner.
    ~CDialogRun() override;

protected:
    bool OnInitDialog() override;
    bool PreTranslateMessage(MSG* pMsg) override;
};
