// Control bars docked on a frame: toolbars and the status bar; and the tooltip control.
//
// A bar is the system control itself (ToolbarWindow32, msctls_statusbar32), subclassed by its wrapper;
// the frame it is created in lays it out (CFrameWnd::RecalcLayout). Bar styles (CBRS_*) are kept by the
// wrapper and never given to the window, whose low style bits belong to the control.
#pragma once

#include "afxwin.h"

#include <vector>

class CFrameWnd;

// Standard ids of the frame's parts and commands.
constexpr UINT AFX_IDW_TOOLBAR = 0xE800;
constexpr UINT AFX_IDW_STATUS_BAR = 0xE801;
constexpr UINT AFX_IDW_PANE_FIRST = 0xE900;
constexpr UINT ID_SEPARATOR = 0;
constexpr UINT ID_INDICATOR_CAPS = 59137;
constexpr UINT ID_INDICATOR_NUM = 59138;
constexpr UINT ID_INDICATOR_SCRL = 59139;
constexpr UINT ID_APP_EXIT = 57665;
constexpr UINT ID_VIEW_TOOLBAR = 59392;
constexpr UINT ID_VIEW_STATUS_BAR = 59393;
constexpr UINT AFX_IDS_IDLEMESSAGE = 0xE001; // "Ready" when the module has no string of its own

// Bar styles.
constexpr DWORD CBRS_ALIGN_LEFT = 0x1000;
constexpr DWORD CBRS_ALIGN_TOP = 0x2000;
constexpr DWORD CBRS_ALIGN_RIGHT = 0x4000;
constexpr DWORD CBRS_ALIGN_BOTTOM = 0x8000;
constexpr DWORD CBRS_ALIGN_ANY = 0xF000;
constexpr DWORD CBRS_TOP = CBRS_ALIGN_TOP;
constexpr DWORD CBRS_BOTTOM = CBRS_ALIGN_BOTTOM;
constexpr DWORD CBRS_TOOLTIPS = 0x0010;
constexpr DWORD CBRS_FLYBY = 0x0020;
constexpr DWORD CBRS_SIZE_DYNAMIC = 0x0040;
constexpr DWORD CBRS_GRIPPER = 0x00400000;
constexpr UINT TBBS_BUTTON = BTNS_BUTTON;
constexpr UINT TBBS_SEPARATOR = BTNS_SEP;

class CControlBar : public CWnd {
public:
    DWORD GetBarStyle() const { return m_dwBarStyle; }
    void SetBarStyle(DWORD style) { m_dwBarStyle = style; }
    void EnableDocking(DWORD alignments) { m_dwDockStyle = alignments; }
    bool IsVisible() const { return m_hWnd && IsWindowVisible(); }
    // The height (top/bottom bars) the bar needs at the given frame width.
    virtual int CalcHeight(int width) const = 0;
    // Sets the state of the bar's buttons or panes from the target's update handlers.
    virtual void UpdateCmdUIFrom(CFrameWnd* target) = 0;

protected:
    // Splits a creation style into the window part and the bar part, registers the bar with its frame.
    DWORD TakeBarStyle(DWORD style);
    void RegisterWithFrame(CWnd* parent);

    DWORD m_dwBarStyle = 0;
    DWORD m_dwDockStyle = 0;
};

// Non-owning access to the toolbar control's own operations.
class CToolBarCtrl {
public:
    HWND m_hWnd = nullptr;
    bool EnableButton(UINT id, bool enable = true) {
        return ::SendMessageA(m_hWnd, TB_ENABLEBUTTON, id, MAKELPARAM(enable ? TRUE : FALSE, 0)) != 0;
    }
    bool IsButtonEnabled(UINT id) const { return ::SendMessageA(m_hWnd, TB_ISBUTTONENABLED, id, 0) != 0; }
    bool CheckButton(UINT id, bool check = true) {
        return ::SendMessageA(m_hWnd, TB_CHECKBUTTON, id, MAKELPARAM(check ? TRUE : FALSE, 0)) != 0;
    }
    bool IsButtonChecked(UINT id) const { return ::SendMessageA(m_hWnd, TB_ISBUTTONCHECKED, id, 0) != 0; }
    int GetButtonCount() const { return static_cast<int>(::SendMessageA(m_hWnd, TB_BUTTONCOUNT, 0, 0)); }
};

