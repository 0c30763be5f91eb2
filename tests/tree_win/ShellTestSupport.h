// Shared set-up of the shell tests: COM on the test thread, folders on both drives.
#pragma once

#include "tree/ShellNamespace.h"

#include <gtest/gtest.h>

#include <string>

namespace treetest {

// Every test runs on a COM apartment thread, as the tree does.
class ShellTest : public ::testing::Test {
protected:
    void SetUp() override { m_com = CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED); }
    void TearDown() override {
        if (SUCCEEDED(m_com))
            CoUninitialize();
    }

private:
    HRESULT m_com = E_FAIL;
};

// The absolute id of a file-system path, or empty.
inline CShellPidl PidlOfPath(const std::string& path) {
    CDesktopFolderRef desktop;
    return ShellPidlOfPath(desktop.get(), path);
}

} // namespace treetest
