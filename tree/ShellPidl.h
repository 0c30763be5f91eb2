// Item id lists of the shell namespace and the two shell objects every tree and helper share.
#pragma once

#include <windows.h>
#include <shlobj.h>

#include <cstddef>

// The process-wide shell allocator. Each holder keeps one reference; the first obtains it with
// SHGetMalloc and the shared pointer goes back to null when the last reference is released.
class CShellAllocatorRef {
public:
    CShellAllocatorRef();
    ~CShellAllocatorRef();
    CShellAllocatorRef(const CShellAllocatorRef&) = delete;
    CShellAllocatorRef& operator=(const CShellAllocatorRef&) = delete;
    IMalloc* get() const { return m_malloc; }
    explicit operator bool() const { return m_malloc != nullptr; }

private:
    IMalloc* m_malloc = nullptr;
};

// The process-wide desktop folder, shared the same way (SHGetDesktopFolder for the first holder).
class CDesktopFolderRef {
public:
    CDesktopFolderRef();
    ~CDesktopFolderRef();
    CDesktopFolderRef(const CDesktopFolderRef&) = delete;
    CDesktopFolderRef& operator=(const CDesktopFolderRef&) = delete;
    IShellFolder* get() const { return m_folder; }
    explicit operator bool() const { return m_folder != nullptr; }

private:
    IShellFolder* m_folder = nullptr;
};

// Owns one item id list (absolute or relative, as each user says) allocated by the shell allocator,
// and frees it with that allocator. Move-only: a copy would free the list twice.
class CShellPidl {
public:
    CShellPidl() = default;
    explicit CShellPidl(LPITEMIDLIST owned) : m_pidl(owned) {}
    ~CShellPidl() { Reset(); }
    CShellPidl(CShellPidl&& other) noexcept : m_pidl(other.Release()) {}
    CShellPidl& operator=(CShellPidl&& other) noexcept {
        if (this != &other)
            Reset(other.Release());
        return *this;
    }
    CShellPidl(const CShellPidl&) = delete;
    CShellPidl& operator=(const CShellPidl&) = delete;

    LPITEMIDLIST get() const { return m_pidl; }
    explicit operator bool() const { return m_pidl != nullptr; }
    // For the shell calls that hand out a new list: frees the current one first.
    LPITEMIDLIST* Receive() {
        Reset();
        return &m_pidl;
    }
    LPITEMIDLIST Release() {
        LPITEMIDLIST pidl = m_pidl;
        m_pidl = nullptr;
        return pidl;
    }
    void Reset(LPITEMIDLIST owned = nullptr);

    // A copy of a list: exactly its size (ids and terminator) from the shell allocator. Empty when the
    // list is null or the allocation fails.
    static CShellPidl CopyOf(LPCITEMIDLIST pidl);
    // The parent's absolute list followed by a relative id: one allocation of both sizes plus the
    // 2-byte terminator. A null parent counts as the empty list.
    static CShellPidl Concat(LPCITEMIDLIST parent, LPCITEMIDLIST relative);

private:
    LPITEMIDLIST m_pidl = nullptr;
};

// Bytes of a list's ids, without the terminator (0 for null or the empty list).
std::size_t ItemIdListSize(LPCITEMIDLIST pidl);
// The last id of a list (the terminator itself for the empty list), or null for null.
LPCITEMIDLIST LastItemId(LPCITEMIDLIST pidl);
