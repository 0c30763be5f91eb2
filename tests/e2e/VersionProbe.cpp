// Reads a file's version resource the way the system's file properties do, with the system alone (no
// code of the explorer):
//   version_probe FILE
// Prints one field a line: the fixed part as "fixed-file-version A.B.C.D", "fixed-product-version ...",
// "file-type N" (2 is a DLL), then each string of the first translation as "NAME=VALUE". Exit code 0, or 1
// with a line on standard error when the file has no version resource.
#include <windows.h>

#include <cstdio>
#include <string>

namespace {

std::string Utf8(const wchar_t* text) {
    const int size = WideCharToMultiByte(CP_UTF8, 0, text, -1, nullptr, 0, nullptr, nullptr);
    if (size <= 1)
        return std::string();
    std::string out(static_cast<std::size_t>(size - 1), '\0');
    WideCharToMultiByte(CP_UTF8, 0, text, -1, &out[0], size, nullptr, nullptr);
    return out;
}

void PrintVersion(const char* name, DWORD high, DWORD low) {
    std::printf("%s %lu.%lu.%lu.%lu\n", name, static_cast<unsigned long>(HIWORD(high)),
                static_cast<unsigned long>(LOWORD(high)), static_cast<unsigned long>(HIWORD(low)),
                static_cast<unsigned long>(LOWORD(low)));
}

} // namespace

int wmain(int argc, wchar_t** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: version_probe FILE\n");
        return 2;
    }
    DWORD ignored = 0;
    const DWORD size = GetFileVersionInfoSizeW(argv[1], &ignored);
    if (size == 0) {
        std::fprintf(stderr, "version_probe: no version resource (error %lu)\n", GetLastError());
        return 1;
    }
    std::string block(size, '\0');
    if (!GetFileVersionInfoW(argv[1], 0, size, &block[0])) {
        std::fprintf(stderr, "version_probe: the version resource cannot be read (error %lu)\n",
                     GetLastError());
        return 1;
    }
    VS_FIXEDFILEINFO* fixed = nullptr;
    UINT length = 0;
    if (!VerQueryValueW(block.data(), L"\\", reinterpret_cast<void**>(&fixed), &length) || !fixed ||
        fixed->dwSignature != 0xFEEF04BD) {
        std::fprintf(stderr, "version_probe: no fixed file information\n");
        return 1;
    }
    PrintVersion("fixed-file-version", fixed->dwFileVersionMS, fixed->dwFileVersionLS);
    PrintVersion("fixed-product-version", fixed->dwProductVersionMS, fixed->dwProductVersionLS);
    std::printf("file-type %lu\n", static_cast<unsigned long>(fixed->dwFileType));

    struct Translation {
        WORD language;
        WORD codePage;
    };
    Translation* translations = nullptr;
    if (!VerQueryValueW(block.data(), L"\\VarFileInfo\\Translation", reinterpret_cast<void**>(&translations),
                        &length) ||
        length < sizeof(Translation)) {
        std::fprintf(stderr, "version_probe: no translation\n");
        return 1;
    }
    std::printf("translation %04x%04x\n", translations[0].language, translations[0].codePage);
    const wchar_t* const names[] = {L"CompanyName",  L"FileDescription", L"FileVersion",
                                    L"InternalName", L"LegalCopyright",  L"OriginalFilename",
                                    L"ProductName",  L"ProductVersion"};
    for (const wchar_t* name : names) {
        wchar_t query[128];
        swprintf(query, 128, L"\\StringFileInfo\\%04x%04x\\%ls", translations[0].language,
                 translations[0].codePage, name);
        wchar_t* value = nullptr;
        if (VerQueryValueW(block.data(), query, reinterpret_cast<void**>(&value), &length) && value)
            std::printf("%s=%s\n", Utf8(name).c_str(), Utf8(value).c_str());
        else
            std::printf("%s (missing)\n", Utf8(name).c_str());
    }
    return 0;
}
