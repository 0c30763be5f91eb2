#include "devhost/Lisp.h"
#include "devhost/ResultBuffers.h"

#include <gtest/gtest.h>

#include <memory>

using devhost::LispCall;
using devhost::LispValue;

namespace {

struct ChainDeleter {
    void operator()(resbuf* chain) const { devhost::FreeChain(chain); }
};
using Chain = std::unique_ptr<resbuf, ChainDeleter>;

LispCall Read(const std::wstring& text) {
    LispCall call;
    std::wstring error;
    EXPECT_TRUE(devhost::ReadLispCall(text, call, error)) << std::string(error.begin(), error.end());
    return call;
}

std::wstring ReadError(const std::wstring& text) {
    LispCall call;
    std::wstring error;
    EXPECT_FALSE(devhost::ReadLispCall(text, call, error));
    return error;
}

// Reads the call and prints its argument chain the way a returned value prints.
std::wstring RoundTrip(const std::wstring& text) {
    const LispCall call = Read(text);
    Chain chain(devhost::BuildArgumentChain(call.args));
    return devhost::PrintChain(chain.get());
}

TEST(LispReader, ReadsThePickerCall) {
    const LispCall call = Read(LR"((Orvex 1 2 "C:\\dwg\\" "Insert" "Close"))");
    EXPECT_EQ(call.function, L"Orvex");
    ASSERT_EQ(call.args.size(), 5u);
    EXPECT_EQ(call.args[0].kind, LispValue::Kind::Short);
    EXPECT_EQ(call.args[0].number, 1);
    EXPECT_EQ(call.args[1].number, 2);
    EXPECT_EQ(call.args[2].kind, LispValue::Kind::String);
    EXPECT_EQ(call.args[2].text, L"C:\\dwg\\");
    EXPECT_EQ(call.args[3].text, L"Insert");
    EXPECT_EQ(call.args[4].text, L"Close");
}

TEST(LispReader, ArgumentChainCarriesTheHostTypes) {
    const LispCall call = Read(LR"((f 1 -32768 32767 32768 -32769 2147483647 1.5 "a\"b"))");
    Chain chain(devhost::BuildArgumentChain(call.args));
    const short types[] = {RTSHORT, RTSHORT, RTSHORT, RTLONG, RTLONG, RTLONG, RTREAL, RTSTR};
    const resbuf* node = chain.get();
    for (short type : types) {
        ASSERT_NE(node, nullptr);
        EXPECT_EQ(node->restype, type);
        node = node->rbnext;
    }
    EXPECT_EQ(node, nullptr);
    EXPECT_EQ(chain->resval.rint, 1);
    EXPECT_EQ(chain->rbnext->resval.rint, -32768);
    EXPECT_EQ(chain->rbnext->rbnext->rbnext->resval.rlong, 32768);
    EXPECT_EQ(chain->rbnext->rbnext->rbnext->rbnext->resval.rlong, -32769);
    EXPECT_STREQ(chain->rbnext->rbnext->rbnext->rbnext->rbnext->rbnext->rbnext->resval.rstring, L"a\"b");
}

TEST(LispReader, NilPassesNoArgument) {
    const LispCall call = Read(L"(f nil 1 NIL)");
    ASSERT_EQ(call.args.size(), 1u);
    EXPECT_EQ(call.args[0].number, 1);
    EXPECT_TRUE(Read(L"(f)").args.empty());
    EXPECT_TRUE(Read(L"  ( f  )  ").args.empty());
}

TEST(LispReader, RealsInTheirForms) {
    const LispCall call = Read(L"(f 1.5 -.5 2. 1e3 -2.5E-2 +4.0)");
    ASSERT_EQ(call.args.size(), 6u);
    const double expected[] = {1.5, -0.5, 2.0, 1000.0, -0.025, 4.0};
    for (int i = 0; i < 6; ++i) {
        EXPECT_EQ(call.args[i].kind, LispValue::Kind::Real) << i;
        EXPECT_DOUBLE_EQ(call.args[i].real, expected[i]) << i;
    }
}

TEST(LispReader, StringEscapes) {
    const LispCall call = Read(LR"((f "a\\b" "q\"q" "n\nr\rt\te\e" "" "\101\0\1777"))");
    EXPECT_EQ(call.args[0].text, L"a\\b");
    EXPECT_EQ(call.args[1].text, L"q\"q");
    EXPECT_EQ(call.args[2].text, L"n\nr\rt\te\x1b");
    EXPECT_EQ(call.args[3].text, L"");
    EXPECT_EQ(call.args[4].text, std::wstring(L"A\0\x7f"
                                              L"7",
                                              4));
}

