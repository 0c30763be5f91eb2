#include "devhost/Lisp.h"

#include "devhost/ResultBuffers.h"
#include "devhost/Text.h"

#include <cerrno>
#include <cinttypes>
#include <climits>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cwctype>

namespace devhost {
namespace {

constexpr int kMaxListDepth = 64;
constexpr int kMaxProgramDepth = 256; // a program's own nesting: a defun with its conditions and calls

bool IsSpace(wchar_t c) {
    return c == L' ' || c == L'\t' || c == L'\r' || c == L'\n' || c == L'\f' || c == L'\v';
}

bool IsDelimiter(wchar_t c) {
    return IsSpace(c) || c == L'(' || c == L')' || c == L'"' || c == L'\'' || c == L';';
}

bool IsDigit(wchar_t c) {
    return c >= L'0' && c <= L'9';
}

// A short excerpt of the user's text for an error line: one line, control characters spelled out.
std::wstring Excerpt(std::wstring_view text) {
    constexpr std::size_t kMax = 40;
    std::wstring out = EscapeControls(text.substr(0, kMax));
    if (text.size() > kMax)
        out += L"...";
    return out;
}

bool EqualsIgnoreCase(std::wstring_view a, std::wstring_view b) {
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i)
        if (std::towlower(a[i]) != std::towlower(b[i]))
            return false;
    return true;
}

bool IsIntegerToken(std::wstring_view token) {
    std::size_t i = (token[0] == L'+' || token[0] == L'-') ? 1 : 0;
    if (i == token.size())
        return false;
    for (; i < token.size(); ++i)
        if (!IsDigit(token[i]))
            return false;
    return true;
}

// [+-] (digits [. digits*] | . digits) [(e|E) [+-] digits], with a dot or an exponent.
bool IsRealToken(std::wstring_view token) {
    std::size_t i = (token[0] == L'+' || token[0] == L'-') ? 1 : 0;
    std::size_t digits = 0;
    bool dot = false, exponent = false;
    for (; i < token.size() && IsDigit(token[i]); ++i)
        ++digits;
    if (i < token.size() && token[i] == L'.') {
        dot = true;
        for (++i; i < token.size() && IsDigit(token[i]); ++i)
            ++digits;
    }
    if (digits == 0)
        return false;
    if (i < token.size() && (token[i] == L'e' || token[i] == L'E')) {
        exponent = true;
        ++i;
        if (i < token.size() && (token[i] == L'+' || token[i] == L'-'))
            ++i;
        std::size_t exponentDigits = 0;
        for (; i < token.size() && IsDigit(token[i]); ++i)
            ++exponentDigits;
        if (exponentDigits == 0)
            return false;
    }
    return i == token.size() && (dot || exponent);
}

class Reader {
public:
    explicit Reader(std::wstring_view text) : m_text(text) {}

    bool ReadCall(LispCall& call) {
        SkipSpace();
        if (AtEnd())
            return Fail(L"empty expression");
        if (Peek() != L'(')
            return Fail(L"expected a call in parentheses, found: " + Excerpt(m_text.substr(m_pos)));
        ++m_pos;
        SkipSpace();
        if (AtEnd())
            return Fail(L"missing ) at the end of the call");
        if (Peek() == L')')
            return Fail(L"no function in ()");
        if (IsDelimiter(Peek()))
            return Fail(L"bad function: " + Excerpt(m_text.substr(m_pos, 1)));
        const std::wstring_view name = ReadToken();
        if (IsIntegerToken(name) || IsRealToken(name))
            return Fail(L"bad function: " + Excerpt(name));
        call.function.assign(name.begin(), name.end());
        // nil in a call passes no argument, so it is not kept.
        if (!ReadItems(call.args, 0, L"missing ) at the end of the call", false))
            return false;
        SkipSpace();
        if (!AtEnd())
            return Fail(L"extra text after the call: " + Excerpt(m_text.substr(m_pos)));
        return true;
    }

    bool ReadProgram(std::vector<LispForm>& forms) {
        forms.clear();
        for (;;) {
            SkipSpace();
            if (AtEnd())
                return true;
            if (Peek() == L')')
                return FailAtLine(L"unexpected )");
            LispForm form;
            if (!ReadForm(form, 0))
                return false;
            forms.push_back(std::move(form));
        }
    }

