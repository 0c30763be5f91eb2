#include "devhost/Script.h"

#include "devhost/Text.h"

#include <cwctype>

namespace devhost {
namespace {

std::wstring Lower(std::wstring_view text) {
    std::wstring out(text);
    for (wchar_t& c : out)
        c = static_cast<wchar_t>(std::towlower(c));
    return out;
}

// Splits a line into tokens: blanks separate, "..." quotes (with \" and \\), also after key=.
bool Tokenize(std::wstring_view line, std::vector<std::wstring>& tokens, std::wstring& error) {
    std::size_t i = 0;
    while (i < line.size()) {
        if (line[i] == L' ' || line[i] == L'\t' || line[i] == L'\r') {
            ++i;
            continue;
        }
        std::wstring token;
        while (i < line.size() && line[i] != L' ' && line[i] != L'\t' && line[i] != L'\r') {
            if (line[i] != L'"') {
                token += line[i++];
                continue;
            }
            ++i;
            bool closed = false;
            while (i < line.size()) {
                const wchar_t c = line[i++];
                if (c == L'"') {
                    closed = true;
                    break;
                }
                if (c == L'\\' && i < line.size() && (line[i] == L'"' || line[i] == L'\\')) {
                    token += line[i++];
                    continue;
                }
                token += c;
            }
            if (!closed) {
                error = L"unterminated quoted text";
                return false;
            }
        }
        tokens.push_back(std::move(token));
    }
    return true;
}

bool ParseInt(std::wstring_view text, int& value, bool allowNegative = false) {
    if (text.empty() || text.size() > 9)
        return false;
    std::size_t i = 0;
    bool negative = false;
    if (allowNegative && text[0] == L'-') {
        negative = true;
        i = 1;
        if (text.size() == 1)
            return false;
    }
    int number = 0;
    for (; i < text.size(); ++i) {
        if (text[i] < L'0' || text[i] > L'9')
            return false;
        number = number * 10 + (text[i] - L'0');
    }
    value = negative ? -number : number;
    return true;
}

bool ParseModifier(std::wstring_view name, unsigned& modifiers) {
    const std::wstring lower = Lower(name);
    if (lower == L"ctrl" || lower == L"control")
        modifiers |= kCtrl;
    else if (lower == L"shift")
        modifiers |= kShift;
    else if (lower == L"alt")
        modifiers |= kAlt;
    else
        return false;
    return true;
}

// "ctrl+shift+a": modifiers, then one key (or, for with=, modifiers only).
bool ParseChord(std::wstring_view text, KeyChord& chord) {
    std::size_t start = 0;
    for (;;) {
        const std::size_t plus = text.find(L'+', start);
        // "ctrl++" names the plus key
        if (plus == start && plus + 1 == text.size())
            return (chord.virtualKey = VirtualKeyOf(L"+")) != 0;
        const std::wstring_view part =
            text.substr(start, plus == std::wstring_view::npos ? plus : plus - start);
        if (plus == std::wstring_view::npos) {
            chord.virtualKey = VirtualKeyOf(part);
            return chord.virtualKey != 0;
        }
        if (!ParseModifier(part, chord.modifiers))
            return false;
        start = plus + 1;
    }
}

bool ParseModifiers(std::wstring_view text, unsigned& modifiers) {
    std::size_t start = 0;
    for (;;) {
        const std::size_t plus = text.find(L'+', start);
        if (!ParseModifier(text.substr(start, plus == std::wstring_view::npos ? plus : plus - start),
                           modifiers))
            return false;
        if (plus == std::wstring_view::npos)
            return true;
        start = plus + 1;
    }
}

struct CommandName {
    const wchar_t* name;
    ScriptCommand::Kind kind;
    bool window; // takes a window path
    bool waits;  // waits for its window (timeout applies)
};

const CommandName kCommands[] = {
    {L"wait", ScriptCommand::Kind::Wait, true, true},
    {L"gone", ScriptCommand::Kind::Gone, true, true},
    {L"sleep", ScriptCommand::Kind::Sleep, false, false},
    {L"move", ScriptCommand::Kind::Move, true, true},
    {L"click", ScriptCommand::Kind::Click, true, true},
    {L"double-click", ScriptCommand::Kind::DoubleClick, true, true},
    {L"right-click", ScriptCommand::Kind::RightClick, true, true},
    {L"key", ScriptCommand::Kind::Key, false, false},
    {L"type", ScriptCommand::Kind::Type, false, false},
    {L"screenshot", ScriptCommand::Kind::Screenshot, true, true},
    {L"count", ScriptCommand::Kind::Count, true, false},
    {L"text", ScriptCommand::Kind::Text, true, true},
    {L"rect", ScriptCommand::Kind::Rect, true, true},
    {L"rects", ScriptCommand::Kind::Rects, true, false},
    {L"enabled", ScriptCommand::Kind::Enabled, true, true},
    {L"exists", ScriptCommand::Kind::Exists, true, false},
    {L"tooltip", ScriptCommand::Kind::Tooltip, false, false},
    {L"focus", ScriptCommand::Kind::Focus, false, false},
    {L"returned", ScriptCommand::Kind::Returned, false, true},
    {L"typed", ScriptCommand::Kind::Typed, false, false},
    {L"double-click-time", ScriptCommand::Kind::DoubleClickTime, false, false},
    {L"echo", ScriptCommand::Kind::Echo, false, false},
    {L"tree-select", ScriptCommand::Kind::TreeSelect, true, true},
    {L"tree-expand", ScriptCommand::Kind::TreeExpand, true, true},
    {L"tree-collapse", ScriptCommand::Kind::TreeCollapse, true, true},
    {L"tree-right-click", ScriptCommand::Kind::TreeRightClick, true, true},
    {L"tree-items", ScriptCommand::Kind::TreeItems, true, true},
    {L"tree-count", ScriptCommand::Kind::TreeCount, true, true},
    {L"clipboard-put", ScriptCommand::Kind::ClipboardPut, false, false},
    {L"clipboard-files", ScriptCommand::Kind::ClipboardFiles, false, false},
    {L"remove", ScriptCommand::Kind::Remove, false, false},
    {L"clipboard-text", ScriptCommand::Kind::ClipboardText, false, false},
    {L"post", ScriptCommand::Kind::Post, true, true},
    {L"call", ScriptCommand::Kind::Call, false, false},
    {L"drag", ScriptCommand::Kind::Drag, true, true},
    {L"scrollbar", ScriptCommand::Kind::ScrollBar, true, true},
    {L"redraw", ScriptCommand::Kind::Redraw, true, true},
    {L"windows", ScriptCommand::Kind::Windows, true, false},
};

// One coordinate of to=: a number of pixels (negative from the right or bottom with window-at) or a share
// of the side in percent.
bool ParseCoordinate(std::wstring_view text, int& value, bool& percent) {
    percent = !text.empty() && text.back() == L'%';
    if (percent)
        text.remove_suffix(1);
    return ParseInt(text, value, !percent) && (!percent || value <= 100);
}

bool TakesTreePath(ScriptCommand::Kind kind) {
    return kind == ScriptCommand::Kind::TreeSelect || kind == ScriptCommand::Kind::TreeExpand ||
           kind == ScriptCommand::Kind::TreeCollapse || kind == ScriptCommand::Kind::TreeRightClick;
}

bool ReadLine(const std::vector<std::wstring>& tokens, ScriptCommand& command, std::wstring& error) {
    const CommandName* name = nullptr;
    for (const CommandName& candidate : kCommands)
        if (tokens[0] == candidate.name)
            name = &candidate;
    if (!name) {
        error = L"unknown command " + tokens[0];
        return false;
    }
    command.kind = name->kind;
    std::vector<std::wstring> positional;
    bool stepOpen = false;
    for (std::size_t i = 1; i < tokens.size(); ++i) {
        const std::wstring& token = tokens[i];
        const std::size_t equals = token.find(L'=');
        const std::wstring key =
            equals == std::wstring::npos ? std::wstring() : Lower(token.substr(0, equals));
        const std::wstring value = equals == std::wstring::npos ? std::wstring() : token.substr(equals + 1);
        const bool selectorKey = key == L"class" || key == L"id" || key == L"text" || key == L"contains" ||
                                 key == L"nth" || key == L"visible";
        if (name->window && token == L">") {
            if (!stepOpen) {
                error = L"> needs a window step on each side";
                return false;
            }
            stepOpen = false;
            continue;
        }
        if (name->window && selectorKey) {
            if (!stepOpen) {
                command.window.emplace_back();
                stepOpen = true;
            }
            WindowStep& step = command.window.back();
            // An empty class or fragment would be no condition at all, and the step would match any window.
            if ((key == L"class" || key == L"contains") && value.empty()) {
                error = key + L"= takes a text: " + token;
                return false;
            }
            if (key == L"class") {
                step.className = value;
            } else if (key == L"id") {
                if (!ParseInt(value, step.id, true)) {
                    error = L"id= takes a number: " + token;
                    return false;
                }
                step.hasId = true;
            } else if (key == L"text") {
                step.text = value;
                step.hasText = true;
            } else if (key == L"contains") {
                step.contains = value;
            } else if (key == L"nth") {
                if (!ParseInt(value, step.nth)) {
                    error = L"nth= takes a number: " + token;
                    return false;
                }
            } else if (value == L"any") {
                step.anyVisibility = true;
            } else if (value != L"yes") {
                error = L"visible= takes yes or any: " + token;
                return false;
            }
            continue;
        }
        if (key == L"timeout" && (name->waits || !name->window) &&
            command.kind != ScriptCommand::Kind::Sleep) {
            if (!ParseInt(value, command.timeoutMs)) {
                error = L"timeout= takes milliseconds: " + token;
                return false;
            }
            continue;
        }
        if ((key == L"at" || key == L"window-at") && name->window) {
            command.windowPoint = key == L"window-at";
            const std::size_t comma = value.find(L',');
            if (comma == std::wstring::npos || !ParseInt(value.substr(0, comma), command.x, true) ||
                !ParseInt(value.substr(comma + 1), command.y, true)) {
                error = L"at= takes X,Y: " + token;
                return false;
            }
            command.hasPoint = true;
            continue;
        }
        if (key == L"to" && command.kind == ScriptCommand::Kind::Drag) {
            const std::size_t comma = value.find(L',');
            if (comma == std::wstring::npos ||
                !ParseCoordinate(std::wstring_view(value).substr(0, comma), command.toX,
                                 command.toXPercent) ||
                !ParseCoordinate(std::wstring_view(value).substr(comma + 1), command.toY,
                                 command.toYPercent)) {
                error = L"to= takes X,Y (pixels, or a percentage such as 50%): " + token;
                return false;
            }
            command.hasTo = true;
            continue;
        }
        if (key == L"steps" && command.kind == ScriptCommand::Kind::Drag) {
            if (!ParseInt(value, command.steps) || command.steps < 1 || command.steps > 1000) {
                error = L"steps= takes a number from 1 to 1000: " + token;
                return false;
            }
            continue;
        }
        if (key == L"path" && TakesTreePath(command.kind)) {
            if (value.empty()) {
                error = L"path= takes a tree item's labels joined by backslashes: " + token;
                return false;
            }
            command.treePath = value;
            continue;
        }
        if (key == L"at-least" && command.kind == ScriptCommand::Kind::TreeCount) {
            if (!ParseInt(value, command.atLeast)) {
                error = L"at-least= takes a number: " + token;
                return false;
            }
            continue;
        }
        if (key == L"with" && name->window) {
            if (!ParseModifiers(value, command.modifiers)) {
                error = L"with= takes ctrl, shift and alt joined by +: " + token;
                return false;
            }
            continue;
        }
        positional.push_back(token);
    }
    if (name->window && command.window.empty()) {
        error = tokens[0] + L" needs a window, such as class=NAME or id=N";
        return false;
    }
    if (name->window && !stepOpen) {
        error = L"> needs a window step on each side";
        return false;
    }
    switch (command.kind) {
    case ScriptCommand::Kind::Drag:
        if (!command.hasTo) {
            error = L"drag needs to=X,Y, where the button is let go";
            return false;
        }
        if (!positional.empty()) {
            error = L"unexpected " + positional[0];
            return false;
        }
        return true;
    case ScriptCommand::Kind::Sleep:
        if (positional.size() != 1 || !ParseInt(positional[0], command.ms)) {
            error = L"sleep takes milliseconds";
            return false;
        }
        return true;
    case ScriptCommand::Kind::Key:
        if (positional.empty()) {
            error = L"key needs at least one key, such as enter or ctrl+c";
            return false;
        }
        for (const std::wstring& chord : positional) {
            KeyChord parsed;
            if (!ParseChord(chord, parsed)) {
                error = L"unknown key " + chord;
                return false;
            }
            command.keys.push_back(parsed);
        }
        return true;
    case ScriptCommand::Kind::Type:
        if (positional.size() != 1) {
            error = L"type takes one text (quote it when it has blanks)";
            return false;
        }
        command.text = positional[0];
        return true;
    case ScriptCommand::Kind::ClipboardText:
        if (positional.size() != 1) {
            error = L"clipboard-text takes one text (quote it when it has blanks)";
            return false;
        }
        command.text = positional[0];
        return true;
    case ScriptCommand::Kind::Screenshot:
        if (positional.size() != 1) {
            error = L"screenshot takes a window and one file name";
            return false;
        }
        command.file = positional[0];
        return true;
    case ScriptCommand::Kind::TreeSelect:
    case ScriptCommand::Kind::TreeExpand:
    case ScriptCommand::Kind::TreeCollapse:
    case ScriptCommand::Kind::TreeRightClick:
        if (!positional.empty()) {
            error = L"unexpected " + positional[0];
            return false;
        }
        if (command.treePath.empty()) {
            error = tokens[0] + L" needs path=\"LABEL\\LABEL...\"";
            return false;
        }
        return true;
    case ScriptCommand::Kind::ClipboardPut:
        if (positional.empty() || (positional[0] != L"ansi" && positional[0] != L"wide")) {
            error = L"clipboard-put takes ansi or wide, then the file names";
            return false;
        }
        command.wide = positional[0] == L"wide";
        command.files.assign(positional.begin() + 1, positional.end());
        return true;
    case ScriptCommand::Kind::Post: {
        int message = 0;
        if (positional.empty() || positional.size() > 3 || !ParseInt(positional[0], message) ||
            (positional.size() > 1 && !ParseInt(positional[1], command.wParam, true)) ||
            (positional.size() > 2 && !ParseInt(positional[2], command.lParam, true))) {
            error = L"post takes a window, a message number and up to two parameters, in decimal";
            return false;
        }
        command.message = static_cast<unsigned>(message);
        return true;
    }
    case ScriptCommand::Kind::Call:
        if (positional.size() != 1) {
            error = L"call takes one LISP call in quotes, such as \"(Orvex 1 2 \\\"\\\" \\\"\\\" \\\"\\\")\"";
            return false;
        }
        command.text = positional[0];
        return true;
    case ScriptCommand::Kind::Remove:
        if (positional.size() != 1) {
            error = L"remove takes one file name";
            return false;
        }
        command.file = positional[0];
        return true;
    case ScriptCommand::Kind::Echo:
        for (std::size_t i = 0; i < positional.size(); ++i)
            command.text += (i ? L" " : L"") + positional[i];
        return true;
    default:
        if (!positional.empty()) {
            error = L"unexpected " + positional[0];
            return false;
        }
        return true;
    }
}

} // namespace

unsigned short VirtualKeyOf(std::wstring_view nameIn) {
    const std::wstring name = Lower(nameIn);
    if (name.size() == 1) {
        const wchar_t c = name[0];
        if (c >= L'a' && c <= L'z')
            return static_cast<unsigned short>(L'A' + (c - L'a'));
        if (c >= L'0' && c <= L'9')
            return static_cast<unsigned short>(c);
    }
    if (name.size() >= 2 && name.size() <= 3 && name[0] == L'f') {
        int number = 0;
        if (ParseInt(std::wstring_view(name).substr(1), number) && number >= 1 && number <= 24)
            return static_cast<unsigned short>(0x70 + number - 1);
    }
    struct Named {
        const wchar_t* name;
        unsigned short key;
    };
    static const Named kNamed[] = {
        {L"enter", 0x0D}, {L"return", 0x0D},    {L"escape", 0x1B}, {L"esc", 0x1B},      {L"tab", 0x09},
        {L"space", 0x20}, {L"backspace", 0x08}, {L"delete", 0x2E}, {L"del", 0x2E},      {L"insert", 0x2D},
        {L"home", 0x24},  {L"end", 0x23},       {L"pageup", 0x21}, {L"pagedown", 0x22}, {L"left", 0x25},
        {L"up", 0x26},    {L"right", 0x27},     {L"down", 0x28},   {L"apps", 0x5D},     {L"+", 0xBB},
        {L"-", 0xBD},     {L",", 0xBC},         {L".", 0xBE},      {L"ctrl", 0x11},     {L"shift", 0x10},
        {L"alt", 0x12},
    };
    for (const Named& named : kNamed)
        if (name == named.name)
            return named.key;
    return 0;
}

bool ReadScript(std::wstring_view text, std::vector<ScriptCommand>& commands, std::wstring& error) {
    commands.clear();
    int lineNumber = 0;
    std::size_t start = 0;
    while (start <= text.size()) {
        const std::size_t end = text.find(L'\n', start);
        const std::wstring_view line = text.substr(start, end == std::wstring_view::npos ? end : end - start);
        ++lineNumber;
        std::vector<std::wstring> tokens;
        std::wstring message;
        std::size_t first = line.find_first_not_of(L" \t\r");
        const bool blank = first == std::wstring_view::npos || line[first] == L'#';
        if (!blank) {
            if (first == 0 && line.size() >= 1 && line[0] == 0xFEFF) // byte order mark
                ++first;
            ScriptCommand command;
            command.line = lineNumber;
            if (!Tokenize(line.substr(first), tokens, message) || tokens.empty() ||
                !ReadLine(tokens, command, message)) {
                error = L"line " + std::to_wstring(lineNumber) + L": " + EscapeControls(message);
                return false;
            }
            commands.push_back(std::move(command));
        }
        if (end == std::wstring_view::npos)
            break;
        start = end + 1;
    }
    return true;
}

std::wstring DescribeWindow(const std::vector<WindowStep>& window) {
    auto quoted = [](const std::wstring& value) {
        if (value.find_first_of(L" \t\"") == std::wstring::npos && !value.empty())
            return value;
        std::wstring out = L"\"";
        for (wchar_t c : value) {
            if (c == L'"' || c == L'\\')
                out += L'\\';
            out += c;
        }
        return out + L"\"";
    };
    std::wstring out;
    for (const WindowStep& step : window) {
        std::wstring part;
        auto add = [&](const std::wstring& item) { part += (part.empty() ? L"" : L" ") + item; };
        if (!step.className.empty())
            add(L"class=" + quoted(step.className));
        if (step.hasId)
            add(L"id=" + std::to_wstring(step.id));
        if (step.hasText)
            add(L"text=" + quoted(step.text));
        if (!step.contains.empty())
            add(L"contains=" + quoted(step.contains));
        if (step.nth >= 0)
            add(L"nth=" + std::to_wstring(step.nth));
        if (step.anyVisibility)
            add(L"visible=any");
        out += (out.empty() ? L"" : L" > ") + part;
    }
    return out;
}

} // namespace devhost
