#include "devhost/Output.h"

#include "devhost/Text.h"

#include <windows.h>

#include <mutex>

namespace devhost {
namespace {

std::mutex g_lock;
bool g_atLineStart = true;

// A console gets wide text as it is; a file or a pipe gets UTF-8.
void Write(DWORD which, std::wstring_view text) {
    if (text.empty())
        return;
    HANDLE handle = GetStdHandle(which);
    if (!handle || handle == INVALID_HANDLE_VALUE)
        return;
    DWORD mode = 0;
    DWORD written = 0;
    if (GetConsoleMode(handle, &mode)) {
        WriteConsoleW(handle, text.data(), static_cast<DWORD>(text.size()), &written, nullptr);
        return;
    }
    const std::string bytes = ToUtf8(text);
    WriteFile(handle, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
}

} // namespace

void WriteText(std::wstring_view text) {
    std::lock_guard<std::mutex> guard(g_lock);
    Write(STD_OUTPUT_HANDLE, text);
    if (!text.empty())
        g_atLineStart = text.back() == L'\n';
}

void WriteLine(std::wstring_view line) {
    std::lock_guard<std::mutex> guard(g_lock);
    std::wstring text;
    if (!g_atLineStart)
        text += L'\n';
    text.append(line);
    text += L'\n';
    Write(STD_OUTPUT_HANDLE, text);
    g_atLineStart = true;
}

void WriteError(std::wstring_view line) {
    std::lock_guard<std::mutex> guard(g_lock);
    std::wstring text(L"devhost: ");
    text.append(line);
    text += L'\n';
    Write(STD_ERROR_HANDLE, text);
}

} // namespace devhost
