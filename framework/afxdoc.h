// The framework's document base: a title and nothing else. The explorer never opens or saves a
// document file; its document only carries settings. Portable: no <windows.h>.
#pragma once

#include <string>

class CDocument {
public:
    CDocument() = default;
    virtual ~CDocument() = default;
    CDocument(const CDocument&) = delete;
    CDocument& operator=(const CDocument&) = delete;

    const std::string& GetTitle() const { return m_strTitle; }
    virtual void SetTitle(const std::string& title) { m_strTitle = title; }

private:
    std::string m_strTitle;
};
