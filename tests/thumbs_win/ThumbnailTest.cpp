// The thumbnail control in real windows: clicks and their selection flags, the pick, the tooltip, the
// context menu, rename in the label, and the search of the frame's search edit.
#include "GridTestSupport.h"

#include "hostapi/TextConv.h"
#include "res/resource.h"
#include "tests/support/TempFolder.h"
#include "thumbs/ThumbSearch.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <ctime>
#include <vector>

namespace {

std::string CurrentDir() {
    char buffer[MAX_PATH] = {};
    DWORD n = ::GetCurrentDirectoryA(MAX_PATH, buffer);
    return std::string(buffer, n);
}

void Click(exCDwgThumbnail* control, WPARAM flags, UINT message = WM_LBUTTONDOWN) {
    ASSERT_NE(control, nullptr);
    ::PostMessageA(control->m_hWnd, message, flags, MAKELPARAM(10, 10));
    if (message == WM_LBUTTONDOWN)
        ::PostMessageA(control->m_hWnd, WM_LBUTTONUP, flags & ~static_cast<WPARAM>(MK_LBUTTON),
                       MAKELPARAM(10, 10));
    Pump();
}

bool LabelHighlighted(exCDwgThumbnail* control) {
    if (!control) {
        ADD_FAILURE() << "no thumbnail control";
        return false;
    }
    int start = 0, end = 0;
    control->Label().GetSel(start, end);
    return start == 0 && end == control->Label().GetWindowTextLength() && end > 0;
}

TEST(ThumbnailClick, PlainClickSelectsOnlyThisOne) {
    GridBench bench;
    FillList(12);
    bench.view().Rebuild();
    Pump();
    DwgList[3].Select();
    DwgList[7].Select();
    exCDwgThumbnail* control = bench.view().ControlOf(5);
    ASSERT_NE(control, nullptr);
    Click(control, MK_LBUTTON);
    for (int i = 0; i < 12; ++i)
        EXPECT_EQ(DwgList[i].IsSelected(), i == 5) << i;
    EXPECT_TRUE(LabelHighlighted(control));
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00005.dwg");
    EXPECT_EQ(Frame().title, CurrentDir() + "\\d00005.dwg");
    EXPECT_TRUE(Frame().pickEnabled);
}

TEST(ThumbnailClick, CtrlClickTogglesOnlyThisOne) {
    GridBench bench;
    FillList(12);
    bench.view().Rebuild();
    Pump();
    Click(bench.view().ControlOf(1), MK_LBUTTON);
    Click(bench.view().ControlOf(2), MK_LBUTTON | MK_CONTROL);
    EXPECT_TRUE(DwgList[1].IsSelected());
    EXPECT_TRUE(DwgList[2].IsSelected());
    EXPECT_TRUE(LabelHighlighted(bench.view().ControlOf(2)));
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00002.dwg");
    // Ctrl+click on a selected one deselects only it.
    Click(bench.view().ControlOf(1), MK_LBUTTON | MK_CONTROL);
    EXPECT_FALSE(DwgList[1].IsSelected());
    EXPECT_TRUE(DwgList[2].IsSelected());
    EXPECT_FALSE(LabelHighlighted(bench.view().ControlOf(1)));
    EXPECT_FALSE(Frame().pickEnabled);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "");
    EXPECT_EQ(Frame().title, CurrentDir());
    ASSERT_NE(bench.view().ControlOf(1), nullptr);
    EXPECT_EQ(::GetFocus(), bench.view().ControlOf(1)->m_hWnd);
}

TEST(ThumbnailClick, ShiftClickDoesNothing) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    Click(bench.view().ControlOf(0), MK_LBUTTON);
    const int pickCalls = Frame().pickCalls;
    Click(bench.view().ControlOf(3), MK_LBUTTON | MK_SHIFT);
    EXPECT_TRUE(DwgList[0].IsSelected());
    EXPECT_FALSE(DwgList[3].IsSelected());
    EXPECT_EQ(Frame().pickCalls, pickCalls);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00000.dwg");
}

