#include "afxtree.h"

UINT AfxTreeNotifyCode(UINT code) {
    switch (code) {
    case TVN_SELCHANGINGW: return TVN_SELCHANGINGA;
    case TVN_SELCHANGEDW: return TVN_SELCHANGEDA;
    case TVN_GETDISPINFOW: return TVN_GETDISPINFOA;
    case TVN_SETDISPINFOW: return TVN_SETDISPINFOA;
    case TVN_ITEMEXPANDINGW: return TVN_ITEMEXPANDINGA;
    case TVN_ITEMEXPANDEDW: return TVN_ITEMEXPANDEDA;
    case TVN_BEGINDRAGW: return TVN_BEGINDRAGA;
    case TVN_BEGINRDRAGW: return TVN_BEGINRDRAGA;
    case TVN_DELETEITEMW: return TVN_DELETEITEMA;
    case TVN_BEGINLABELEDITW: return TVN_BEGINLABELEDITA;
    case TVN_ENDLABELEDITW: return TVN_ENDLABELEDITA;
    case TVN_GETINFOTIPW: return TVN_GETINFOTIPA;
    default: return code;
    }
}

HTREEITEM CTreeCtrl::InsertItem(const std::string& text, int image, int selectedImage, HTREEITEM parent,
                                HTREEITEM after, LPARAM data, int children) {
    TVINSERTSTRUCTA insert{};
    insert.hParent = parent;
    insert.hInsertAfter = after;
    insert.item.mask = TVIF_TEXT | TVIF_IMAGE | TVIF_SELECTEDIMAGE | TVIF_PARAM;
    insert.item.pszText = const_cast<char*>(text.c_str());
    insert.item.iImage = image;
    insert.item.iSelectedImage = selectedImage;
    insert.item.lParam = data;
    if (children != -1) {
        insert.item.mask |= TVIF_CHILDREN;
        insert.item.cChildren = children;
    }
    return InsertItem(&insert);
}

std::string CTreeCtrl::GetItemText(HTREEITEM item) const {
    char buffer[1024] = {};
    TVITEMA tvi{};
    tvi.mask = TVIF_TEXT;
    tvi.hItem = item;
    tvi.pszText = buffer;
    tvi.cchTextMax = sizeof buffer;
    if (!GetItem(&tvi))
        return std::string();
    return tvi.pszText ? std::string(tvi.pszText) : std::string();
}

bool CTreeCtrl::SetItemText(HTREEITEM item, const std::string& text) {
    TVITEMA tvi{};
    tvi.mask = TVIF_TEXT;
    tvi.hItem = item;
    tvi.pszText = const_cast<char*>(text.c_str());
    return SetItem(&tvi);
}

LPARAM CTreeCtrl::GetItemData(HTREEITEM item) const {
    TVITEMA tvi{};
    tvi.mask = TVIF_PARAM;
    tvi.hItem = item;
    return GetItem(&tvi) ? tvi.lParam : 0;
}

bool CTreeCtrl::SetItemData(HTREEITEM item, LPARAM data) {
    TVITEMA tvi{};
    tvi.mask = TVIF_PARAM;
    tvi.hItem = item;
    tvi.lParam = data;
    return SetItem(&tvi);
}

bool CTreeCtrl::ItemHasChildren(HTREEITEM item) const {
    TVITEMA tvi{};
    tvi.mask = TVIF_CHILDREN;
    tvi.hItem = item;
    return GetItem(&tvi) && tvi.cChildren != 0;
}

bool CTreeCtrl::GetItemRect(HTREEITEM item, LPRECT rect, bool textOnly) const {
    *reinterpret_cast<HTREEITEM*>(rect) = item; // the message takes the item in the rectangle
    return SendMessage(TVM_GETITEMRECT, textOnly, reinterpret_cast<LPARAM>(rect)) != 0;
}

HTREEITEM CTreeCtrl::HitTest(CPoint pt, UINT* flags) const {
    TVHITTESTINFO info{};
    info.pt = pt;
    auto item = reinterpret_cast<HTREEITEM>(SendMessage(TVM_HITTEST, 0, reinterpret_cast<LPARAM>(&info)));
    if (flags)
        *flags = info.flags;
    return item;
}

bool CTreeCtrl::SetItemState(HTREEITEM item, UINT state, UINT mask) {
    TVITEMA tvi{};
    tvi.mask = TVIF_STATE;
    tvi.hItem = item;
    tvi.state = state;
    tvi.stateMask = mask;
    return SetItem(&tvi);
}

COLORREF CTreeCtrl::GetEffectiveBkColor() const {
    const COLORREF colour = GetBkColor();
    return colour == CLR_NONE ? ::GetSysColor(COLOR_WINDOW) : (colour & 0xFFFFFF);
}
