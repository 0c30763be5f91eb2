// The shell's context menu of one item, ready to be shown over an owner window: the item's IContextMenu,
// and the owner window subclassed so that the menu's owner-drawn entries, its sub-menus and its help texts
// reach the shell while the menu is open. No command of the explorer opens it yet.
//
// Ownership: holds one reference to the menu interface, released when replaced or destroyed. Attach
// stores this object as the owner's window property "ShellContextMenu"; Detach (or the owner's
// WM_DESTROY) restores the owner's window procedure.
#pragma once

#include <windows.h>
#include <shlobj.h>

class CShellContextMenu {
public:
    CShellContextMenu() = default;
    ~CShellContextMenu();
    CShellContextMenu(const CShellContextMenu&) = delete;
    CShellContextMenu& operator=(const CShellContextMenu&) = delete;

    // Asks folder for the menu of item (an id list relative to it); true when one was obtained.
    bool SetObject(IShellFolder* folder, PCUITEMID_CHILD item);
    bool Attach(HWND owner);
    void Detach();

    IContextMenu* Menu() const { return m_pMenu; }
    HWND Owner() const { return m_hOwner; }
    // Fills popup with the shell's entries in [firstId, lastId] (QueryContextMenu); the command range is
    // remembered for the help texts.
    HRESULT QueryMenu(HMENU popup, UINT firstId, UINT lastId, UINT flags = CMF_NORMAL);

    static constexpr const char* kProperty = "ShellContextMenu";

private:
    static LRESULT CALLBACK WindowProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam);
    LRESULT HandleMessage(UINT message, WPARAM wParam, LPARAM lParam);
    bool ShowHelpText(UINT item, UINT flags, HMENU menu);
    void Release();

    IContextMenu* m_pMenu = nullptr;
    HWND m_hOwner = nullptr;
    WNDPROC m_oldProc = nullptr;
    UINT m_firstId = 0;
    UINT m_lastId = 0;
};