TEST(ThumbnailClick, DoubleClickPicksTheDrawing) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    Click(bench.view().ControlOf(4), MK_LBUTTON, WM_LBUTTONDBLCLK);
    ASSERT_EQ(Main().results.size(), 1u);
    EXPECT_EQ(Main().results[0], 1u);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00004.dwg");
    EXPECT_EQ(g_pTessel3Doc->m_strPath, CurrentDir());
    EXPECT_EQ(Drawings().ChosenPath(), CurrentDir() + "\\d00004.dwg");
}

TEST(ThumbnailClick, RightClickSelectsWithoutClearingOthers) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    DwgList[0].Select();
    exCDwgThumbnail* control = bench.view().ControlOf(2);
    ASSERT_NE(control, nullptr);
    // The context menu waits for the user: a timer keeps dismissing it until it is gone.
    struct Dismiss {
        static void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD) { ::EndMenu(); }
    };
    const UINT_PTR timer = ::SetTimer(nullptr, 0, 100, &Dismiss::Tick);
    Click(control, MK_RBUTTON, WM_RBUTTONDOWN);
    ::KillTimer(nullptr, timer);
    EXPECT_TRUE(DwgList[0].IsSelected());
    EXPECT_TRUE(DwgList[2].IsSelected());
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00002.dwg");
}

TEST(ThumbnailMenu, PasteGreyedWithoutFilesAndSortModeChecked) {
    GridBench bench;
    if (::OpenClipboard(nullptr)) {
        ::EmptyClipboard();
        ::CloseClipboard();
    }
    Frame().sortMode = 1;
    CMenu menu;
    CMenu popup = BuildThumbnailMenu(menu, bench.view().SortMode(), bench.view().ClipboardHoldsDrawings());
    ASSERT_NE(popup.m_hMenu, nullptr);
    EXPECT_TRUE(popup.GetMenuState(ID_THUMB_PASTE, MF_BYCOMMAND) & MF_GRAYED);
    EXPECT_FALSE(popup.GetMenuState(ID_THUMB_COPY, MF_BYCOMMAND) & MF_GRAYED);
    EXPECT_TRUE(popup.GetMenuState(ID_SORT_DATE, MF_BYCOMMAND) & MF_CHECKED);
    EXPECT_FALSE(popup.GetMenuState(ID_SORT_NAME, MF_BYCOMMAND) & MF_CHECKED);
    EXPECT_FALSE(popup.GetMenuState(ID_SORT_SIZE, MF_BYCOMMAND) & MF_CHECKED);
}

TEST(ThumbnailTooltip, NameSizeAndLocalDateInOneNarrowTip) {
    GridBench bench;
    std::tm local{};
    local.tm_year = 2021 - 1900;
    local.tm_mon = 2;
    local.tm_mday = 5;
    local.tm_hour = 14;
    local.tm_min = 7;
    local.tm_sec = 9;
    local.tm_isdst = -1;
    const __time64_t when = _mktime64(&local);
    BeginScan();
    DwgFindEntry e;
    e.name = "a.dwg";
    e.size = 1234;
    e.timeWrite = when;
    AppendScanEntry(e);
    EndScan();
    bench.view().Rebuild();
    Pump();
    exCDwgThumbnail* control = bench.view().ControlOf(0);
    ASSERT_NE(control, nullptr);
    const std::string expected = "a.dwg               Size=1234          05/03/2021;14.07.09";
    EXPECT_EQ(control->ToolTipText(), expected);

    CToolTipCtrl& tip = control->ToolTip();
    EXPECT_EQ(tip.m_hWnd, nullptr) << "made when the mouse first comes";
    ::PostMessageA(control->m_hWnd, WM_MOUSEMOVE, 0, MAKELPARAM(20, 20));
    Pump();
    ASSERT_NE(tip.m_hWnd, nullptr);
    EXPECT_EQ(tip.GetToolCount(), 1);
    // As wide as the widest line, the date, and a blank, in the tooltip's font: three lines, none broken
    // inside.
    {
        CClientDC dc(tip.m_hWnd);
        const CSelectObject font(dc.GetSafeHdc(), reinterpret_cast<HGDIOBJ>(tip.SendMessage(WM_GETFONT)));
        SIZE date{}, blank{};
        ::GetTextExtentPoint32A(dc.GetSafeHdc(), "05/03/2021;14.07.09", 19, &date);
        ::GetTextExtentPoint32A(dc.GetSafeHdc(), " ", 1, &blank);
        EXPECT_EQ(tip.SendMessage(TTM_GETMAXTIPWIDTH), date.cx + blank.cx);
    }
    char text[256] = {};
    TTTOOLINFOA ti{};
    ti.cbSize = TTTOOLINFOA_V2_SIZE;
    ti.hwnd = control->m_hWnd;
    ti.uId = reinterpret_cast<UINT_PTR>(control->m_hWnd);
    ti.lpszText = text;
    tip.SendMessage(TTM_GETTEXTA, sizeof text, reinterpret_cast<LPARAM>(&ti));
    // Shown on lines of their own, whatever the widths of the characters.
    EXPECT_EQ(std::string(text), "a.dwg\r\nSize=1234\r\n05/03/2021;14.07.09");
}

