#include "ShellPidl.h"

#include <cstring>

namespace {

// Written and read on the user-interface thread only, like every shell call of the tree.
IMalloc* g_shellAllocator = nullptr;
IShellFolder* g_desktopFolder = nullptr;

} // namespace

CShellAllocatorRef::CShellAllocatorRef() {
    if (g_shellAllocator) {
        g_shellAllocator->AddRef();
    } else if (FAILED(SHGetMalloc(&g_shellAllocator))) {
        g_shellAllocator = nullptr;
    }
    m_malloc = g_shellAllocator;
}

CShellAllocatorRef::~CShellAllocatorRef() {
    if (m_malloc && m_malloc->Release() == 0 && g_shellAllocator == m_malloc)
        g_shellAllocator = nullptr;
}

CDesktopFolderRef::CDesktopFolderRef() {
    if (g_desktopFolder) {
        g_desktopFolder->AddRef();
    } else if (FAILED(SHGetDesktopFolder(&g_desktopFolder))) {
        g_desktopFolder = nullptr;
    }
    m_folder = g_desktopFolder;
}

CDesktopFolderRef::~CDesktopFolderRef() {
    if (m_folder && m_folder->Release() == 0 && g_desktopFolder == m_folder)
        g_desktopFolder = nullptr;
}

void CShellPidl::Reset(LPITEMIDLIST owned) {
    if (m_pidl && m_pidl != owned) {
        CShellAllocatorRef allocator;
        if (allocator)
            allocator.get()->Free(m_pidl);
    }
    m_pidl = owned;
}

std::size_t ItemIdListSize(LPCITEMIDLIST pidl) {
    std::size_t size = 0;
    if (!pidl)
        return 0;
    const BYTE* cursor = reinterpret_cast<const BYTE*>(pidl);
    for (;;) {
        USHORT cb = 0;
        std::memcpy(&cb, cursor, sizeof cb); // ids are packed: no alignment promised
        if (cb == 0)
            return size;
        size += cb;
        cursor += cb;
    }
}

LPCITEMIDLIST LastItemId(LPCITEMIDLIST pidl) {
    if (!pidl)
        return nullptr;
    const BYTE* cursor = reinterpret_cast<const BYTE*>(pidl);
    const BYTE* last = cursor;
    for (;;) {
        USHORT cb = 0;
        std::memcpy(&cb, cursor, sizeof cb);
        if (cb == 0)
            return reinterpret_cast<LPCITEMIDLIST>(last);
        last = cursor;
        cursor += cb;
    }
}

CShellPidl CShellPidl::CopyOf(LPCITEMIDLIST pidl) {
    if (!pidl)
        return {};
    return Concat(nullptr, pidl);
}

CShellPidl CShellPidl::Concat(LPCITEMIDLIST parent, LPCITEMIDLIST relative) {
    const std::size_t parentSize = ItemIdListSize(parent);
    const std::size_t relativeSize = ItemIdListSize(relative);
    CShellAllocatorRef allocator;
    if (!allocator)
        return {};
    void* memory = allocator.get()->Alloc(parentSize + relativeSize + 2);
    if (!memory)
        return {};
    BYTE* bytes = static_cast<BYTE*>(memory);
    if (parentSize)
        std::memcpy(bytes, parent, parentSize);
    if (relativeSize)
        std::memcpy(bytes + parentSize, relative, relativeSize);
    bytes[parentSize + relativeSize] = 0;
    bytes[parentSize + relativeSize + 1] = 0;
    return CShellPidl(static_cast<LPITEMIDLIST>(memory));
}
