#include "devhost/ResultBuffers.h"

#include <cstdlib>
#include <cstring>
#include <cwchar>

namespace devhost {

resbuf* NewNode(int restype) {
    auto* node = static_cast<resbuf*>(std::calloc(1, sizeof(resbuf)));
    if (node)
        node->restype = static_cast<short>(restype);
    return node;
}

wchar_t* DuplicateString(const wchar_t* text) {
    if (!text)
        text = L"";
    const std::size_t length = std::wcslen(text);
    auto* copy = static_cast<wchar_t*>(std::malloc((length + 1) * sizeof(wchar_t)));
    if (copy)
        std::memcpy(copy, text, (length + 1) * sizeof(wchar_t));
    return copy;
}

void FreeChain(resbuf* chain) {
    while (chain) {
        resbuf* next = chain->rbnext;
        if (chain->restype == RTSTR)
            std::free(chain->resval.rstring);
        std::free(chain);
        chain = next;
    }
}

resbuf* CopyChain(const resbuf* chain) {
    resbuf* head = nullptr;
    resbuf* tail = nullptr;
    for (; chain; chain = chain->rbnext) {
        resbuf* node = NewNode(chain->restype);
        if (!node) {
            FreeChain(head);
            return nullptr;
        }
        node->resval = chain->resval;
        if (chain->restype == RTSTR) {
            node->resval.rstring = DuplicateString(chain->resval.rstring);
            if (!node->resval.rstring) {
                std::free(node);
                FreeChain(head);
                return nullptr;
            }
        }
        (tail ? tail->rbnext : head) = node;
        tail = node;
    }
    return head;
}

resbuf* BuildChainV(int restype, va_list values) {
    resbuf* head = nullptr;
    resbuf* tail = nullptr;
    for (int type = restype; type != 0; type = va_arg(values, int)) {
        resbuf* node = NewNode(type);
        if (!node) {
            FreeChain(head);
            return nullptr;
        }
        (tail ? tail->rbnext : head) = node;
        tail = node;
        switch (type) {
        case RTSTR:
            node->resval.rstring = DuplicateString(va_arg(values, const wchar_t*));
            if (!node->resval.rstring) {
                node->restype = RTNIL; // nothing to free in this node
                FreeChain(head);
                return nullptr;
            }
            break;
        case RTSHORT:
            node->resval.rint = static_cast<short>(va_arg(values, int));
            break;
        case RTLONG:
            node->resval.rlong = va_arg(values, std::int32_t);
            break;
        case RTREAL:
            node->resval.rreal = va_arg(values, double);
            break;
        case RTPOINT: {
            const double* point = va_arg(values, const double*);
            for (int i = 0; i < 3; ++i)
                node->resval.rpoint[i] = point ? point[i] : 0.0;
            break;
        }
        case RTENAME: {
            const std::int64_t* name = va_arg(values, const std::int64_t*);
            node->resval.rlname[0] = name ? name[0] : 0;
            node->resval.rlname[1] = name ? name[1] : 0;
            break;
        }
        case RTLB:
        case RTLE:
        case RTNIL:
        case kRtT:
        case kRtDotE:
            break;
        default:
            FreeChain(head);
            return nullptr;
        }
    }
    return head;
}

} // namespace devhost
