// Result-buffer chains as the host hands them out: nodes and strings from the C runtime heap (malloc),
// so that any module of the process can release them. Portable.
#pragma once

#include "hostapi/arxhost.h"

#include <cstdarg>

namespace devhost {

// Type codes the host knows beyond those the library uses.
enum : short {
    kRtDotE = 5018, // dot of a dotted pair
    kRtT = 5021,    // T, the true value
};

// One zeroed node of the type; nullptr when out of memory.
resbuf* NewNode(int restype);

// Releases a whole chain with its strings; nullptr is allowed.
void FreeChain(resbuf* chain);

// A copy of a chain with its strings; nullptr for an empty chain or when out of memory (nothing leaks).
resbuf* CopyChain(const resbuf* chain);

// Builds a chain from (type, value) pairs ended by type 0: RTSTR takes const wchar_t* (copied; a null
// pointer gives an empty string), RTSHORT int, RTLONG int32, RTREAL double, RTPOINT a pointer to three
// doubles, RTENAME a pointer to two int64; RTLB, RTLE, RTNIL, T and the dot take no value. Returns
// nullptr (and frees what it built) for an unknown type code or when out of memory.
resbuf* BuildChainV(int restype, va_list values);

// Duplicates a wide string with malloc; nullptr when out of memory.
wchar_t* DuplicateString(const wchar_t* text);

} // namespace devhost
