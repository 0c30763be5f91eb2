// The folder tree's questions to the shell that need no tree control: labels, child indicators,
// file-system paths, the sub-folders of a folder in the tree's order, and label paths.
#pragma once

#include "ShellNode.h"

#include <string>
#include <vector>

// The label of a node: with kShellFileSystemName its file-system path (cut to its rightmost n
// characters, n = position of the last backslash, unless kShellNormalName), otherwise or when there is
// no such path the parent folder's display name of the relative id (in-folder, or normal with
// kShellNormalName).
std::string ShellLabelOf(IShellFolder* parentFolder, LPCITEMIDLIST absoluteId, std::uint32_t flags);

// The parent folder's display name of a relative id with the given SHGDN flags; empty on failure.
std::string ShellDisplayName(IShellFolder* parentFolder, LPCITEMIDLIST relativeId, SHGDNF how);

// Whether the node gets an expand button: not a folder never; a folder always with kShellNonFolders
// or when removable; otherwise whether the shell says it has sub-folders.
bool ShellHasChildren(IShellFolder* parentFolder, LPCITEMIDLIST relativeId, std::uint32_t flags);

// The longest path the system names (\\?\ paths), in characters.
constexpr std::size_t kLongestPathChars = 32767;

// The file-system path of an absolute id in `path`; false (and `path` empty) for virtual folders and
// for paths that do not fit `capacity` characters with their terminator.
bool ShellFileSystemPath(LPCITEMIDLIST absoluteId, std::string& path, std::size_t capacity = MAX_PATH);

// The absolute id the shell parses a file-system path into (text in the thread's code page); empty when
// the shell does not know the path.
CShellPidl ShellPidlOfPath(IShellFolder* desktop, const std::string& path);

// The folder of an absolute id, with one reference for the caller: the desktop folder itself for the
// empty list, otherwise bound through it. Null when it cannot be bound.
IShellFolder* BindShellFolder(IShellFolder* desktop, LPCITEMIDLIST absoluteId);

// The tree's order of two relative ids of one folder: the folder's CompareIDs(0, a, b); a failure
// counts as equal, otherwise the sign of the result's 16-bit code.
int CompareShellIds(IShellFolder* folder, LPCITEMIDLIST a, LPCITEMIDLIST b);

// The relative ids of a folder's children the tree shows (folders; files with kShellNonFolders; hidden
// ones with kShellHidden), in the tree's order. Empty when the folder gives no enumerator.
std::vector<CShellPidl> EnumerateShellChildren(IShellFolder* folder, HWND owner, std::uint32_t flags);

// One node reached by a label path: its absolute id and its label.
struct ShellPathStep {
    CShellPidl absoluteId;
    std::string label;
};

// Follows a label path ("Desktop\My Computer\C:\dir") from the Desktop the way the tree does with
// flags 0: each component names, without regard to case, a child of the node before (the Desktop for
// the first). An empty component ends the walk (a trailing backslash); a component that matches no
// child stops it, and `complete` is then false. The steps are the nodes reached.
struct ShellPathWalk {
    std::vector<ShellPathStep> steps;
    bool complete = false;
};
ShellPathWalk WalkShellLabelPath(const std::string& labelPath);
