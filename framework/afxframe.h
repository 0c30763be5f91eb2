// The frame window: menu, accelerators, icon and title from one resource id, docked control bars, the
// client view (or splitter) in the rest, command routing and update handlers.
//
// Routing. WM_COMMAND from the menu, an accelerator or a toolbar reaches OnCmdMsg: the frame first
// offers it to the active view, then carries out its standard commands (exit, toolbar and status bar
// show/hide). A derived frame overrides OnCmdMsg with its own switch and calls the base for the rest.
// Update handlers (OnUpdateCmdUI) run for menu items when a popup opens and for toolbar buttons and
// status panes on idle (WM_IDLEUPDATECMDUI, sent by the modal loop once its queue empties).
//
// Ownership. A frame created with new deletes itself when its window is destroyed (m_bAutoDelete);
// its views and bars are child windows destroyed with it. The menu loaded by LoadFrame belongs to the
// window and is destroyed with it; when the creation fails, LoadFrame destroys it. A frame that deleted
// itself in a failed creation is not touched by LoadFrame again.
#pragma once

#include "afxbars.h"
#include "afxdoc.h"

#include <functional>
#include <vector>

class CView;

// Frame styles, kept by the frame (not window styles).
constexpr DWORD FWS_ADDTOTITLE = 0x00008000;

// What a frame or splitter needs to create a view: the document it shows and how to make it.
struct CCreateContext {
    CDocument* m_pCurrentDoc = nullptr;
    std::function<CView*()> m_pNewView;
};

class CFrameWnd : public CWnd {
public:
    CFrameWnd() = default;
    ~CFrameWnd() override;

    bool LoadFrame(UINT resourceId, DWORD style = WS_OVERLAPPEDWINDOW | FWS_ADDTOTITLE,
                   CWnd* parent = nullptr, CCreateContext* context = nullptr);

    // Places the bars (status bar lowest, bottom toolbars above it, top toolbars from the top down) and
    // the pane window (id AFX_IDW_PANE_FIRST: the view or the splitter) in the rest of the client area.
    virtual void RecalcLayout();
    void EnableDocking(DWORD alignments) { m_dwDockStyle = alignments; }
    void DockControlBar(CControlBar* bar) { bar->EnableDocking(bar->GetBarStyle() & CBRS_ALIGN_ANY); }
    void ShowControlBar(CControlBar* bar, bool show, bool delay = false);
    CControlBar* GetControlBar(UINT id) const;
    void AddControlBar(CControlBar* bar);
    void RemoveControlBar(CControlBar* bar);

    CView* GetActiveView() const { return m_pActiveView; }
    void SetActiveView(CView* view, bool notify = true);
    CDocument* GetActiveDocument() const;
    // Sends OnInitialUpdate to every view of the frame, updates the title, shows the frame if asked.
    void InitialUpdateFrame(CDocument* doc, bool makeVisible);
    virtual void OnUpdateFrameTitle(bool addToTitle);

    // Status bar message pane.
    void SetMessageText(const std::string& text);
    // The prompt of a command: its string resource up to the first "\n".
    virtual std::string GetMessageString(UINT id) const;
    // The status bar's resting text ("Ready" unless a frame has something of its own to say there).
    virtual std::string GetIdleMessage() const;

    bool PreTranslateMessage(MSG* pMsg) override;
    bool OnCmdMsg(UINT id, int code) override;
    bool OnUpdateCmdUI(CCmdUI* pCmdUI) override;

    HACCEL m_hAccelTable = nullptr;
    bool m_bAutoDelete = true;

protected:
    bool PreCreateWindow(CREATESTRUCTA& cs) override;
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    int OnCreate(LPCREATESTRUCTA cs) override;
    // Creates the client: the context's view, if there is one. Splitter frames override it.
    virtual bool OnCreateClient(LPCREATESTRUCTA cs, CCreateContext* context);
    void OnSize(UINT type, int cx, int cy) override;
    void OnSetFocus(HWND oldWnd) override;
    void OnMenuSelect(UINT itemId, UINT flags, HMENU menu) override;
    bool OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult) override;
    void OnDestroy() override;
    void PostNcDestroy() override;
    void OnIdleUpdateCmdUI();

    std::string m_strTitle;
    DWORD m_dwFrameStyle = 0;
    DWORD m_dwDockStyle = 0;
    UINT m_nIDResource = 0;

private:
    HMENU m_hMenuDefault = nullptr;
    HICON m_hIcon = nullptr;
    HICON m_hIconSmall = nullptr;
    CCreateContext* m_pContext = nullptr;
    CView* m_pActiveView = nullptr;
    CDocument* m_pDocument = nullptr;
    std::vector<CControlBar*> m_bars; // in creation order; the bars are child windows of the frame
    bool m_bInRecalc = false;
};

// The frame a window lives in (the nearest framework frame among its parents), or nullptr.
CFrameWnd* AfxGetParentFrame(const CWnd* wnd);
