// Exceptions of the window-class framework. Portable: no <windows.h>.
//
// An index outside an array is an invalid-argument error; running out of memory while growing one is a
// memory error. Window procedures catch both (and anything else) and report them; nothing propagates
// into the host.
#pragma once

#include <stdexcept>

class CException : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

class CInvalidArgException : public CException {
public:
    CInvalidArgException() : CException("Invalid argument.") {}
};

class CMemoryException : public CException {
public:
    CMemoryException() : CException("Out of memory.") {}
};

[[noreturn]] inline void AfxThrowInvalidArgException() { throw CInvalidArgException(); }
[[noreturn]] inline void AfxThrowMemoryException() { throw CMemoryException(); }