// ---- rename -------------------------------------------------------------------------------------------

using testsupport::TempFolder;

class RenameTest : public ::testing::Test {
protected:
    void SetUp() override {
        m_folder.Write("a.dwg", "");
        m_folder.Write("b.dwg", "");
        ASSERT_TRUE(ShowFolder(m_folder.Dir()));
        Frame().sortMode = 0;
        m_bench.view().Rebuild();
        Pump();
    }
    CThumbLabel& LabelOf(const std::string& name) {
        for (int i = 0; i < DwgList.GetSize(); ++i) {
            if (DwgList[i].m_strName != name)
                continue;
            if (exCDwgThumbnail* control = m_bench.view().ControlOf(i))
                return control->Label();
            throw std::runtime_error("no control shows " + name);
        }
        throw std::runtime_error("no such drawing");
    }
    void Type(CThumbLabel& label, const std::string& text) {
        ::PostMessageA(label.m_hWnd, WM_KEYDOWN, VK_END, 1);
        for (char c : text)
            ::PostMessageA(label.m_hWnd, WM_CHAR, static_cast<WPARAM>(static_cast<unsigned char>(c)), 1);
        Pump();
    }
    void Key(CThumbLabel& label, WPARAM vk) {
        ::PostMessageA(label.m_hWnd, WM_KEYDOWN, vk, 1);
        Pump();
    }

    GridBench m_bench;
    TempFolder m_folder;
};

TEST_F(RenameTest, DoubleClickOnTheLabelBeginsEnterCommits) {
    CThumbLabel& label = LabelOf("a.dwg");
    ::PostMessageA(label.m_hWnd, WM_LBUTTONDBLCLK, MK_LBUTTON, MAKELPARAM(5, 5));
    Pump();
    EXPECT_TRUE(label.IsRenaming());
    EXPECT_FALSE(label.GetStyle() & ES_READONLY);
    EXPECT_EQ(::GetFocus(), label.m_hWnd);
    Type(label, "x");
    EXPECT_EQ(label.GetWindowText(), "a.dwgx");
    label.SetWindowText("c.dwg");
    Key(label, VK_RETURN);
    EXPECT_FALSE(m_folder.Exists("a.dwg"));
    EXPECT_TRUE(m_folder.Exists("c.dwg"));
    // The folder was scanned again and the grid rebuilt.
    ASSERT_EQ(DwgList.GetSize(), 2);
    EXPECT_EQ(DwgList[0].m_strName == "c.dwg" || DwgList[1].m_strName == "c.dwg", true);
    EXPECT_EQ(LabelOf("c.dwg").GetWindowText(), "c.dwg");
}

TEST_F(RenameTest, EscapeRestoresTheOldName) {
    CThumbLabel& label = LabelOf("a.dwg");
    label.BeginRename();
    Type(label, "zzz");
    Key(label, VK_ESCAPE);
    EXPECT_FALSE(label.IsRenaming());
    EXPECT_EQ(label.GetWindowText(), "a.dwg");
    EXPECT_TRUE(m_folder.Exists("a.dwg"));
    Pump();
    EXPECT_TRUE(Main().results.empty()); // Escape in the label does not cancel the explorer
}