TEST(LispReader, QuotedListsAndTrue) {
    const LispCall call = Read(LR"((f '(1 "a" (2.5 nil)) T '()))");
    ASSERT_EQ(call.args.size(), 2u); // '() is nil and passes nothing
    EXPECT_EQ(call.args[0].kind, LispValue::Kind::List);
    EXPECT_EQ(call.args[1].kind, LispValue::Kind::True);
    EXPECT_EQ(RoundTrip(LR"((f '(1 "a" (2.5 nil)) T))"), LR"(((1 "a" (2.5 nil)) T))");
}

TEST(LispReader, CommentsAreSkipped) {
    EXPECT_EQ(Read(L"(f 1 ; the one\n 2)").args.size(), 2u);
}

TEST(LispReader, BadInputGivesClearErrors) {
    EXPECT_EQ(ReadError(L""), L"empty expression");
    EXPECT_EQ(ReadError(L"   "), L"empty expression");
    EXPECT_EQ(ReadError(L"Orvex 1"), L"expected a call in parentheses, found: Orvex 1");
    EXPECT_EQ(ReadError(L"(Orvex 1 2"), L"missing ) at the end of the call");
    EXPECT_EQ(ReadError(L"(Orvex"), L"missing ) at the end of the call");
    EXPECT_EQ(ReadError(L"("), L"missing ) at the end of the call");
    EXPECT_EQ(ReadError(L"()"), L"no function in ()");
    EXPECT_EQ(ReadError(L"(f 1))"), L"extra text after the call: )");
    EXPECT_EQ(ReadError(L"(f 1) (g)"), L"extra text after the call: (g)");
    EXPECT_EQ(ReadError(L"(f \"abc)"), L"unterminated string: \"abc)");
    EXPECT_EQ(ReadError(L"(f \"abc\\"), L"unterminated string: \"abc\\\\");
    EXPECT_EQ(ReadError(L"(f \"C:\\dwg\")"), L"unknown escape \\d in a string (write a backslash as \\\\)");
    EXPECT_EQ(ReadError(L"(f 2147483648)"), L"integer out of range: 2147483648");
    EXPECT_EQ(ReadError(L"(f -2147483649)"), L"integer out of range: -2147483649");
    EXPECT_EQ(ReadError(L"(f 99999999999999999999999)"), L"integer out of range: 99999999999999999999999");
    EXPECT_EQ(ReadError(L"(f 1e999)"), L"real out of range: 1e999");
    EXPECT_EQ(ReadError(L"(f x)"),
              L"cannot pass the symbol x (only numbers, strings, nil, T and quoted lists)");
    EXPECT_EQ(ReadError(L"(f 1.2.3)"),
              L"cannot pass the symbol 1.2.3 (only numbers, strings, nil, T and quoted lists)");
    EXPECT_EQ(ReadError(L"(f (g))"), L"nested calls are not evaluated; quote lists as '(...)");
    EXPECT_EQ(ReadError(L"(f 'x)"), L"only lists can be quoted: 'x)");
    EXPECT_EQ(ReadError(L"(f '(1 2)"), L"missing ) at the end of the call");
    EXPECT_EQ(ReadError(L"(f '(1 2"), L"missing ) at the end of a list");
    EXPECT_EQ(ReadError(L"(1 2)"), L"bad function: 1");
    EXPECT_EQ(ReadError(L"(\"f\" 2)"), L"bad function: \"");
    EXPECT_EQ(ReadError(L"(f \n\x01)"),
              L"cannot pass the symbol \\x01 (only numbers, strings, nil, T and quoted lists)");
}

TEST(LispReader, DeepNestingIsRefused) {
    std::wstring text = L"(f '";
    for (int i = 0; i < 200; ++i)
        text += L"(";
    EXPECT_EQ(ReadError(text), L"lists nested too deeply");
}

TEST(LispReader, LongExcerptsAreCut) {
    const std::wstring error = ReadError(L"(f \"" + std::wstring(100, L'x'));
    EXPECT_EQ(error, L"unterminated string: \"" + std::wstring(39, L'x') + L"...");
}

