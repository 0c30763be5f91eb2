// The invisible modal dialog whose loop the explorer lives in. The explorer ends it by posting
// WM_ORVEX_RESULT with kAppAccept (picked) or kAppCancel (cancelled).
#pragma once

#include "frame/ExplorerCall.h"
#include "framework/afxwin.h"

#include "res/resource.h"

#include <utility>

class CMdiMixin;

class CDialogRun : public CDialog {
public:
    // `app` creates the explorer for `call` when the dialog initialises. Shown without activation: the
    // keyboard stays in the explorer the dialog has opened.
    CDialogRun(CMdiMixin& app, ExplorerCall call)
        : CDialog(IDD_DIALOG_RUN, nullptr), m_app(app), m_call(std::move(call)) {
        m_nShowCommand = SW_SHOWNA;
    }
    // Stops being the application's main window: the next run must not take it for its owner.
    ~CDialogRun() override;

protected:
    bool OnInitDialog() override;
    bool PreTranslateMessage(MSG* pMsg) override;

private:
    CMdiMixin& m_app;
    const ExplorerCall m_call;
};