TEST_F(RenameTest, LeavingTheLabelAbandonsTheRename) {
    CThumbLabel& label = LabelOf("a.dwg");
    label.BeginRename();
    Type(label, "zzz");
    m_bench.view().SetFocus();
    Pump();
    EXPECT_FALSE(label.IsRenaming());
    EXPECT_EQ(label.GetWindowText(), "a.dwg");
    EXPECT_TRUE(label.GetStyle() & ES_READONLY);
    EXPECT_TRUE(m_folder.Exists("a.dwg"));
}

TEST_F(RenameTest, FailedRenameRestoresTheOldName) {
    CThumbLabel& label = LabelOf("a.dwg");
    label.BeginRename();
    label.SetWindowText("b.dwg"); // exists already
    Key(label, VK_RETURN);
    EXPECT_EQ(label.GetWindowText(), "a.dwg");
    EXPECT_TRUE(m_folder.Exists("a.dwg"));
    EXPECT_TRUE(label.GetStyle() & ES_READONLY);
    ASSERT_EQ(Frame().toldUser.size(), 1u);
    EXPECT_EQ(Frame().toldUser[0], "Cannot rename to \"b.dwg\": a file of that name already exists.");
}

TEST_F(RenameTest, BadNamesAreRefusedWithAMessageAndTheOldNameBack) {
    const char* bad[] = {"a\\b.dwg", "a/b.dwg", "c:b.dwg",   "a*.dwg", "a?.dwg",   "a\"b.dwg", "a<b.dwg",
                         "a>b.dwg",  "a|b.dwg", "a\x01.dwg", "plan",   "plan.txt", "B.DWG",    "con.dwg"};
    for (const char* name : bad) {
        Frame().toldUser.clear();
        CThumbLabel& label = LabelOf("a.dwg");
        label.BeginRename();
        label.SetWindowText(name);
        Key(label, VK_RETURN);
        EXPECT_EQ(label.GetWindowText(), "a.dwg") << name;
        EXPECT_FALSE(label.IsRenaming()) << name;
        ASSERT_EQ(Frame().toldUser.size(), 1u) << name;
        EXPECT_NE(Frame().toldUser[0].find(std::string("\"") + name + "\""), std::string::npos)
            << Frame().toldUser[0];
        EXPECT_TRUE(m_folder.Exists("a.dwg")) << name;
        EXPECT_TRUE(m_folder.Exists("b.dwg")) << name;
    }
    EXPECT_EQ(DwgList.GetSize(), 2);
}

TEST_F(RenameTest, TheSameNameRenamesNothingAndSaysNothing) {
    BenchFiles().calls.clear();
    CThumbLabel& label = LabelOf("a.dwg");
    label.BeginRename();
    label.SetWindowText("a.dwg");
    Key(label, VK_RETURN);
    EXPECT_EQ(label.GetWindowText(), "a.dwg");
    EXPECT_TRUE(Frame().toldUser.empty());
    EXPECT_TRUE(m_folder.Exists("a.dwg"));
    EXPECT_TRUE(BenchFiles().calls.empty());
}

TEST_F(RenameTest, AChangeOfLetterCaseAloneIsARename) {
    BenchFiles().calls.clear();
    CThumbLabel& label = LabelOf("a.dwg");
    label.BeginRename();
    label.SetWindowText("A.DWG");
    Key(label, VK_RETURN);
    Pump();
    EXPECT_TRUE(Frame().toldUser.empty());
    EXPECT_EQ(BenchFiles().calls, std::vector<std::string>{"rename"}) << "not taken for the same name";
}

// ---- search -------------------------------------------------------------------------------------------

