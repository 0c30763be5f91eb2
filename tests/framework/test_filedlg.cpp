// The framework's check box, save-file dialog and message box in real windows under Wine. The dialogs are
// answered by a thread timer that finds them and presses a button, as a person would.
#include "afxfiledlg.h"
#include "test_support.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace {

// Finds the visible dialog of this thread titled `title` and answers it: fills the file name (when
// `name` is not empty) and presses `button`.
struct Answer {
    static std::string title, name, seenText;
    static int button;
    static bool seen;
    static BOOL CALLBACK Visit(HWND hwnd, LPARAM) {
        char cls[32] = "", text[256] = "";
        ::GetClassNameA(hwnd, cls, sizeof cls);
        ::GetWindowTextA(hwnd, text, sizeof text);
        if (std::strcmp(cls, "#32770") != 0 || !::IsWindowVisible(hwnd) || title != text)
            return TRUE;
        seen = true;
        if (HWND message = ::GetDlgItem(hwnd, 0xFFFF)) {
            char body[256] = "";
            ::GetWindowTextA(message, body, sizeof body);
            seenText = body;
        }
        if (!name.empty()) {
            HWND edit = ::GetDlgItem(hwnd, 0x480);
            if (!edit)
                edit = ::GetDlgItem(hwnd, 0x47c);
            if (edit)
                ::SetWindowTextA(edit, name.c_str());
        }
        ::PostMessageA(hwnd, WM_COMMAND, MAKEWPARAM(button, BN_CLICKED), 0);
        return TRUE;
    }
    static void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD) {
        ::EnumThreadWindows(::GetCurrentThreadId(), &Visit, 0);
    }
    static UINT_PTR Start(const std::string& t, const std::string& n, int b) {
        title = t;
        name = n;
        button = b;
        seen = false;
        seenText.clear();
        return ::SetTimer(nullptr, 0, 200, &Tick);
    }
};
std::string Answer::title, Answer::name, Answer::seenText;
int Answer::button = IDOK;
bool Answer::seen = false;

std::string TempDir() {
    char path[MAX_PATH] = "";
    ::GetTempPathA(MAX_PATH, path);
    return path;
}

} // namespace

TEST(CheckBox, KeepsItsCheck) {
    CWnd parent;
    ASSERT_TRUE(parent.CreateEx(0, nullptr, "parent", WS_OVERLAPPEDWINDOW, SomeRect(), nullptr, 0));
    CButton box;
    ASSERT_TRUE(box.Create("Delete the file", WS_CHILD | WS_VISIBLE | BS_AUTOCHECKBOX, CRect(5, 5, 200, 25),
                           &parent, 1040));
    EXPECT_EQ(box.GetCheck(), BST_UNCHECKED);
    box.SetCheck(BST_CHECKED);
    EXPECT_EQ(box.GetCheck(), BST_CHECKED);
    // A click toggles an automatic check box.
    box.SendMessage(BM_CLICK);
    EXPECT_EQ(box.GetCheck(), BST_UNCHECKED);
    EXPECT_EQ(box.GetWindowText(), "Delete the file");
    parent.DestroyWindow();
}

TEST(FileDialog, SaveReturnsTheChosenPathAndTitle) {
    const std::string target = TempDir() + "orvex-save-test.dwg";
    CFileDialog dialog(false, nullptr, "start.dwg", OFN_HIDEREADONLY, "All files (*.*)|*.*||");
    dialog.m_strTitle = "Copy file";
    const UINT_PTR timer = Answer::Start("Copy file", target, IDOK);
    EXPECT_EQ(dialog.DoModal(), IDOK);
    ::KillTimer(nullptr, timer);
    EXPECT_TRUE(Answer::seen);
    EXPECT_EQ(dialog.GetPathName(), target);
    EXPECT_EQ(dialog.GetFileName(), "orvex-save-test.dwg");
}

TEST(FileDialog, CancelKeepsTheStartName) {
    CFileDialog dialog(false, nullptr, "start.dwg", OFN_HIDEREADONLY, "All files (*.*)|*.*||");
    dialog.m_strTitle = "Copy file";
    const UINT_PTR timer = Answer::Start("Copy file", "", IDCANCEL);
    EXPECT_EQ(dialog.DoModal(), IDCANCEL);
    ::KillTimer(nullptr, timer);
    EXPECT_EQ(dialog.GetPathName(), "start.dwg");
}

TEST(AfxMessageBoxTest, ShowsTheTextUnderTheApplicationsNameAndGivesTheAnswer) {
    const UINT_PTR timer = Answer::Start(AfxGetApp() ? AfxGetApp()->m_strAppName : std::string(), "", IDYES);
    EXPECT_EQ(AfxMessageBox("Cannot copy file:C:\\a.dwg", MB_YESNO), IDYES);
    ::KillTimer(nullptr, timer);
    EXPECT_TRUE(Answer::seen);
    EXPECT_EQ(Answer::seenText, "Cannot copy file:C:\\a.dwg");
}
