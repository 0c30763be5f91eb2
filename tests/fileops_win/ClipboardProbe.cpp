// Another program on the clipboard, written against the system alone (no code of the explorer):
//   clipboard_probe read                 the file list through DragQueryFileA and DragQueryFileW
//   clipboard_probe paste FOLDER         copies the list's files into FOLDER with the system's file operation
//   clipboard_probe put-wide FILE...     puts a list of wide names there, as most programs do
//   clipboard_probe formats              the formats on the clipboard, by number
// Prints one fact a line; exit code 0, or 1 when the clipboard could not be opened.
#include <windows.h>
#include <shellapi.h>
#include <shlobj.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

// SetClipboardData after EmptyClipboard needs an owner window: a message-only one.
HWND Owner() {
    static HWND owner =
        CreateWindowExW(0, L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    return owner;
}

bool Open() {
    for (int i = 0; i < 50; ++i) {
        if (OpenClipboard(Owner()))
            return true;
        Sleep(20);
    }
    return false;
}

std::string Utf8(const std::wstring& text) {
    const int n = WideCharToMultiByte(CP_UTF8, 0, text.c_str(), -1, nullptr, 0, nullptr, nullptr);
    std::string out(static_cast<std::size_t>(n > 0 ? n - 1 : 0), '\0');
    if (n > 1)
        WideCharToMultiByte(CP_UTF8, 0, text.c_str(), -1, out.data(), n, nullptr, nullptr);
    return out;
}

std::vector<std::wstring> WideNames(HDROP drop) {
    std::vector<std::wstring> names;
    const UINT count = DragQueryFileW(drop, 0xFFFFFFFF, nullptr, 0);
    for (UINT i = 0; i < count; ++i) {
        std::wstring name(DragQueryFileW(drop, i, nullptr, 0) + 1, L'\0');
        name.resize(DragQueryFileW(drop, i, name.data(), static_cast<UINT>(name.size())));
        names.push_back(name);
    }
    return names;
}

int Read() {
    if (!Open())
        return 1;
    auto* drop = static_cast<HDROP>(GetClipboardData(CF_HDROP));
    if (!drop) {
        std::printf("no-file-list\n");
        CloseClipboard();
        return 0;
    }
    const UINT countA = DragQueryFileA(drop, 0xFFFFFFFF, nullptr, 0);
    std::printf("count-a %u\n", countA);
    for (UINT i = 0; i < countA; ++i) {
        char name[MAX_PATH * 2] = "";
        DragQueryFileA(drop, i, name, sizeof name);
        std::printf("a %s\n", name);
    }
    const std::vector<std::wstring> wide = WideNames(drop);
    std::printf("count-w %u\n", static_cast<unsigned>(wide.size()));
    for (const std::wstring& name : wide)
        std::printf("w %s\n", Utf8(name).c_str());
    CloseClipboard();
    return 0;
}

int Paste(const wchar_t* folder) {
    if (!Open())
        return 1;
    auto* drop = static_cast<HDROP>(GetClipboardData(CF_HDROP));
    std::vector<std::wstring> names = drop ? WideNames(drop) : std::vector<std::wstring>();
    CloseClipboard();
    std::wstring from;
    for (const std::wstring& name : names)
        from += name + L'\0';
    from += L'\0';
    std::wstring to = std::wstring(folder) + L'\0' + L'\0';
    SHFILEOPSTRUCTW op{};
    op.wFunc = FO_COPY;
    op.pFrom = from.c_str();
    op.pTo = to.c_str();
    op.fFlags = FOF_NOCONFIRMATION | FOF_NOERRORUI | FOF_SILENT;
    const int result = names.empty() ? -1 : SHFileOperationW(&op);
    std::printf("pasted %u result %d\n", static_cast<unsigned>(names.size()), result);
    return 0;
}

int PutWide(int count, wchar_t** files) {
    std::wstring names;
    for (int i = 0; i < count; ++i)
        names += std::wstring(files[i]) + L'\0';
    names += L'\0';
    const SIZE_T bytes = sizeof(DROPFILES) + names.size() * sizeof(wchar_t);
    HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE | GMEM_ZEROINIT, bytes);
    auto* header = static_cast<DROPFILES*>(GlobalLock(block));
    header->pFiles = sizeof(DROPFILES);
    header->fWide = TRUE;
    std::memcpy(header + 1, names.data(), names.size() * sizeof(wchar_t));
    GlobalUnlock(block);
    if (!Open())
        return 1;
    EmptyClipboard();
    const bool put = SetClipboardData(CF_HDROP, block) != nullptr;
    CloseClipboard();
    std::printf("put-wide %d %s\n", count, put ? "ok" : "refused");
    return 0;
}

int Formats() {
    if (!Open())
        return 1;
    for (UINT format = EnumClipboardFormats(0); format; format = EnumClipboardFormats(format))
        std::printf("format %u\n", format);
    CloseClipboard();
    return 0;
}

} // namespace

int wmain(int argc, wchar_t** argv) {
    const std::wstring command = argc > 1 ? argv[1] : L"";
    if (command == L"read")
        return Read();
    if (command == L"paste" && argc == 3)
        return Paste(argv[2]);
    if (command == L"put-wide")
        return PutWide(argc - 2, argv + 2);
    if (command == L"formats")
        return Formats();
    std::fprintf(stderr, "usage: clipboard_probe read | paste FOLDER | put-wide FILE... | formats\n");
    return 2;
}
