// The names' collation on Windows: each character of the ANSI code page widened and asked of the user's
// locale once, as a sort key with case, width and kana type ignored (the flags the file manager's order
// goes by). The key's first section, up to its 0x01, is what orders a character; the whole key is what the
// search tells characters apart by (an accent counts there, case and width do not).
#include "thumbs/NameCollation.h"

#include <windows.h>

namespace {

constexpr DWORD kIgnored = NORM_IGNORECASE | NORM_IGNOREWIDTH | NORM_IGNOREKANATYPE;

// The character's sort key without its closing 0; 0 when the system has none for it.
int SystemKey(const wchar_t* wide, int length, BYTE* key, int capacity) {
    const int n = ::LCMapStringW(LOCALE_USER_DEFAULT, LCMAP_SORTKEY | kIgnored, wide, length,
                                 reinterpret_cast<LPWSTR>(key), capacity);
    return n > 0 ? n - 1 : 0;
}

CharacterWeights SystemWeights(unsigned code) {
    CharacterWeights w;
    char narrow[2];
    int narrowLength = 1;
    if (code > 0xFF) {
        narrow[0] = static_cast<char>(code >> 8);
        narrow[1] = static_cast<char>(code & 0xFF);
        narrowLength = 2;
    } else {
        narrow[0] = static_cast<char>(code);
    }
    wchar_t wide[4];
    const int wideLength = ::MultiByteToWideChar(CP_ACP, 0, narrow, narrowLength, wide, 4);
    if (wideLength == 1 && wide[0] >= L'0' && wide[0] <= L'9')
        w.digit = static_cast<std::uint8_t>(wide[0] - L'0');
    else if (wideLength == 1 && wide[0] >= 0xFF10 && wide[0] <= 0xFF19) // full-width digits
        w.digit = static_cast<std::uint8_t>(wide[0] - 0xFF10);
    BYTE key[64];
    const int keyLength = wideLength > 0 ? SystemKey(wide, wideLength, key, sizeof key) : 0;
    if (keyLength <= 0) {
        // No character in the code page: its bytes, after every letter, keep the order deterministic.
        w.key[0] = 0xFF;
        for (int i = 0; i < narrowLength; ++i)
            w.key[1 + i] = static_cast<std::uint8_t>(narrow[i]);
        w.keyLength = w.primaryLength = static_cast<std::uint8_t>(1 + narrowLength);
        return w;
    }
    const int kept = keyLength < CharacterWeights::kCapacity ? keyLength : CharacterWeights::kCapacity;
    int primary = 0;
    while (primary < kept && key[primary] != 0x01)
        ++primary;
    for (int i = 0; i < kept; ++i)
        w.key[i] = key[i];
    w.keyLength = static_cast<std::uint8_t>(kept);
    w.primaryLength = static_cast<std::uint8_t>(primary);
    return w;
}

// Where the system puts digits among the other characters: the first byte of the key of "0".
std::uint8_t SystemNumberMark() {
    BYTE key[16];
    const wchar_t zero[] = L"0";
    if (SystemKey(zero, 1, key, sizeof key) > 0 && key[0] > 0x01)
        return key[0];
    return 0x0D;
}

} // namespace

NameCollation& ActiveNameCollation() {
    static NameCollation collation(ActiveLeadBytes(), &SystemWeights, SystemNumberMark());
    return collation;
}