TEST(Search, FindsThePrefixSelectsShowsAndKeepsTheFocus) {
    GridBench bench(700, 600);
    FillList(3000);
    bench.view().Rebuild();
    Pump();
    CEdit edit;
    ASSERT_TRUE(edit.Create(WS_CHILD | WS_VISIBLE, CRect(0, 0, 100, 20), &bench.frame(), 1));
    edit.SetFocus();
    DwgList[0].Select();
    DwgList[10].Select();
    bench.view().RunSearch("D02500");
    EXPECT_TRUE(DwgList[2500].IsSelected());
    EXPECT_FALSE(DwgList[0].IsSelected());
    EXPECT_FALSE(DwgList[10].IsSelected());
    exCDwgThumbnail* control = bench.view().ControlOf(2500);
    ASSERT_NE(control, nullptr);
    EXPECT_TRUE(LabelHighlighted(control));
    EXPECT_EQ(bench.view().GetFirstRow(), 2500 / bench.view().GetColumns());
    EXPECT_EQ(::GetFocus(), edit.m_hWnd);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d02500.dwg");
    EXPECT_EQ(Frame().title, CurrentDir() + "\\d02500.dwg");
    EXPECT_TRUE(Frame().pickEnabled);

    // A whole name matches.
    bench.view().RunSearch("d00007.dwg");
    EXPECT_TRUE(DwgList[7].IsSelected());
    EXPECT_EQ(g_pTessel3Doc->m_strName, "d00007.dwg");
    EXPECT_EQ(bench.view().GetFirstRow(), 7 / bench.view().GetColumns());
    edit.DestroyWindow();
}

TEST(Search, NoMatchChoosesNothingAndSaysSo) {
    GridBench bench(700, 600);
    FillList(300);
    bench.view().Rebuild();
    Pump();
    bench.view().RunSearch("d00150");
    ASSERT_TRUE(DwgList[150].IsSelected());
    ASSERT_TRUE(Frame().pickEnabled);
    const int firstRow = bench.view().GetFirstRow();

    bench.view().RunSearch("xyz");
    EXPECT_FALSE(AnySelected());
    EXPECT_FALSE(LabelHighlighted(bench.view().ControlOf(150)));
    EXPECT_EQ(g_pTessel3Doc->m_strName, "");
    EXPECT_FALSE(Frame().pickEnabled);
    EXPECT_EQ(Frame().title, CurrentDir());
    EXPECT_EQ(Frame().status, "No drawing starts with \"xyz\"");
    EXPECT_EQ(bench.view().GetFirstRow(), firstRow) << "the grid stays where it was";

    // A match again takes the message away.
    bench.view().RunSearch("D00002");
    EXPECT_TRUE(DwgList[2].IsSelected());
    EXPECT_EQ(Frame().status, "");
    EXPECT_TRUE(Frame().pickEnabled);
}

TEST(Search, ChoosingADrawingByItsWholeName) {
    GridBench bench(700, 600);
    BeginScan();
    // "plan a.dwg" comes before "plan.dwg" by the locale's order as by bytes (a space before a dot).
    for (const char* name : {"plan a.dwg", "plan.dwg", "zeta.dwg"}) {
        DwgFindEntry e;
        e.name = name;
        AppendScanEntry(e);
    }
    EndScan();
    bench.view().Rebuild();
    Pump();
    bench.view().RunSearch("plan");
    EXPECT_EQ(g_pTessel3Doc->m_strName, "plan a.dwg");
    EXPECT_TRUE(bench.view().ChooseDrawing("PLAN.dwg"));
    EXPECT_EQ(g_pTessel3Doc->m_strName, "plan.dwg");
    EXPECT_TRUE(DwgList[1].IsSelected());
    EXPECT_FALSE(DwgList[0].IsSelected());
    EXPECT_TRUE(LabelHighlighted(bench.view().ControlOf(1)));
    EXPECT_FALSE(LabelHighlighted(bench.view().ControlOf(0)));
    EXPECT_TRUE(Frame().pickEnabled);
    EXPECT_FALSE(bench.view().ChooseDrawing("gone.dwg"));
    EXPECT_EQ(g_pTessel3Doc->m_strName, "plan.dwg");
}

TEST(Search, EmptyTextOrListChangesNothing) {
    GridBench bench(700, 600);
    FillList(5);
    bench.view().Rebuild();
    DwgList[3].Select();
    g_pTessel3Doc->m_strName = "keep";
    bench.view().RunSearch("");
    EXPECT_TRUE(DwgList[3].IsSelected());
    EXPECT_EQ(g_pTessel3Doc->m_strName, "keep");
    FillList(0);
    bench.view().Rebuild();
    g_pTessel3Doc->m_strName = "keep"; // showing a folder chooses nothing in it
    bench.view().RunSearch("d");
    EXPECT_EQ(g_pTessel3Doc->m_strName, "keep");
}

} // namespace

