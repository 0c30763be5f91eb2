// What the folder tree keeps per item (the item's lParam), and the enumeration flags of a node.
#pragma once

#include "ShellPidl.h"

#include <cstdint>
#include <utility>

enum ShellNodeFlags : std::uint32_t {
    kShellNonFolders = 0x01,    // files too, and every folder shows an expand button
    kShellHidden = 0x02,        // hidden items too
    kShellInherited = 0x0F,     // what children take over from their parent
    kShellNormalName = 0x10,    // the normal display name instead of the in-folder one
    kShellFileSystemName = 0x20 // the file-system path as label (whole with 0x10)
};

// Created when the node is inserted, destroyed with it. Holds one reference on the folder that
// enumerated the node (the desktop folder for the root).
class CShellNode {
public:
    CShellNode(IShellFolder* parentFolder, CShellPidl absoluteId, std::uint32_t flags)
        : m_parentFolder(parentFolder), m_absoluteId(std::move(absoluteId)), m_flags(flags) {
        if (m_parentFolder)
            m_parentFolder->AddRef();
    }
    ~CShellNode() {
        m_absoluteId.Reset(); // the id before the folder, in the order they were taken
        if (m_parentFolder)
            m_parentFolder->Release();
    }
    CShellNode(const CShellNode&) = delete;
    CShellNode& operator=(const CShellNode&) = delete;

    IShellFolder* ParentFolder() const { return m_parentFolder; }
    LPCITEMIDLIST AbsoluteId() const { return m_absoluteId.get(); }
    LPCITEMIDLIST RelativeId() const { return LastItemId(m_absoluteId.get()); }
    std::uint32_t Flags() const { return m_flags; }

private:
    IShellFolder* m_parentFolder;
    CShellPidl m_absoluteId;
    std::uint32_t m_flags;
};
