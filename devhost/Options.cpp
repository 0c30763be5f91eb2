#include "devhost/Options.h"

#include <cwchar>

namespace devhost {

const wchar_t* const kUsage =
    L"usage: devhost.exe [--arx PATH] [--order entry-first|module-first] [--drawings N]\n"
    L"                   [--layer NAME=ACI]... [--alert-box] [--after-ms MS --post accept|cancel]\n"
    L"                   [--load FILE]... [--eval EXPR]... [--script FILE] [--verbose] [--timing] "
    L"[--timing-sent]\n"
    L"                   [--preview real|flat] [--file-latency MS] [--file-hang NAME]\n"
    L"                   [--scan-latency MS]\n"
    L"                   [--check-heaps] [--resources] [--refuse-window CLASS-PREFIX]\n";

namespace {

// A whole decimal number in [low, high].
bool ParseNumber(const std::wstring& text, long low, long high, long& value) {
    if (text.empty() || text.size() > 9)
        return false;
    long number = 0;
    for (wchar_t c : text) {
        if (c < L'0' || c > L'9')
            return false;
        number = number * 10 + (c - L'0');
    }
    if (number < low || number > high)
        return false;
    value = number;
    return true;
}

} // namespace

bool ParseOptions(const std::vector<std::wstring>& args, Options& options, std::wstring& error) {
    options = Options();
    for (std::size_t i = 0; i < args.size(); ++i) {
        const std::wstring& option = args[i];
        auto value = [&](std::wstring& out) {
            if (i + 1 >= args.size()) {
                error = option + L" needs a value";
                return false;
            }
            out = args[++i];
            return true;
        };
        std::wstring text;
        if (option == L"--arx") {
            if (!value(options.arx))
                return false;
            if (options.arx.empty()) {
                error = L"--arx needs a path";
                return false;
            }
        } else if (option == L"--order") {
            if (!value(text))
                return false;
            if (text == L"entry-first") {
                options.order = Options::Order::EntryFirst;
            } else if (text == L"module-first") {
                options.order = Options::Order::ModuleFirst;
            } else {
                error = L"--order takes entry-first or module-first, not " + text;
                return false;
            }
        } else if (option == L"--drawings") {
            long number = 0;
            if (!value(text))
                return false;
            if (!ParseNumber(text, 1, 64, number)) {
                error = L"--drawings takes a number from 1 to 64, not " + text;
                return false;
            }
            options.drawings = static_cast<int>(number);
        } else if (option == L"--layer") {
            if (!value(text))
                return false;
            const std::size_t equals = text.rfind(L'=');
            long number = 0;
            if (equals == std::wstring::npos || equals == 0 ||
                !ParseNumber(text.substr(equals + 1), 0, 256, number)) {
                error = L"--layer takes NAME=ACI with ACI from 0 to 256, not " + text;
                return false;
            }
            options.layers.push_back({text.substr(0, equals), static_cast<int>(number)});
        } else if (option == L"--alert-box") {
            options.alertBox = true;
        } else if (option == L"--after-ms") {
            long number = 0;
            if (!value(text))
                return false;
            if (!ParseNumber(text, 0, 3600000, number)) {
                error = L"--after-ms takes milliseconds, not " + text;
                return false;
            }
            options.afterMs = static_cast<int>(number);
        } else if (option == L"--post") {
            if (!value(text))
                return false;
            if (text == L"accept") {
                options.post = Options::Post::Accept;
            } else if (text == L"cancel") {
                options.post = Options::Post::Cancel;
            } else {
                error = L"--post takes accept or cancel, not " + text;
                return false;
            }
        } else if (option == L"--load") {
            if (!value(text))
                return false;
            options.loads.push_back(text);
        } else if (option == L"--eval") {
            if (!value(text))
                return false;
            options.evals.push_back(text);
        } else if (option == L"--script") {
            if (!value(options.script))
                return false;
        } else if (option == L"--verbose") {
            options.verbose = true;
        } else if (option == L"--timing") {
            options.timing = true;
        } else if (option == L"--timing-sent") {
            options.timing = true;
            options.timingSent = true;
        } else if (option == L"--preview") {
            if (!value(text))
                return false;
            if (text == L"real") {
                options.preview = Options::Preview::Real;
            } else if (text == L"flat") {
                options.preview = Options::Preview::Flat;
            } else {
                error = L"--preview takes real or flat, not " + text;
                return false;
            }
        } else if (option == L"--file-latency") {
            long number = 0;
            if (!value(text))
                return false;
            if (!ParseNumber(text, 0, 60000, number)) {
                error = L"--file-latency takes milliseconds from 0 to 60000, not " + text;
                return false;
            }
            options.fileLatencyMs = static_cast<int>(number);
        } else if (option == L"--scan-latency") {
            long number = 0;
            if (!value(text))
                return false;
            if (!ParseNumber(text, 0, 60000, number)) {
                error = L"--scan-latency takes milliseconds from 0 to 60000, not " + text;
                return false;
            }
            options.scanLatencyMs = static_cast<int>(number);
        } else if (option == L"--file-hang") {
            if (!value(options.fileHang))
                return false;
            if (options.fileHang.empty()) {
                error = L"--file-hang needs a file name";
                return false;
            }
        } else if (option == L"--check-heaps") {
            options.checkHeaps = true;
        } else if (option == L"--resources") {
            options.resources = true;
        } else if (option == L"--refuse-window") {
            if (!value(options.refuseWindow))
                return false;
            if (options.refuseWindow.empty()) {
                error = L"--refuse-window needs the beginning of a window class name";
                return false;
            }
        } else if (option == L"--help" || option == L"-h" || option == L"/?") {
            options.help = true;
        } else {
            error = L"unknown option " + option;
            return false;
        }
    }
    if ((options.afterMs >= 0) != (options.post != Options::Post::None)) {
        error = L"--after-ms and --post go together";
        return false;
    }
    return true;
}

} // namespace devhost
