// Shared helpers of the framework tests that run in real windows under Wine.
#pragma once

#include "afxwin.h"
#include "resource.h"
#include "tests/support/MessagePump.h"

#include <string>
#include <vector>

// Collects what the error reporter was given while it is alive, then puts the previous reporter back.
class ReportCapture {
public:
    ReportCapture() { m_previous = AfxSetErrorReporter(&ReportCapture::Record); }
    ~ReportCapture() { AfxSetErrorReporter(m_previous); }
    ReportCapture(const ReportCapture&) = delete;
    ReportCapture& operator=(const ReportCapture&) = delete;
    static std::vector<std::string>& Reports() {
        static std::vector<std::string> reports;
        return reports;
    }

private:
    static void Record(const char* text) { Reports().emplace_back(text); }
    AFX_ERROR_REPORTER m_previous;
};

inline CRect SomeRect() {
    return CRect(10, 10, 310, 210);
}

// The update handler the test windows share: the grey command is disabled, the check command checked.
inline bool UpdateTestCommand(CCmdUI* pCmdUI) {
    switch (pCmdUI->m_nID) {
    case ID_TEST_GREY:
        pCmdUI->Enable(false);
        return true;
    case ID_TEST_CHECK:
        pCmdUI->SetCheck(1);
        return true;
    default:
        return false;
    }
}