    const std::wstring& Error() const { return m_error; }

private:
    int LineAt(std::size_t pos) const {
        int line = 1;
        for (std::size_t i = 0; i < pos && i < m_text.size(); ++i)
            if (m_text[i] == L'\n')
                ++line;
        return line;
    }

    bool FailAtLine(std::wstring message) { return FailAtLine(m_pos, std::move(message)); }

    bool FailAtLine(std::size_t pos, std::wstring message) {
        return Fail(L"line " + std::to_wstring(LineAt(pos)) + L": " + message);
    }

    // One form of a program; the position is on its first character.
    bool ReadForm(LispForm& form, int depth) {
        if (depth > kMaxProgramDepth)
            return FailAtLine(L"lists nested too deeply");
        const std::size_t start = m_pos;
        form.line = LineAt(start);
        const wchar_t c = Peek();
        if (c == L'"') {
            LispValue value;
            if (!ReadString(value))
                return FailAtLine(start, m_error);
            form.kind = LispForm::Kind::String;
            form.text = std::move(value.text);
            return true;
        }
        if (c == L'\'') {
            ++m_pos;
            SkipSpace();
            if (AtEnd() || Peek() == L')')
                return FailAtLine(start, L"nothing quoted after '");
            form.kind = LispForm::Kind::Quote;
            form.items.resize(1);
            return ReadForm(form.items[0], depth + 1);
        }
        if (c == L'(') {
            ++m_pos;
            form.kind = LispForm::Kind::List;
            for (;;) {
                SkipSpace();
                if (AtEnd())
                    return FailAtLine(start, L"missing ) for the list that begins here");
                if (Peek() == L')') {
                    ++m_pos;
                    return true;
                }
                LispForm item;
                if (!ReadForm(item, depth + 1))
                    return false;
                form.items.push_back(std::move(item));
            }
        }
        const std::wstring_view token = ReadToken();
        if (token.empty())
            return FailAtLine(start, L"unexpected character: " + Excerpt(m_text.substr(m_pos, 1)));
        if (IsIntegerToken(token)) {
            std::string narrow(token.begin(), token.end());
            errno = 0;
            const long long number = std::strtoll(narrow.c_str(), nullptr, 10);
            if (errno == ERANGE)
                return FailAtLine(start, L"integer out of range: " + Excerpt(token));
            form.kind = LispForm::Kind::Integer;
            form.integer = number;
            return true;
        }
        if (IsRealToken(token)) {
            std::string narrow(token.begin(), token.end());
            form.kind = LispForm::Kind::Real;
            form.real = std::strtod(narrow.c_str(), nullptr);
            return true;
        }
        form.kind = LispForm::Kind::Symbol;
        form.text.assign(token.begin(), token.end());
        return true;
    }

    bool AtEnd() const { return m_pos >= m_text.size(); }
    wchar_t Peek() const { return m_text[m_pos]; }

    bool Fail(std::wstring message) {
        m_error = std::move(message);
        return false;
    }

    void SkipSpace() {
        while (!AtEnd()) {
            if (IsSpace(Peek())) {
                ++m_pos;
            } else if (Peek() == L';' && m_pos + 1 < m_text.size() && m_text[m_pos + 1] == L'|') {
                // a block comment ;| ... |; (one left open runs to the end of the text)
                const std::size_t end = m_text.find(L"|;", m_pos + 2);
                m_pos = end == std::wstring_view::npos ? m_text.size() : end + 2;
            } else if (Peek() == L';') { // comment to the end of the line
                while (!AtEnd() && Peek() != L'\n')
                    ++m_pos;
            } else {
                break;
            }
        }
    }

    std::wstring_view ReadToken() {
        const std::size_t start = m_pos;
        while (!AtEnd() && !IsDelimiter(Peek()))
            ++m_pos;
        return m_text.substr(start, m_pos - start);
    }

    bool ReadValue(LispValue& value, int depth) {
        const wchar_t c = Peek();
        if (c == L'"')
            return ReadString(value);
        if (c == L'\'') {
            ++m_pos;
            SkipSpace();
            if (AtEnd() || Peek() != L'(')
                return Fail(L"only lists can be quoted: '" + Excerpt(m_text.substr(m_pos)));
            return ReadList(value, depth + 1);
        }
        if (c == L'(') {
            if (depth == 0)
                return Fail(L"nested calls are not evaluated; quote lists as '(...)");
            return ReadList(value, depth + 1);
        }
        if (c == L')')
            return Fail(L"unexpected )");
        return ReadAtom(value);
    }

