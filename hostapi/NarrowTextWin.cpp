// The system's ANSI code page, asked once for every byte.
#include "hostapi/NarrowText.h"

#include <windows.h>

namespace {

LeadByteTable SystemLeadBytes() {
    LeadByteTable table{};
    for (int c = 0; c < 256; ++c)
        table.lead[c] = ::IsDBCSLeadByteEx(CP_ACP, static_cast<BYTE>(c)) != FALSE;
    return table;
}

} // namespace

const LeadByteTable& ActiveLeadBytes() {
    static const LeadByteTable table = SystemLeadBytes();
    return table;
}