namespace {

TEST(ThumbnailErrors, AnIndexOutsideTheListIsReportedNotPassedOn) {
    GridBench bench;
    FillList(5);
    bench.view().Rebuild();
    Pump();
    exCDwgThumbnail* control = bench.view().ControlOf(3);
    ASSERT_NE(control, nullptr);
    DwgList.RemoveAll(); // the list changed without a rebuild
    Click(control, MK_LBUTTON);
    Click(control, MK_LBUTTON, WM_LBUTTONDBLCLK);
    ASSERT_EQ(Reports().size(), 2u);
    EXPECT_EQ(Reports()[0], "Invalid argument.");
    EXPECT_TRUE(Main().results.empty());
    Reports().clear();
}

} // namespace

namespace {

// Types into the context menu once it is up: the menu's loop takes the thread's keyboard messages.
struct MenuKeys {
    static std::string keys;
    static HWND target;
    static void CALLBACK Tick(HWND, UINT, UINT_PTR id, DWORD) {
        if (keys.empty()) {
            ::EndMenu();
            return;
        }
        const char c = keys.front();
        keys.erase(keys.begin());
        ::PostMessageA(target, WM_CHAR, static_cast<WPARAM>(c), 1);
    }
};
std::string MenuKeys::keys;
HWND MenuKeys::target = nullptr;

void RightClickAndType(exCDwgThumbnail* control, const std::string& keys) {
    ASSERT_NE(control, nullptr);
    MenuKeys::keys = keys;
    MenuKeys::target = control->m_hWnd;
    const UINT_PTR timer = ::SetTimer(nullptr, 0, 150, &MenuKeys::Tick);
    Click(control, MK_RBUTTON, WM_RBUTTONDOWN);
    ::KillTimer(nullptr, timer);
}

TEST(ThumbnailMenu, SortEntryGoesToTheFrame) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    RightClickAndType(bench.view().ControlOf(1), "sd");
    Pump();
    EXPECT_EQ(Frame().sortRequests, std::vector<int>{1}) << "by date";
}

TEST(ThumbnailMenu, RenameEntryStartsTheRename) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    exCDwgThumbnail* control = bench.view().ControlOf(2);
    ASSERT_NE(control, nullptr);
    RightClickAndType(control, "r");
    EXPECT_TRUE(control->Label().IsRenaming());
    EXPECT_FALSE(control->Label().GetStyle() & ES_READONLY);
    EXPECT_EQ(::GetFocus(), control->Label().m_hWnd);
    EXPECT_TRUE(bench.frame().commands.empty());
}

} // namespace

