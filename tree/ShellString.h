// The text of a shell display name: one STRRET and the item id it refers to.
#pragma once

#include "ShellPidl.h"

#include <string>

// Holds the STRRET a folder's GetDisplayNameOf returned together with (a copy of) the item id it was
// asked for, because STRRET_OFFSET points into that id. Frees the wide text of STRRET_WSTR.
class CShellString {
public:
    CShellString(const STRRET& name, LPCITEMIDLIST item);
    ~CShellString();
    CShellString(const CShellString&) = delete;
    CShellString& operator=(const CShellString&) = delete;

    // STRRET_WSTR converted to the ANSI code page, STRRET_OFFSET the ANSI text inside the item's id,
    // STRRET_CSTR the inline ANSI text; empty for anything else.
    std::string Text() const;

private:
    STRRET m_name;
    CShellPidl m_item;
};
