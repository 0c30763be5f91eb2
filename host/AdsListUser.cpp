#include "host/AdsListUser.h"

#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"

#include <cstdlib>
#include <cstring>
#include <cwchar>

ads_list_user::TextAllocator ads_list_user::s_allocText = &std::malloc;

namespace {

const wchar_t kCopyFailed[] = L"\n Error of allocate memory ads_list_user(ads_list_user &";

} // namespace

ads_list_user::ads_list_user(const ads_list_user& other) {
    for (const resbuf* src = other.m_pHead; src; src = src->rbnext) {
        resbuf* node = acutNewRb(src->restype);
        if (!node) {
            acdbFail(kCopyFailed);
            continue;
        }
        node->restype = src->restype;
        node->resval = src->resval;
        node->rbnext = nullptr;
        if (src->restype == RTSTR && src->resval.rstring) {
            std::size_t bytes = (std::wcslen(src->resval.rstring) + 1) * sizeof(wchar_t);
            auto* text = static_cast<wchar_t*>(s_allocText(bytes));
            if (!text) {
                node->resval.rstring = nullptr;
                acutRelRb(node);
                acdbFail(kCopyFailed);
                continue;
            }
            std::memcpy(text, src->resval.rstring, bytes);
            node->resval.rstring = text;
        }
        Append(node);
    }
    m_pLast = m_pTail;
}

ads_list_user* ads_list_user::Copy() const {
    return new ads_list_user(*this);
}

void ads_list_user::Append(resbuf* chain) {
    if (!chain)
        return;
    resbuf* last = chain;
    while (last->rbnext)
        last = last->rbnext;
    if (!m_pHead) {
        m_pHead = chain;
        m_pCursor = m_pHead;
    } else {
        m_pTail->rbnext = chain;
    }
    m_pTail = last;
    m_pTail->rbnext = nullptr;
}

void ads_list_user::AppendNode(resbuf* node, const wchar_t* failure) {
    if (!node) {
        acdbFail(failure);
        return;
    }
    Append(node);
    m_pLast = node;
}

ads_list_user& ads_list_user::operator+(ads_int value) {
    resbuf* node = acutNewRb(RTSHORT);
    if (node)
        node->resval.rint = value;
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (ads_int)");
    return *this;
}

ads_list_user& ads_list_user::operator+(long value) {
    resbuf* node = acutNewRb(RTLONG);
    if (node)
        node->resval.rlong = static_cast<std::int32_t>(value);
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (long )");
    return *this;
}

ads_list_user& ads_list_user::operator+(ads_real value) {
    resbuf* node = acutNewRb(RTREAL);
    if (node)
        node->resval.rreal = value;
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (ads_real)");
    return *this;
}

ads_list_user& ads_list_user::operator+(const char* text) {
    resbuf* node = acutBuildListString(WidenAnsi(text ? text : "").c_str());
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (char * )");
    return *this;
}

ads_list_user& ads_list_user::operator+(const long name[2]) {
    resbuf* node = acutNewRb(RTENAME);
    if (node) {
        node->resval.rlname[0] = name[0];
        node->resval.rlname[1] = name[1];
    }
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (long r[2])");
    return *this;
}

ads_list_user& ads_list_user::operator+(const ads_point point) {
    resbuf* node = acutNewRb(RTPOINT);
    if (node) {
        node->resval.rpoint[0] = point[0];
        node->resval.rpoint[1] = point[1];
        node->resval.rpoint[2] = point[2];
    }
    AppendNode(node, L"\n Error of allocate memory ads_list_user & operator + (ads_point)");
    return *this;
}

ads_list_user& ads_list_user::operator+(resbuf* chain) {
    Append(chain);
    if (chain)
        m_pLast = chain;
    return *this;
}

resbuf* ads_list_user::Next() {
    resbuf* node = m_pCursor;
    if (node)
        m_pCursor = node->rbnext;
    return node;
}

int ads_list_user::RetList() const {
    return acedRetList(m_pHead);
}

void ads_list_user::Release() {
    if (m_pHead)
        acutRelRb(m_pHead);
    m_pHead = m_pTail = m_pCursor = m_pLast = nullptr;
}

resbuf* BeginList() {
    return acutBuildListCode(RTLB);
}
resbuf* EndList() {
    return acutBuildListCode(RTLE);
}
