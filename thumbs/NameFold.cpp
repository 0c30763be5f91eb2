#include "thumbs/NameFold.h"

#include <algorithm>

NameFoldTable MakeNameFold(unsigned char (*lower)(unsigned char), bool (*isLead)(unsigned char)) {
    NameFoldTable table{};
    for (int c = 0; c < 256; ++c) {
        const auto byte = static_cast<unsigned char>(c);
        table.leadByte[c] = isLead != nullptr && isLead(byte);
        table.lower[c] = table.leadByte[c] ? byte : lower(byte);
    }
    return table;
}

namespace {

unsigned char Lower1252(unsigned char c) {
    if (c >= 'A' && c <= 'Z')
        return static_cast<unsigned char>(c + ('a' - 'A'));
    if (c >= 0xC0 && c <= 0xDE && c != 0xD7)
        return static_cast<unsigned char>(c + 0x20);
    switch (c) {
    case 0x8A: // S with caron
    case 0x8C: // OE
    case 0x8E: // Z with caron
        return static_cast<unsigned char>(c + 0x10);
    case 0x9F: // Y with diaeresis
        return 0xFF;
    default:
        return c;
    }
}

} // namespace

NameFoldTable Windows1252NameFold() {
    return MakeNameFold(&Lower1252, nullptr);
}

void FoldNameInPlace(std::string& name, const NameFoldTable& fold) {
    for (std::size_t i = 0; i < name.size(); ++i) {
        const auto c = static_cast<unsigned char>(name[i]);
        if (fold.leadByte[c]) {
            ++i; // the trail byte may look like an ASCII letter; it is not one
            continue;
        }
        name[i] = static_cast<char>(fold.lower[c]);
    }
}

namespace {

// Compares the first n bytes of a and b folded; trail bytes of double-byte characters compare raw.
int CompareFolded(const char* a, const char* b, std::size_t n, const NameFoldTable& fold) {
    for (std::size_t i = 0; i < n; ++i) {
        const auto ca = static_cast<unsigned char>(a[i]);
        const auto cb = static_cast<unsigned char>(b[i]);
        const unsigned char fa = fold.lower[ca];
        const unsigned char fb = fold.lower[cb];
        if (fa != fb)
            return fa < fb ? -1 : 1;
        if (fold.leadByte[ca] && i + 1 < n) {
            // Equal lead bytes: the trail bytes follow as they are.
            ++i;
            const auto ta = static_cast<unsigned char>(a[i]);
            const auto tb = static_cast<unsigned char>(b[i]);
            if (ta != tb)
                return ta < tb ? -1 : 1;
        }
    }
    return 0;
}

} // namespace

int CompareNamesNoCase(const std::string& a, const std::string& b, const NameFoldTable& fold) {
    const std::size_t n = std::min(a.size(), b.size());
    if (const int r = CompareFolded(a.data(), b.data(), n, fold))
        return r;
    if (a.size() == b.size())
        return 0;
    return a.size() < b.size() ? -1 : 1;
}

bool StartsWithNoCase(const std::string& name, const std::string& text, const NameFoldTable& fold) {
    return name.size() >= text.size() && CompareFolded(name.data(), text.data(), text.size(), fold) == 0;
}