    // Reads values up to and including the closing parenthesis.
    bool ReadItems(std::vector<LispValue>& items, int depth, const wchar_t* unclosed, bool keepNil) {
        items.clear();
        for (;;) {
            SkipSpace();
            if (AtEnd())
                return Fail(unclosed);
            if (Peek() == L')') {
                ++m_pos;
                return true;
            }
            LispValue item;
            if (!ReadValue(item, depth))
                return false;
            if (keepNil || item.kind != LispValue::Kind::Nil)
                items.push_back(std::move(item));
        }
    }

    bool ReadList(LispValue& value, int depth) {
        if (depth > kMaxListDepth)
            return Fail(L"lists nested too deeply");
        ++m_pos; // (
        value.kind = LispValue::Kind::List;
        if (!ReadItems(value.items, depth, L"missing ) at the end of a list", true))
            return false;
        if (value.items.empty()) // '() is nil
            value.kind = LispValue::Kind::Nil;
        return true;
    }

    bool ReadString(LispValue& value) {
        const std::size_t start = m_pos;
        ++m_pos; // opening quote
        value.kind = LispValue::Kind::String;
        value.text.clear();
        while (!AtEnd()) {
            wchar_t c = m_text[m_pos++];
            if (c == L'"')
                return true;
            if (c == L'\\') {
                if (AtEnd())
                    break;
                const wchar_t e = m_text[m_pos++];
                switch (e) {
                case L'\\':
                case L'"':
                    c = e;
                    break;
                case L'n':
                    c = L'\n';
                    break;
                case L'r':
                    c = L'\r';
                    break;
                case L't':
                    c = L'\t';
                    break;
                case L'e':
                    c = 27;
                    break;
                case L'0':
                case L'1':
                case L'2':
                case L'3':
                case L'4':
                case L'5':
                case L'6':
                case L'7': { // \nnn: up to three octal digits
                    unsigned code = static_cast<unsigned>(e - L'0');
                    for (int digits = 1; digits < 3 && !AtEnd() && Peek() >= L'0' && Peek() <= L'7'; ++digits)
                        code = code * 8 + static_cast<unsigned>(m_text[m_pos++] - L'0');
                    c = static_cast<wchar_t>(code);
                    break;
                }
                default:
                    return Fail(L"unknown escape \\" + Excerpt(std::wstring_view(&e, 1)) +
                                L" in a string (write a backslash as \\\\)");
                }
            }
            value.text += c;
        }
        return Fail(L"unterminated string: " + Excerpt(m_text.substr(start)));
    }

    bool ReadAtom(LispValue& value) {
        const std::wstring_view token = ReadToken();
        if (token.empty()) // a delimiter the caller does not handle, such as a stray quote
            return Fail(L"unexpected character: " + Excerpt(m_text.substr(m_pos, 1)));
        if (IsIntegerToken(token)) {
            std::string narrow(token.begin(), token.end());
            errno = 0;
            const long long number = std::strtoll(narrow.c_str(), nullptr, 10);
            if (errno == ERANGE || number < INT32_MIN || number > INT32_MAX)
                return Fail(L"integer out of range: " + Excerpt(token));
            value.kind =
                (number >= SHRT_MIN && number <= SHRT_MAX) ? LispValue::Kind::Short : LispValue::Kind::Long;
            value.number = static_cast<long>(number);
            return true;
        }
        if (IsRealToken(token)) {
            std::string narrow(token.begin(), token.end());
            const double real = std::strtod(narrow.c_str(), nullptr);
            if (!std::isfinite(real))
                return Fail(L"real out of range: " + Excerpt(token));
            value.kind = LispValue::Kind::Real;
            value.real = real;
            return true;
        }
        if (EqualsIgnoreCase(token, L"nil")) {
            value.kind = LispValue::Kind::Nil;
            return true;
        }
        if (EqualsIgnoreCase(token, L"T")) {
            value.kind = LispValue::Kind::True;
            return true;
        }
        return Fail(L"cannot pass the symbol " + Excerpt(token) +
                    L" (only numbers, strings, nil, T and quoted lists)");
    }