class CToolBar : public CControlBar {
public:
    // ctrlStyle: TBSTYLE_FLAT and friends; style: WS_CHILD | WS_VISIBLE | CBRS_* bar styles.
    bool CreateEx(CWnd* parent, DWORD ctrlStyle = TBSTYLE_FLAT,
                  DWORD style = WS_CHILD | WS_VISIBLE | CBRS_ALIGN_TOP, CRect borders = CRect(),
                  UINT id = AFX_IDW_TOOLBAR);
    bool Create(CWnd* parent, DWORD style = WS_CHILD | WS_VISIBLE | CBRS_TOP, UINT id = AFX_IDW_TOOLBAR) {
        return CreateEx(parent, 0, style, CRect(), id);
    }
    // Loads the buttons from a toolbar resource (type 241: version 1, image width, height, count, ids
    // with 0 for separators) and the images from the bitmap resource of the same id.
    bool LoadToolBar(UINT resourceId);

    int CommandToIndex(UINT id) const { return static_cast<int>(SendMessage(TB_COMMANDTOINDEX, id)); }
    UINT GetItemID(int index) const;
    UINT GetButtonStyle(int index) const;
    void GetItemRect(int index, LPRECT rect) const;
    // Replaces a button; with TBBS_SEPARATOR, imageOrWidth is the separator's width (room for a child
    // control placed over it, see GetItemRect).
    void SetButtonInfo(int index, UINT id, UINT style, int imageOrWidth);
    CToolBarCtrl& GetToolBarCtrl() {
        m_ctrl.m_hWnd = m_hWnd;
        return m_ctrl;
    }

    int CalcHeight(int width) const override;
    void UpdateCmdUIFrom(CFrameWnd* target) override;

protected:
    bool OnNotifyReflect(NMHDR* pNMHDR, LRESULT* pResult) override;
    void OnPaint() override;

private:
    CToolBarCtrl m_ctrl;
    CSize m_sizeImage{16, 15};
};

class CStatusBar : public CControlBar {
public:
    bool Create(CWnd* parent, DWORD style = WS_CHILD | WS_VISIBLE | CBRS_BOTTOM,
                UINT id = AFX_IDW_STATUS_BAR);
    // One pane per id: ID_SEPARATOR is the stretching message pane, other ids show the string of that id
    // (the key indicators have built-in texts "CAP", "NUM", "SCRL").
    bool SetIndicators(const UINT* ids, int count);

    int CommandToIndex(UINT id) const;
    UINT GetItemID(int index) const;
    int GetCount() const { return static_cast<int>(m_panes.size()); }
    bool SetPaneText(int index, const std::string& text, bool update = true);
    std::string GetPaneText(int index) const;
    void GetItemRect(int index, LPRECT rect) const {
        SendMessage(SB_GETRECT, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(rect));
    }

    int CalcHeight(int width) const override;
    void UpdateCmdUIFrom(CFrameWnd* target) override;

protected:
    void OnSize(UINT type, int cx, int cy) override;

private:
    struct Pane {
        UINT id;
        std::string text; // the indicator's text when enabled
        int width;
    };
    void ApplyParts();
    std::vector<Pane> m_panes;
    int m_nHeight = 20;
};

class CToolTipCtrl : public CWnd {
public:
    bool Create(CWnd* parent, DWORD style = 0);
    // A tool: the window itself (no rectangle) or a rectangle of it with an id.
    bool AddTool(CWnd* wnd, const std::string& text, const RECT* rect = nullptr, UINT_PTR toolId = 0);
    void UpdateTipText(const std::string& text, CWnd* wnd, UINT_PTR toolId = 0);
    void RelayEvent(MSG* pMsg) { SendMessage(TTM_RELAYEVENT, 0, reinterpret_cast<LPARAM>(pMsg)); }
    void Activate(bool activate) { SendMessage(TTM_ACTIVATE, activate ? TRUE : FALSE); }
    int SetMaxTipWidth(int width) { return static_cast<int>(SendMessage(TTM_SETMAXTIPWIDTH, 0, width)); }
    int GetToolCount() const { return static_cast<int>(SendMessage(TTM_GETTOOLCOUNT)); }

private:
    TTTOOLINFOA MakeInfo(CWnd* wnd, UINT_PTR toolId, const RECT* rect, const std::string& text) const;
};
