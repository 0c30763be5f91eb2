#include "fileops/NameList.h"

#include <cstdlib>
#include <cstring>
#include <new>

NameList::~NameList() {
    Clear();
}

void NameList::Add(const char* name) {
    if (!name)
        name = "";
    const std::size_t nameLength = std::strlen(name);
    const std::size_t needed = static_cast<std::size_t>(m_length) + 1 + (nameLength + 1);
    if (needed > m_capacity) {
        const std::ptrdiff_t offset = m_block ? m_write - m_block : 0;
        char* grown = static_cast<char*>(std::realloc(m_block, needed));
        if (!grown)
            throw std::bad_alloc();
        if (!m_block)
            grown[0] = '\0'; // a new block starts as the empty list
        m_block = grown;
        m_write = m_block + offset;
        m_capacity = static_cast<std::uint32_t>(needed);
    }
    std::memcpy(m_write, name, nameLength + 1);
    m_write += nameLength + 1;
    m_length += static_cast<std::uint32_t>(nameLength + 1);
    *m_write = '\0'; // the list's final NUL
}

void NameList::Clear() {
    std::free(m_block);
    m_block = nullptr;
    m_write = nullptr;
    m_capacity = 0;
    m_length = 0;
}

std::vector<std::string> NameList::Names() const {
    std::vector<std::string> names;
    if (!m_block)
        return names;
    for (const char* p = m_block; *p; p += std::strlen(p) + 1)
        names.emplace_back(p);
    return names;
}
