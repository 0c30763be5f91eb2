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

// One form of a LISP program file as read, nothing evaluated: what `load` would read before it runs it.
struct LispForm {
    enum class Kind { Symbol, Integer, Real, String, List, Quote };
    Kind kind = Kind::Symbol;
    std::wstring text;           // Symbol (as written), String
    long long integer = 0;       // Integer
    double real = 0.0;           // Real
    std::vector<LispForm> items; // List; Quote: the one quoted form
    int line = 0;                // where the form begins, from 1
};

// Reads a whole program file: every top-level form, with comments (; to the end of the line, and
// ;| ... |; blocks), strings with the escapes of ReadLispCall, integers of any size, reals, quotes and
// dotted pairs (the dot reads as a symbol). Returns false with "line N: message" in `error` for text that
// is not a sequence of whole forms (an unclosed list or string, a stray parenthesis); never throws for bad
// text.
bool ReadLispProgram(std::wstring_view text, std::vector<LispForm>& forms, std::wstring& error);

// A form printed back in a form ReadLispProgram reads as the same form: symbols as written, strings with
// their escapes, 'X for a quote.
std::wstring PrintLispForm(const LispForm& form);

// True when the form is a constant: a number, a string, nil, T or a quoted form (what a call can pass
// without evaluating anything).
bool IsLispConstant(const LispForm& form);

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