namespace {

// The view drawn into a bitmap of its client size.
class ViewPicture {
public:
    explicit ViewPicture(CTessel3View& view) {
        const CRect client = view.GetClientRect();
        CClientDC screen(view.m_hWnd);
        m_dc = ::CreateCompatibleDC(screen);
        m_bitmap.CreateCompatibleBitmap(screen, client.Width(), client.Height());
        m_old = ::SelectObject(m_dc, m_bitmap);
        view.SendMessage(WM_PRINTCLIENT, reinterpret_cast<WPARAM>(m_dc), PRF_CLIENT);
    }
    ~ViewPicture() {
        ::SelectObject(m_dc, m_old);
        ::DeleteDC(m_dc);
    }
    ViewPicture(const ViewPicture&) = delete;
    ViewPicture& operator=(const ViewPicture&) = delete;
    COLORREF At(int x, int y) const { return ::GetPixel(m_dc, x, y); }

private:
    HDC m_dc = nullptr;
    CBitmap m_bitmap;
    HGDIOBJ m_old = nullptr;
};

COLORREF Nearest(CTessel3View& view, COLORREF c) {
    CClientDC dc(view.m_hWnd);
    return ::GetNearestColor(dc, c);
}

TEST(ThumbnailRename, SunkenEdgeAroundTheLabelOnlyWhileRenaming) {
    GridBench bench;
    FillList(6);
    bench.view().Rebuild();
    Pump();
    ASSERT_NE(bench.view().ControlOf(4), nullptr);
    CThumbLabel& label = bench.view().ControlOf(4)->Label();
    CRect edge = label.EdgeRect(); // in the label's parent: the view's sheet
    ::MapWindowPoints(::GetParent(label.m_hWnd), bench.view().m_hWnd, reinterpret_cast<POINT*>(&edge), 2);
    const COLORREF background = Nearest(bench.view(), ::GetSysColor(COLOR_SCROLLBAR));
    {
        ViewPicture before(bench.view());
        EXPECT_EQ(before.At(edge.left, edge.top + 3), background);
    }
    label.BeginRename();
    {
        ViewPicture during(bench.view());
        EXPECT_EQ(during.At(edge.left, edge.top + 3), Nearest(bench.view(), ::GetSysColor(COLOR_BTNSHADOW)));
        EXPECT_EQ(during.At(edge.right - 1, edge.top + 3),
                  Nearest(bench.view(), ::GetSysColor(COLOR_BTNHIGHLIGHT)));
        EXPECT_EQ(during.At(edge.left - 2, edge.top + 3), background);
    }
    ::PostMessageA(label.m_hWnd, WM_KEYDOWN, VK_ESCAPE, 1);
    Pump();
    ViewPicture after(bench.view());
    EXPECT_EQ(after.At(edge.left, edge.top + 3), background);
}

// What the screen shows of a window's client area, row by row.
std::vector<COLORREF> ScreenPixels(HWND hwnd) {
    const CRect client = CWnd::FromHandle(hwnd)->GetClientRect();
    HDC screen = ::GetDC(hwnd);
    HDC memory = ::CreateCompatibleDC(screen);
    HBITMAP bitmap = ::CreateCompatibleBitmap(screen, client.Width(), client.Height());
    HGDIOBJ old = ::SelectObject(memory, bitmap);
    ::BitBlt(memory, 0, 0, client.Width(), client.Height(), screen, 0, 0, SRCCOPY);
    std::vector<COLORREF> pixels;
    for (int y = 0; y < client.Height(); ++y)
        for (int x = 0; x < client.Width(); ++x)
            pixels.push_back(::GetPixel(memory, x, y));
    ::SelectObject(memory, old);
    ::DeleteObject(bitmap);
    ::DeleteDC(memory);
    ::ReleaseDC(hwnd, screen);
    return pixels;
}

// Two drawings whose long names differ only at their start, in a folder of their own.
class LongNames : public ::testing::Test {
protected:
    void SetUp() override {
        const std::string tail(90, 'x');
        m_folder.Write("alpha-" + tail + ".dwg", "not a drawing");
        m_folder.Write("bravo-" + tail + ".dwg", "not a drawing");
    }
    // Shows the folder in the bench's folder model.
    void Show() {
        ASSERT_TRUE(ShowFolder(m_folder.Dir()));
        ASSERT_EQ(DwgList.GetSize(), 2);
    }
    TempFolder m_folder{"orvex-labels"};
};

TEST_F(LongNames, SelectedLabelsShowTheStartOfTheirNames) {
    GridBench bench;
    Show();
    bench.view().Rebuild();
    Pump();
    Click(bench.view().ControlOf(0), MK_LBUTTON);
    Click(bench.view().ControlOf(1), MK_LBUTTON | MK_CONTROL);
    ASSERT_TRUE(LabelHighlighted(bench.view().ControlOf(0)));
    ASSERT_TRUE(LabelHighlighted(bench.view().ControlOf(1)));
    CThumbLabel& first = bench.view().ControlOf(0)->Label();
    CThumbLabel& second = bench.view().ControlOf(1)->Label();
    first.RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
    second.RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
    Pump();
    // Shown from their ends, the two would be the same picture.
    EXPECT_NE(ScreenPixels(first.m_hWnd), ScreenPixels(second.m_hWnd));
    CClientDC dc(first.m_hWnd);
    EXPECT_EQ(first.ShownText(dc.GetSafeHdc()).substr(0, 6), L"alpha-");
    EXPECT_EQ(second.ShownText(dc.GetSafeHdc()).substr(0, 6), L"bravo-");
    // The highlight is drawn: the label's first text pixels are in the selection's colour.
    const std::vector<COLORREF> pixels = ScreenPixels(first.m_hWnd);
    EXPECT_NE(std::find(pixels.begin(), pixels.end(), Nearest(bench.view(), ::GetSysColor(COLOR_HIGHLIGHT))),
              pixels.end());
}

TEST_F(LongNames, ANameCutAtTheSmallestSizeEndsInAnEllipsis) {
    GridBench bench;
    Show();
    bench.view().Rebuild();
    Pump();
    for (int i = 0; i < 20; ++i) // smaller and smaller, down to the smallest size
        bench.view().SendMessage(WM_COMMAND, ID_VIEW_DECREASE);
    Pump();
    ASSERT_NE(bench.view().ControlOf(0), nullptr);
    CThumbLabel& label = bench.view().ControlOf(0)->Label();
    CClientDC dc(label.m_hWnd);
    const std::wstring shown = label.ShownText(dc.GetSafeHdc());
    ASSERT_GE(shown.size(), 4u);
    EXPECT_EQ(shown.substr(shown.size() - 3), L"...");
    EXPECT_EQ(shown.substr(0, 1), L"a");
    // The text of the window is still the whole name.
    EXPECT_EQ(label.GetWindowText(), DwgList[0].m_strName);
    // What the screen shows is that text with its ellipsis, drawn in the label's font where an edit puts
    // its text (not the name cut at the label's edge).
    const std::vector<COLORREF> pixels = ScreenPixels(label.m_hWnd);
    const CRect client = label.GetClientRect();
    HDC memory = ::CreateCompatibleDC(dc.GetSafeHdc());
    HBITMAP bitmap = ::CreateCompatibleBitmap(dc.GetSafeHdc(), client.Width(), client.Height());
    HGDIOBJ oldBitmap = ::SelectObject(memory, bitmap);
    HBRUSH background = ::CreateSolidBrush(pixels.front());
    ::FillRect(memory, &client, background);
    ::DeleteObject(background);
    HGDIOBJ oldFont = ::SelectObject(memory, reinterpret_cast<HGDIOBJ>(label.SendMessage(WM_GETFONT)));
    ::SetTextColor(memory, ::GetSysColor(COLOR_WINDOWTEXT));
    ::SetBkMode(memory, TRANSPARENT);
    const DWORD margins = static_cast<DWORD>(label.SendMessage(EM_GETMARGINS));
    CRect text = client;
    text.left += LOWORD(margins);
    text.right -= HIWORD(margins);
    ::DrawTextW(memory, shown.c_str(), static_cast<int>(shown.size()), &text, DT_SINGLELINE | DT_NOPREFIX);
    std::vector<COLORREF> expected;
    for (int y = 0; y < client.Height(); ++y)
        for (int x = 0; x < client.Width(); ++x)
            expected.push_back(::GetPixel(memory, x, y));
    if (oldFont)
        ::SelectObject(memory, oldFont);
    ::SelectObject(memory, oldBitmap);
    ::DeleteObject(bitmap);
    ::DeleteDC(memory);
    EXPECT_TRUE(pixels == expected) << "the label does not show " << NarrowAnsi(shown);
}

TEST(ThumbnailTooltip, ActiveOnceTheMouseMovesOverThePicture) {
    GridBench bench;
    FillList(3);
    bench.view().Rebuild();
    Pump();
    exCDwgThumbnail* control = bench.view().ControlOf(1);
    ASSERT_NE(control, nullptr);
    EXPECT_FALSE(control->ToolTipActive());
    ::PostMessageA(control->m_hWnd, WM_MOUSEMOVE, 0, MAKELPARAM(20, 20));
    Pump();
    EXPECT_TRUE(control->ToolTipActive());
    ASSERT_NE(bench.view().ControlOf(0), nullptr);
    EXPECT_FALSE(bench.view().ControlOf(0)->ToolTipActive());
}

} // namespace