TEST(LispPrinter, PrintsTheResultList) {
    const wchar_t* path = L"C:\\dwg\\a.dwg";
    Chain chain(devhost::NewNode(RTSTR));
    chain->resval.rstring = devhost::DuplicateString(path);
    resbuf* tail = chain.get();
    auto add = [&](short type, const wchar_t* text = nullptr) {
        tail->rbnext = devhost::NewNode(type);
        tail = tail->rbnext;
        if (text)
            tail->resval.rstring = devhost::DuplicateString(text);
    };
    add(RTLB);
    add(RTSTR, L"0");
    add(RTSTR, L"7");
    add(RTSTR, L"");
    add(RTLE);
    EXPECT_EQ(devhost::PrintChain(chain.get()), LR"(("C:\\dwg\\a.dwg" ("0" "7" "")))");
}

TEST(LispPrinter, OneValuePrintsAlone) {
    EXPECT_EQ(RoundTrip(L"(f \"a\")"), L"\"a\"");
    EXPECT_EQ(RoundTrip(L"(f 7)"), L"7");
    EXPECT_EQ(RoundTrip(L"(f '(1 2))"), L"(1 2)");
    EXPECT_EQ(RoundTrip(L"(f 1 2)"), L"(1 2)");
}

TEST(LispPrinter, EmptyChainAndEmptyListAreNil) {
    EXPECT_EQ(devhost::PrintChain(nullptr), L"nil");
    Chain chain(devhost::NewNode(RTLB));
    chain->rbnext = devhost::NewNode(RTLE);
    EXPECT_EQ(devhost::PrintChain(chain.get()), L"nil");
}

TEST(LispPrinter, UnbalancedChainsNeverBreakThePrinter) {
    Chain open(devhost::NewNode(RTLB));
    open->rbnext = devhost::NewNode(RTSHORT);
    open->rbnext->resval.rint = 3;
    EXPECT_EQ(devhost::PrintChain(open.get()), L"(3)");
    Chain stray(devhost::NewNode(RTLE));
    stray->rbnext = devhost::NewNode(RTSHORT);
    EXPECT_EQ(devhost::PrintChain(stray.get()), L"0");
    Chain unknown(devhost::NewNode(4242));
    EXPECT_EQ(devhost::PrintChain(unknown.get()), L"<resbuf type 4242>");
}

TEST(LispPrinter, Atoms) {
    Chain point(devhost::NewNode(RTPOINT));
    point->resval.rpoint[0] = 1;
    point->resval.rpoint[1] = 2.5;
    point->resval.rpoint[2] = -3;
    EXPECT_EQ(devhost::PrintChain(point.get()), L"(1.0 2.5 -3.0)");
    Chain name(devhost::NewNode(RTENAME));
    name->resval.rlname[0] = 0x1f2e;
    EXPECT_EQ(devhost::PrintChain(name.get()), L"<Entity name: 1f2e>");
    Chain nil(devhost::NewNode(RTNIL));
    EXPECT_EQ(devhost::PrintChain(nil.get()), L"nil");
    Chain nullString(devhost::NewNode(RTSTR));
    EXPECT_EQ(devhost::PrintChain(nullString.get()), L"\"\"");
}

TEST(LispPrinter, Reals) {
    EXPECT_EQ(devhost::PrintLispReal(2.0), L"2.0");
    EXPECT_EQ(devhost::PrintLispReal(0.5), L"0.5");
    EXPECT_EQ(devhost::PrintLispReal(-1.25), L"-1.25");
    EXPECT_EQ(devhost::PrintLispReal(3.14159265), L"3.14159");
    EXPECT_EQ(devhost::PrintLispReal(1e20), L"1.0e+20");
    EXPECT_EQ(devhost::PrintLispReal(1.5e-7), L"1.5e-07");
}

TEST(LispPrinter, StringsAreEscapedBack) {
    EXPECT_EQ(devhost::PrintLispString(L"C:\\a \"b\"\n\t\r\x1b\x01"),
              L"\"C:\\\\a \\\"b\\\"\\n\\t\\r\\e\\001\"");
    // What is printed reads back as the same string.
    const std::wstring original = std::wstring(L"x\\y\"z\n\0\x01\x1f", 9);
    const LispCall call = Read(L"(f " + devhost::PrintLispString(original) + L")");
    EXPECT_EQ(call.args[0].text, original);
}

// ---- whole program files ---------------------------------------------------------------------------

std::vector<devhost::LispForm> ReadProgram(const std::wstring& text) {
    std::vector<devhost::LispForm> forms;
    std::wstring error;
    EXPECT_TRUE(devhost::ReadLispProgram(text, forms, error)) << std::string(error.begin(), error.end());
    return forms;
}