    std::wstring_view m_text;
    std::size_t m_pos = 0;
    std::wstring m_error;
};

// Appends the nodes of one value to a chain; false when out of memory.
bool AppendValue(const LispValue& value, resbuf*& head, resbuf*& tail) {
    auto append = [&](int type) -> resbuf* {
        resbuf* node = NewNode(type);
        if (node) {
            (tail ? tail->rbnext : head) = node;
            tail = node;
        }
        return node;
    };
    switch (value.kind) {
    case LispValue::Kind::Short: {
        resbuf* node = append(RTSHORT);
        if (!node)
            return false;
        node->resval.rint = static_cast<short>(value.number);
        return true;
    }
    case LispValue::Kind::Long: {
        resbuf* node = append(RTLONG);
        if (!node)
            return false;
        node->resval.rlong = static_cast<std::int32_t>(value.number);
        return true;
    }
    case LispValue::Kind::Real: {
        resbuf* node = append(RTREAL);
        if (!node)
            return false;
        node->resval.rreal = value.real;
        return true;
    }
    case LispValue::Kind::String: {
        wchar_t* copy = DuplicateString(value.text.c_str());
        if (!copy)
            return false;
        resbuf* node = append(RTSTR);
        if (!node) {
            std::free(copy);
            return false;
        }
        node->resval.rstring = copy;
        return true;
    }
    case LispValue::Kind::List:
        if (!append(RTLB))
            return false;
        for (const LispValue& item : value.items)
            if (!AppendValue(item, head, tail))
                return false;
        return append(RTLE) != nullptr;
    case LispValue::Kind::Nil:
        return append(RTNIL) != nullptr;
    case LispValue::Kind::True:
        return append(kRtT) != nullptr;
    }
    return false;
}

std::wstring Widen(const char* text) {
    return std::wstring(text, text + std::char_traits<char>::length(text));
}

void PrintAtom(const resbuf* node, std::wstring& out) {
    switch (node->restype) {
    case RTSHORT:
        out += std::to_wstring(node->resval.rint);
        break;
    case RTLONG:
        out += std::to_wstring(node->resval.rlong);
        break;
    case RTREAL:
        out += PrintLispReal(node->resval.rreal);
        break;
    case RTSTR:
        out += PrintLispString(node->resval.rstring ? std::wstring_view(node->resval.rstring)
                                                    : std::wstring_view());
        break;
    case RTPOINT:
        out += L"(" + PrintLispReal(node->resval.rpoint[0]) + L" " + PrintLispReal(node->resval.rpoint[1]) +
               L" " + PrintLispReal(node->resval.rpoint[2]) + L")";
        break;
    case RTENAME: {
        char buffer[40];
        std::snprintf(buffer, sizeof buffer, "<Entity name: %" PRIx64 ">",
                      static_cast<std::uint64_t>(node->resval.rlname[0]));
        out += Widen(buffer);
        break;
    }
    case RTNIL:
        out += L"nil";
        break;
    case kRtT:
        out += L"T";
        break;
    case kRtDotE:
        out += L".";
        break;
    default:
        out += L"<resbuf type " + std::to_wstring(node->restype) + L">";
    }
}

} // namespace

bool ReadLispCall(std::wstring_view text, LispCall& call, std::wstring& error) {
    Reader reader(text);
    try {
        if (reader.ReadCall(call))
            return true;
        error = reader.Error();
    } catch (const std::bad_alloc&) {
        error = L"out of memory";
    }
    return false;
}

bool ReadLispProgram(std::wstring_view text, std::vector<LispForm>& forms, std::wstring& error) {
    Reader reader(text);
    try {
        if (reader.ReadProgram(forms))
            return true;
        error = reader.Error();
    } catch (const std::bad_alloc&) {
        error = L"out of memory";
    }
    forms.clear();
    return false;
}

std::wstring PrintLispForm(const LispForm& form) {
    switch (form.kind) {
    case LispForm::Kind::Symbol:
        return form.text;
    case LispForm::Kind::Integer:
        return std::to_wstring(form.integer);
    case LispForm::Kind::Real:
        return PrintLispReal(form.real);
    case LispForm::Kind::String:
        return PrintLispString(form.text);
    case LispForm::Kind::Quote:
        return L"'" + (form.items.empty() ? std::wstring(L"nil") : PrintLispForm(form.items[0]));
    case LispForm::Kind::List: {
        std::wstring out = L"(";
        for (std::size_t i = 0; i < form.items.size(); ++i) {
            if (i > 0)
                out += L' ';
            out += PrintLispForm(form.items[i]);
        }
        return out + L")";
    }
    }
    return std::wstring();
}

