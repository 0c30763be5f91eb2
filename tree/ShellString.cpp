#include "ShellString.h"

CShellString::CShellString(const STRRET& name, LPCITEMIDLIST item)
    : m_name(name), m_item(CShellPidl::CopyOf(item)) {}

CShellString::~CShellString() {
    if (m_name.uType == STRRET_WSTR && m_name.pOleStr) {
        CShellAllocatorRef allocator;
        if (allocator)
            allocator.get()->Free(m_name.pOleStr);
    }
}

std::string CShellString::Text() const {
    switch (m_name.uType) {
    case STRRET_WSTR: {
        if (!m_name.pOleStr)
            return {};
        const int bytes = WideCharToMultiByte(CP_ACP, 0, m_name.pOleStr, -1, nullptr, 0, nullptr, nullptr);
        if (bytes <= 1)
            return {};
        std::string text(static_cast<std::size_t>(bytes), '\0');
        WideCharToMultiByte(CP_ACP, 0, m_name.pOleStr, -1, text.data(), bytes, nullptr, nullptr);
        text.resize(static_cast<std::size_t>(bytes) - 1);
        return text;
    }
    case STRRET_OFFSET: {
        if (!m_item)
            return {};
        const std::size_t size = ItemIdListSize(m_item.get());
        if (m_name.uOffset >= size)
            return {};
        const char* start = reinterpret_cast<const char*>(m_item.get()) + m_name.uOffset;
        std::size_t length = 0;
        while (m_name.uOffset + length < size && start[length])
            ++length;
        return std::string(start, length);
    }
    case STRRET_CSTR: {
        std::size_t length = 0;
        while (length < sizeof m_name.cStr && m_name.cStr[length])
            ++length;
        return std::string(m_name.cStr, length);
    }
    default:
        return {};
    }
}
