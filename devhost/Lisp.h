// The command line's LISP: reading one function call typed by the user and printing values the way the
// LISP interpreter prints them. Portable (no <windows.h>); the text is wide, as everywhere in the host
// interface.
#pragma once

#include "hostapi/arxhost.h"

#include <string>
#include <string_view>
#include <vector>

namespace devhost {

// One argument of a call, as read from the text.
struct LispValue {
    enum class Kind { Short, Long, Real, String, List, Nil, True };
    Kind kind = Kind::Nil;
    long number = 0;              // Short and Long
    double real = 0.0;            // Real
    std::wstring text;            // String
    std::vector<LispValue> items; // List (a quoted list)
};

struct LispCall {
    std::wstring function;       // as typed
    std::vector<LispValue> args; // top-level nil arguments are left out
};

// Reads one call such as (Orvex 1 2 "C:\\dwg\\" "Insert" "Close").
//  - integers in -32768..32767 are short values, other 32-bit integers are long values, larger ones are
//    an error;
//  - reals (1.5, -.5, 2., 1e3) are real values; strings take the escapes \\ \" \n \r \t \e and \nnn (octal);
//  - nil as an argument passes no argument; T passes the true value; '(...) passes a quoted list, in which
//    nil is the nil value.
// Returns false with a one-line message in `error` for anything else; never throws for bad text.
bool ReadLispCall(std::wstring_view text, LispCall& call, std::wstring& error);

// The argument chain of a call, allocated with malloc like every host chain (free with FreeChain).
resbuf* BuildArgumentChain(const std::vector<LispValue>& args);

// LISP's printed form of a value set by acedRetList: a chain that is exactly one value prints as that
// value, any other chain as the list of its values; an empty chain is nil.
std::wstring PrintChain(const resbuf* chain);

// A string in LISP's printed form: quoted, with \\ \" \n \r \t \e and other control characters as \nnn.
std::wstring PrintLispString(std::wstring_view text);

// A real in LISP's printed form: up to six significant digits, always with a decimal point (2.0, 0.5,
// 1.0e+20).
std::wstring PrintLispReal(double value);

} // namespace devhost