bool IsLispConstant(const LispForm& form) {
    switch (form.kind) {
    case LispForm::Kind::Integer:
    case LispForm::Kind::Real:
    case LispForm::Kind::String:
    case LispForm::Kind::Quote:
        return true;
    case LispForm::Kind::Symbol:
        return EqualsIgnoreCase(form.text, L"nil") || EqualsIgnoreCase(form.text, L"T");
    case LispForm::Kind::List:
        return form.items.empty();
    }
    return false;
}

resbuf* BuildArgumentChain(const std::vector<LispValue>& args) {
    resbuf* head = nullptr;
    resbuf* tail = nullptr;
    for (const LispValue& value : args) {
        if (!AppendValue(value, head, tail)) {
            FreeChain(head);
            return nullptr;
        }
    }
    return head;
}

std::wstring PrintLispString(std::wstring_view text) {
    std::wstring out = L"\"";
    for (wchar_t c : text) {
        switch (c) {
        case L'\\':
            out += L"\\\\";
            break;
        case L'"':
            out += L"\\\"";
            break;
        case L'\n':
            out += L"\\n";
            break;
        case L'\r':
            out += L"\\r";
            break;
        case L'\t':
            out += L"\\t";
            break;
        case 27:
            out += L"\\e";
            break;
        default:
            if (static_cast<std::uint32_t>(c) < 0x20 || c == 0x7F) {
                out += L'\\';
                out += static_cast<wchar_t>(L'0' + ((c >> 6) & 7));
                out += static_cast<wchar_t>(L'0' + ((c >> 3) & 7));
                out += static_cast<wchar_t>(L'0' + (c & 7));
            } else {
                out += c;
            }
        }
    }
    out += L'"';
    return out;
}

std::wstring PrintLispReal(double value) {
    if (std::isnan(value))
        return L"nan";
    if (std::isinf(value))
        return value < 0 ? L"-inf" : L"inf";
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%.6g", value);
    std::string text = buffer;
    const std::size_t exponent = text.find('e');
    const std::string mantissa = text.substr(0, exponent);
    if (mantissa.find('.') == std::string::npos)
        text.insert(mantissa.size(), ".0");
    return Widen(text.c_str());
}

std::wstring PrintChain(const resbuf* chain) {
    // First pass: how many values the chain holds at its top level.
    int topLevel = 0;
    int depth = 0;
    for (const resbuf* node = chain; node; node = node->rbnext) {
        if (node->restype == RTLB) {
            if (depth == 0)
                ++topLevel;
            ++depth;
        } else if (node->restype == RTLE) {
            if (depth > 0)
                --depth;
        } else if (depth == 0) {
            ++topLevel;
        }
    }
    if (topLevel == 0)
        return L"nil";

    // Second pass: print, with a stack of open groups (where each began and how many items it holds).
    struct Group {
        std::size_t start;
        int items;
    };
    std::vector<Group> groups;
    std::wstring out;
    if (topLevel > 1) {
        out += L"(";
        groups.push_back({0, 0});
    }
    const std::size_t outerGroups = groups.size();
    auto separate = [&]() {
        if (!groups.empty() && groups.back().items++ > 0)
            out += L' ';
    };
    for (const resbuf* node = chain; node; node = node->rbnext) {
        if (node->restype == RTLB) {
            separate();
            groups.push_back({out.size(), 0});
            out += L'(';
        } else if (node->restype == RTLE) {
            if (groups.size() == outerGroups) // a stray list end
                continue;
            const Group group = groups.back();
            groups.pop_back();
            if (group.items == 0) { // () prints as nil
                out.erase(group.start);
                out += L"nil";
            } else {
                out += L')';
            }
        } else {
            separate();
            PrintAtom(node, out);
        }
    }
    while (groups.size() > outerGroups) { // lists the chain left open
        const Group group = groups.back();
        groups.pop_back();
        if (group.items == 0) {
            out.erase(group.start);
            out += L"nil";
        } else {
            out += L')';
        }
    }
    if (topLevel > 1)
        out += L')';
    return out;
}

} // namespace devhost