std::wstring ProgramError(const std::wstring& text) {
    std::vector<devhost::LispForm> forms;
    std::wstring error;
    EXPECT_FALSE(devhost::ReadLispProgram(text, forms, error));
    EXPECT_TRUE(forms.empty());
    return error;
}

TEST(LispProgram, ReadsADefunWithItsCommentsLeftOut) {
    const auto forms = ReadProgram(L";; a command\n"
                                   L"(defun c:pick (/ pick) ; locals\n"
                                   L"  ;| a block\n comment |;\n"
                                   L"  (setq pick (Orvex 1 2 \"C:\\\\Drawings\\\\\" \"Insert\" \"Close\"))\n"
                                   L"  (if (member pick '(\"a\" \"b\")) (princ 1.5) (princ -7))\n"
                                   L"  (princ))\n"
                                   L"(princ)\n");
    ASSERT_EQ(forms.size(), 2u);
    const devhost::LispForm& defun = forms[0];
    ASSERT_EQ(defun.kind, devhost::LispForm::Kind::List);
    EXPECT_EQ(defun.line, 2);
    ASSERT_EQ(defun.items.size(), 6u);
    EXPECT_EQ(defun.items[0].text, L"defun");
    EXPECT_EQ(defun.items[1].text, L"c:pick");
    const devhost::LispForm& setq = defun.items[3];
    EXPECT_EQ(setq.line, 5);
    const devhost::LispForm& call = setq.items[2];
    EXPECT_EQ(devhost::PrintLispForm(call), L"(Orvex 1 2 \"C:\\\\Drawings\\\\\" \"Insert\" \"Close\")");
    EXPECT_EQ(call.items[3].text, L"C:\\Drawings\\");
    EXPECT_EQ(devhost::PrintLispForm(defun.items[4]),
              L"(if (member pick '(\"a\" \"b\")) (princ 1.5) (princ -7))");
    EXPECT_EQ(devhost::PrintLispForm(forms[1]), L"(princ)");
}

TEST(LispProgram, PrintedFormsReadBackAsTheSameText) {
    const std::wstring text = L"(a 'b '(c . d) \"e\\n\\\"f\" 123456789012 -0.25 nil T ())";
    const auto forms = ReadProgram(text);
    ASSERT_EQ(forms.size(), 1u);
    const std::wstring printed = devhost::PrintLispForm(forms[0]);
    EXPECT_EQ(printed, text);
    const auto again = ReadProgram(printed);
    ASSERT_EQ(again.size(), 1u);
    EXPECT_EQ(devhost::PrintLispForm(again[0]), printed);
}

TEST(LispProgram, ConstantsAreWhatACallPassesAsItIs) {
    const auto forms = ReadProgram(L"(f 1 2.5 \"s\" nil T '(x) 'y () x (g))");
    ASSERT_EQ(forms.size(), 1u);
    const auto& items = forms[0].items;
    for (std::size_t i = 1; i <= 8; ++i)
        EXPECT_TRUE(devhost::IsLispConstant(items[i])) << i;
    EXPECT_FALSE(devhost::IsLispConstant(items[9])) << "a symbol is a variable";
    EXPECT_FALSE(devhost::IsLispConstant(items[10])) << "a call is evaluated";
}

TEST(LispProgram, BrokenProgramsSayWhereOnWhichLine) {
    EXPECT_EQ(ProgramError(L"(defun c:x ()\n  (princ \"a\")\n"),
              L"line 1: missing ) for the list that begins here");
    EXPECT_EQ(ProgramError(L"(a)\n(b))\n"), L"line 2: unexpected )");
    EXPECT_EQ(ProgramError(L"(a\n \"open)\n"), L"line 2: unterminated string: \"open)\\n");
    EXPECT_EQ(ProgramError(L"(a \"\\q\")"),
              L"line 1: unknown escape \\q in a string (write a backslash as \\\\)");
    EXPECT_EQ(ProgramError(L"(a ')"), L"line 1: nothing quoted after '");
    EXPECT_EQ(ProgramError(L"(a 99999999999999999999)"),
              L"line 1: integer out of range: 99999999999999999999");
    EXPECT_EQ(ProgramError(std::wstring(300, L'(')), L"line 1: lists nested too deeply");
}

TEST(LispProgram, AnEmptyFileHoldsNoForms) {
    EXPECT_TRUE(ReadProgram(L"").empty());
    EXPECT_TRUE(ReadProgram(L"  ; only a comment\n;| and a block |;").empty());
}

} // namespace
