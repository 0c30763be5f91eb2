#include "fileops/ShellContextMenu.h"

#include "framework/afxbars.h"
#include "framework/afxframe.h"

#include <string>

CShellContextMenu::~CShellContextMenu() {
    Detach();
    Release();
}

void CShellContextMenu::Release() {
    if (m_pMenu) {
        m_pMenu->Release();
        m_pMenu = nullptr;
    }
}

bool CShellContextMenu::SetObject(IShellFolder* folder, PCUITEMID_CHILD item) {
    Release();
    if (!folder || !item)
        return false;
    void* menu = nullptr;
    if (FAILED(folder->GetUIObjectOf(nullptr, 1, &item, IID_IContextMenu, nullptr, &menu)) || !menu)
        return false;
    m_pMenu = static_cast<IContextMenu*>(menu);
    return true;
}

HRESULT CShellContextMenu::QueryMenu(HMENU popup, UINT firstId, UINT lastId, UINT flags) {
    if (!m_pMenu)
        return E_FAIL;
    m_firstId = firstId;
    m_lastId = lastId;
    return m_pMenu->QueryContextMenu(popup, 0, firstId, lastId, flags);
}

bool CShellContextMenu::Attach(HWND owner) {
    if (!owner || !::IsWindow(owner))
        return false;
    Detach();
    if (!::SetPropA(owner, kProperty, this))
        return false;
    m_hOwner = owner;
    m_oldProc = reinterpret_cast<WNDPROC>(
        ::SetWindowLongPtrA(owner, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(&CShellContextMenu::WindowProc)));
    return true;
}

void CShellContextMenu::Detach() {
    if (!m_hOwner)
        return;
    ::RemovePropA(m_hOwner, kProperty);
    if (m_oldProc)
        ::SetWindowLongPtrA(m_hOwner, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(m_oldProc));
    m_hOwner = nullptr;
    m_oldProc = nullptr;
}

namespace {

// Hands a message of the menu's own drawing and filling to the shell's menu; true when it took it.
bool MenuHandles(IContextMenu* menu, UINT message, WPARAM wParam, LPARAM lParam) {
    IContextMenu2* menu2 = nullptr;
    if (FAILED(menu->QueryInterface(IID_IContextMenu2, reinterpret_cast<void**>(&menu2))) || !menu2)
        return false;
    const HRESULT hr = menu2->HandleMenuMsg(message, wParam, lParam);
    menu2->Release();
    return SUCCEEDED(hr);
}

} // namespace

LRESULT CALLBACK CShellContextMenu::WindowProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    auto* self = static_cast<CShellContextMenu*>(::GetPropA(hwnd, kProperty));
    if (!self)
        return ::DefWindowProcA(hwnd, message, wParam, lParam);
    try {
        return self->HandleMessage(message, wParam, lParam);
    } catch (...) {
        // Nothing leaves a window procedure of the library.
        return 0;
    }
}

LRESULT CShellContextMenu::HandleMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    const HWND owner = m_hOwner;
    const WNDPROC old = m_oldProc;
    if (m_pMenu) {
        switch (message) {
        case WM_DRAWITEM:
        case WM_MEASUREITEM: {
            const UINT type = message == WM_DRAWITEM ? reinterpret_cast<DRAWITEMSTRUCT*>(lParam)->CtlType
                                                     : reinterpret_cast<MEASUREITEMSTRUCT*>(lParam)->CtlType;
            if (type != ODT_MENU)
                break;
            if (MenuHandles(m_pMenu, message, wParam, lParam))
                return TRUE;
            break;
        }
        case WM_INITMENUPOPUP:
            if (MenuHandles(m_pMenu, message, wParam, lParam))
                return 0;
            break;
        case WM_MENUSELECT:
            ShowHelpText(LOWORD(wParam), HIWORD(wParam), reinterpret_cast<HMENU>(lParam));
            break;
        default:
            break;
        }
    }
    if (message == WM_DESTROY)
        Detach();
    return old ? ::CallWindowProcA(old, owner, message, wParam, lParam)
               : ::DefWindowProcA(owner, message, wParam, lParam);
}

bool CShellContextMenu::ShowHelpText(UINT item, UINT flags, HMENU menu) {
    if (flags == 0xFFFF && !menu)
        return false; // the menu closed
    if (flags & MF_SEPARATOR)
        return false;
    UINT id = item;
    if (flags & MF_POPUP) {
        // A popup entry: its first item speaks for it.
        HMENU sub = ::GetSubMenu(menu, static_cast<int>(item));
        if (!sub)
            return false;
        id = ::GetMenuItemID(sub, 0);
    }
    if (id < m_firstId || id > m_lastId)
        return false;
    const UINT_PTR command = id - m_firstId;
    std::string text;
    wchar_t wide[260] = L"";
    if (SUCCEEDED(
            m_pMenu->GetCommandString(command, GCS_HELPTEXTW, nullptr, reinterpret_cast<char*>(wide), 260)) &&
        wide[0]) {
        char narrow[520] = "";
        ::WideCharToMultiByte(CP_ACP, 0, wide, -1, narrow, sizeof narrow, nullptr, nullptr);
        text = narrow;
    } else {
        char narrow[260] = "";
        if (SUCCEEDED(m_pMenu->GetCommandString(command, GCS_HELPTEXTA, nullptr, narrow, 260)))
            text = narrow;
    }
    if (text.empty())
        return false;
    // The owner's top-level frame shows it as its message text (the status bar's first pane).
    HWND frame = ::GetAncestor(m_hOwner, GA_ROOT);
    if (!frame)
        return false;
    if (auto* frameWnd = dynamic_cast<CFrameWnd*>(CWnd::FromHandle(frame))) {
        frameWnd->SetMessageText(text);
        return true;
    }
    if (HWND status = ::GetDlgItem(frame, AFX_IDW_STATUS_BAR))
        ::SendMessageA(status, SB_SETTEXTA, 0, reinterpret_cast<LPARAM>(text.c_str()));
    return true;
}
