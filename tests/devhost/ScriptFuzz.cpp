// Fuzzes devhost's script reader (--script FILE): any bytes, read as UTF-8, give either the commands or
// "line N: message" for a line that exists; the numbers the reader takes are within their ranges, the
// keys are known keys, and every window a command names can be described for the messages.
#include "devhost/Script.h"
#include "devhost/Text.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cwctype>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::wstring text = devhost::FromUtf8(std::string_view(reinterpret_cast<const char*>(data), size));
    const int lines = static_cast<int>(std::count(text.begin(), text.end(), L'\n')) + 1;
    std::vector<devhost::ScriptCommand> commands;
    std::wstring error;
    if (!devhost::ReadScript(text, commands, error)) {
        // "line N: ..." with N a line of the text.
        if (error.compare(0, 5, L"line ") != 0)
            std::abort();
        std::size_t digits = 5;
        long number = 0;
        while (digits < error.size() && std::iswdigit(error[digits]) && number <= lines)
            number = number * 10 + (error[digits++] - L'0');
        if (digits == 5 || number < 1 || number > lines || error.compare(digits, 2, L": ") != 0)
            std::abort();
        // Control characters of the line are written out, so the message stays one line.
        if (error.find(L'\n') != std::wstring::npos || error.find(L'\r') != std::wstring::npos)
            std::abort();
        return 0;
    }
    int previous = 0;
    for (const devhost::ScriptCommand& command : commands) {
        if (command.line <= previous || command.line > lines)
            std::abort();
        previous = command.line;
        if (command.timeoutMs < 0 || command.ms < 0 || command.atLeast < 0)
            std::abort();
        for (const devhost::WindowStep& step : command.window) {
            if (step.nth < -1)
                std::abort();
        }
        for (const devhost::KeyChord& key : command.keys) {
            if (key.virtualKey == 0 ||
                (key.modifiers & ~(devhost::kCtrl | devhost::kShift | devhost::kAlt)) != 0)
                std::abort();
        }
        if ((command.modifiers & ~(devhost::kCtrl | devhost::kShift | devhost::kAlt)) != 0)
            std::abort();
        // "class=" with nothing after it is a step without conditions, which describes as nothing.
        (void)devhost::DescribeWindow(command.window);
    }
    return 0;
}
