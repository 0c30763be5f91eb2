// The tree control wrapper: the SysTreeView32 control, subclassed, with its narrow-text operations.
#pragma once

#include "afxwin.h"

// The tree control sends its notifications with text in the form its parent asked for (WM_NOTIFYFORMAT):
// ANSI codes to the framework's windows, wide codes to wide parents. The two NMTREEVIEW and NMTVDISPINFO
// layouts match except for the text pointer's type. Returns the ANSI code for either form, the code
// itself for every other notification.
UINT AfxTreeNotifyCode(UINT code);

class CTreeCtrl : public CWnd {
public:
    bool Create(DWORD style, const RECT& rect, CWnd* parent, UINT id) {
        return CreateEx(0, WC_TREEVIEWA, nullptr, style, rect, parent, id);
    }

    HTREEITEM InsertItem(TVINSERTSTRUCTA* insert) {
        return reinterpret_cast<HTREEITEM>(SendMessage(TVM_INSERTITEMA, 0, reinterpret_cast<LPARAM>(insert)));
    }
    // An item with its text, images, data and the child indicator (I_CHILDRENCALLBACK, 0 or 1; -1 leaves
    // it to the control).
    HTREEITEM InsertItem(const std::string& text, int image = 0, int selectedImage = 0,
                         HTREEITEM parent = TVI_ROOT, HTREEITEM after = TVI_LAST, LPARAM data = 0,
                         int children = -1);
    bool DeleteItem(HTREEITEM item) {
        return SendMessage(TVM_DELETEITEM, 0, reinterpret_cast<LPARAM>(item)) != 0;
    }
    bool DeleteAllItems() { return DeleteItem(TVI_ROOT); }

    bool GetItem(TVITEMA* item) const {
        return SendMessage(TVM_GETITEMA, 0, reinterpret_cast<LPARAM>(item)) != 0;
    }
    bool SetItem(TVITEMA* item) { return SendMessage(TVM_SETITEMA, 0, reinterpret_cast<LPARAM>(item)) != 0; }
    std::string GetItemText(HTREEITEM item) const;
    bool SetItemText(HTREEITEM item, const std::string& text);
    LPARAM GetItemData(HTREEITEM item) const;
    bool SetItemData(HTREEITEM item, LPARAM data);
    bool ItemHasChildren(HTREEITEM item) const;
    UINT GetItemState(HTREEITEM item, UINT mask) const {
        return static_cast<UINT>(SendMessage(TVM_GETITEMSTATE, reinterpret_cast<WPARAM>(item), mask));
    }
    bool SetItemState(HTREEITEM item, UINT state, UINT mask);
    // The background colour; CLR_NONE (-1) while the control uses the system window colour.
    COLORREF GetBkColor() const { return static_cast<COLORREF>(SendMessage(TVM_GETBKCOLOR)); }
    COLORREF SetBkColor(COLORREF colour) {
        return static_cast<COLORREF>(SendMessage(TVM_SETBKCOLOR, 0, static_cast<LPARAM>(colour)));
    }
    // The colour the control paints its background with: its own, or the window colour.
    COLORREF GetEffectiveBkColor() const;

    HTREEITEM GetNextItem(HTREEITEM item, UINT code) const {
        return reinterpret_cast<HTREEITEM>(
            SendMessage(TVM_GETNEXTITEM, code, reinterpret_cast<LPARAM>(item)));
    }
    HTREEITEM GetRootItem() const { return GetNextItem(nullptr, TVGN_ROOT); }
    HTREEITEM GetChildItem(HTREEITEM item) const { return GetNextItem(item, TVGN_CHILD); }
    HTREEITEM GetNextSiblingItem(HTREEITEM item) const { return GetNextItem(item, TVGN_NEXT); }
    HTREEITEM GetParentItem(HTREEITEM item) const { return GetNextItem(item, TVGN_PARENT); }
    HTREEITEM GetSelectedItem() const { return GetNextItem(nullptr, TVGN_CARET); }
    HTREEITEM GetDropHilightItem() const { return GetNextItem(nullptr, TVGN_DROPHILITE); }
    HTREEITEM GetFirstVisibleItem() const { return GetNextItem(nullptr, TVGN_FIRSTVISIBLE); }

    bool Expand(HTREEITEM item, UINT code) {
        return SendMessage(TVM_EXPAND, code, reinterpret_cast<LPARAM>(item)) != 0;
    }
    bool Select(HTREEITEM item, UINT code) {
        return SendMessage(TVM_SELECTITEM, code, reinterpret_cast<LPARAM>(item)) != 0;
    }
    bool SelectItem(HTREEITEM item) { return Select(item, TVGN_CARET); }
    bool SelectDropTarget(HTREEITEM item) { return Select(item, TVGN_DROPHILITE); }
    bool SelectSetFirstVisible(HTREEITEM item) { return Select(item, TVGN_FIRSTVISIBLE); }
    bool EnsureVisible(HTREEITEM item) {
        return SendMessage(TVM_ENSUREVISIBLE, 0, reinterpret_cast<LPARAM>(item)) != 0;
    }
    bool SortChildrenCB(TVSORTCB* sort) {
        return SendMessage(TVM_SORTCHILDRENCB, 0, reinterpret_cast<LPARAM>(sort)) != 0;
    }
    bool GetItemRect(HTREEITEM item, LPRECT rect, bool textOnly) const;
    // The item at a client point; flags receives TVHT_* when given.
    HTREEITEM HitTest(CPoint pt, UINT* flags = nullptr) const;
    UINT GetCount() const { return static_cast<UINT>(SendMessage(TVM_GETCOUNT)); }

    HIMAGELIST SetImageList(HIMAGELIST list, int type) {
        return reinterpret_cast<HIMAGELIST>(
            SendMessage(TVM_SETIMAGELIST, static_cast<WPARAM>(type), reinterpret_cast<LPARAM>(list)));
    }
    // Queues the image list for the control instead of sending it: usable while the control is still
    // being set up (PreSubclassWindow) or from another thread.
    bool PostImageList(HIMAGELIST list, int type) {
        return PostMessage(TVM_SETIMAGELIST, static_cast<WPARAM>(type), reinterpret_cast<LPARAM>(list));
    }
    HIMAGELIST GetImageList(int type) const {
        return reinterpret_cast<HIMAGELIST>(SendMessage(TVM_GETIMAGELIST, static_cast<WPARAM>(type)));
    }
};
