// The names' code page on Windows: the system's ANSI code page, asked once for every byte; its lead bytes
// are the ones every walk of narrow text uses.
#include "hostapi/NarrowText.h"
#include "thumbs/NameFold.h"

#include <windows.h>

namespace {

bool IsLead(unsigned char c) {
    return ActiveLeadBytes().lead[c];
}

unsigned char LowerByte(unsigned char c) {
    char one[2] = {static_cast<char>(c), 0};
    ::CharLowerBuffA(one, 1);
    return static_cast<unsigned char>(one[0]);
}

} // namespace

const NameFoldTable& NameFold() {
    static const NameFoldTable table = MakeNameFold(&LowerByte, &IsLead);
    return table;
}
