// A list of names in the shell's double-NUL form: ANSI names one after another, each ended by one NUL, the
// whole list ended by one further NUL. The file operation wrapper hands such lists to the shell. A list to
// which nothing was added has no block at all (Data() is null), which the shell refuses.
// Portable: no <windows.h>.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

class NameList {
public:
    NameList() = default;
    ~NameList();
    NameList(const NameList&) = delete;
    NameList& operator=(const NameList&) = delete;

    // Appends name and its NUL, and keeps the final NUL after it. The block grows to exactly the size
    // needed, the write position staying at the same distance from the block's start.
    void Add(const char* name);
    void Add(const std::string& name) { Add(name.c_str()); }
    // Frees the block: no list at all.
    void Clear();

    // The list, or nullptr when nothing was added.
    const char* Data() const { return m_block; }
    std::uint32_t Capacity() const { return m_capacity; }
    // Bytes used by the names, each with its NUL (the final NUL not counted).
    std::uint32_t Length() const { return m_length; }
    // The names in order (for tests and messages).
    std::vector<std::string> Names() const;

private:
    std::uint32_t m_capacity = 0;
    std::uint32_t m_length = 0;
    char* m_block = nullptr;
    char* m_write = nullptr;
};
