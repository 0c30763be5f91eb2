// Native builds stand in for the ANSI code page with a single-byte one (see TextConvPosix.cpp).
#include "hostapi/NarrowText.h"

const LeadByteTable& ActiveLeadBytes() {
    static const LeadByteTable table = LeadBytesOfCodePage(1252);
    return table;
}
