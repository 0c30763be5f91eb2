// Fuzzes the command line's LISP reader and printer: any bytes, read as UTF-8, must give either a call or
// an error message; a call's arguments must build a chain that prints and reads back. The same bytes read
// as a program file (--load) give forms or an error; printed forms read back and print the same.
#include "devhost/Lisp.h"
#include "devhost/ResultBuffers.h"
#include "devhost/Text.h"

#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

void CheckProgram(const std::wstring& text) {
    std::vector<devhost::LispForm> forms;
    std::wstring error;
    if (!devhost::ReadLispProgram(text, forms, error)) {
        if (error.empty() || !forms.empty())
            std::abort();
        return;
    }
    for (const devhost::LispForm& form : forms) {
        const std::wstring printed = devhost::PrintLispForm(form);
        std::vector<devhost::LispForm> again;
        if (!devhost::ReadLispProgram(printed, again, error) || again.size() != 1 ||
            devhost::PrintLispForm(again[0]) != printed)
            std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::wstring text = devhost::FromUtf8(std::string_view(reinterpret_cast<const char*>(data), size));
    CheckProgram(text);
    devhost::LispCall call;
    std::wstring error;
    if (!devhost::ReadLispCall(text, call, error)) {
        if (error.empty())
            std::abort();
        return 0;
    }
    resbuf* chain = devhost::BuildArgumentChain(call.args);
    if (!call.args.empty() && !chain)
        std::abort();
    const std::wstring printed = devhost::PrintChain(chain);
    devhost::FreeChain(chain);
    // Each string argument prints in a form that reads back unchanged.
    for (const devhost::LispValue& value : call.args) {
        if (value.kind != devhost::LispValue::Kind::String)
            continue;
        devhost::LispCall again;
        if (!devhost::ReadLispCall(L"(f " + devhost::PrintLispString(value.text) + L")", again, error) ||
            again.args.size() != 1 || again.args[0].text != value.text)
            std::abort();
    }
    if (printed.empty())
        std::abort();
    return 0;
}
