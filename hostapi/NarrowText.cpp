#include "hostapi/NarrowText.h"

#include <cstring>

namespace {

LeadByteTable LeadRange(unsigned char first, unsigned char last, LeadByteTable table = {}) {
    for (unsigned c = first; c <= last; ++c)
        table.lead[c] = true;
    return table;
}

// True when the character at start (ending at end) is the single byte c.
bool IsSingle(const std::string& text, std::size_t start, std::size_t end, char c) {
    return end - start == 1 && text[start] == c;
}

} // namespace

LeadByteTable LeadBytesOfCodePage(unsigned codePage) {
    switch (codePage) {
    case 932: // Shift JIS: the single-byte katakana A1-DF lie between the two lead ranges
        return LeadRange(0xE0, 0xFC, LeadRange(0x81, 0x9F));
    case 936: // GBK
    case 949: // Unified Hangul Code
    case 950: // Big5
        return LeadRange(0x81, 0xFE);
    default:
        return LeadByteTable{};
    }
}

std::size_t NextCharacter(const std::string& text, std::size_t at, const LeadByteTable& lead) {
    if (at >= text.size())
        return text.size();
    return lead.lead[static_cast<unsigned char>(text[at])] && at + 1 < text.size() ? at + 2 : at + 1;
}

std::vector<std::size_t> CharacterStarts(const std::string& text, const LeadByteTable& lead) {
    std::vector<std::size_t> starts;
    starts.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); i = NextCharacter(text, i, lead))
        starts.push_back(i);
    return starts;
}

std::size_t CharacterCount(const std::string& text, const LeadByteTable& lead) {
    std::size_t count = 0;
    for (std::size_t i = 0; i < text.size(); i = NextCharacter(text, i, lead))
        ++count;
    return count;
}

bool EndsWithSeparator(const std::string& text, const LeadByteTable& lead) {
    const std::size_t last = LastSeparator(text, lead);
    return last != std::string::npos && last + 1 == text.size();
}

std::size_t LastCharacterOf(const std::string& text, const char* set, const LeadByteTable& lead) {
    std::size_t found = std::string::npos;
    for (std::size_t i = 0; i < text.size();) {
        const std::size_t next = NextCharacter(text, i, lead);
        if (next - i == 1 && text[i] != '\0' && std::strchr(set, text[i]) != nullptr)
            found = i;
        i = next;
    }
    return found;
}

std::size_t LastSeparator(const std::string& text, const LeadByteTable& lead) {
    return LastCharacterOf(text, "\\/", lead);
}

std::size_t FindCharacter(const std::string& text, char c, std::size_t from, const LeadByteTable& lead) {
    for (std::size_t i = from; i < text.size();) {
        const std::size_t next = NextCharacter(text, i, lead);
        if (IsSingle(text, i, next, c))
            return i;
        i = next;
    }
    return std::string::npos;
}

std::string WithSeparator(const std::string& path, const LeadByteTable& lead) {
    if (path.empty() || EndsWithSeparator(path, lead))
        return path;
    return path + '\\';
}

std::vector<std::string> SplitLabelPath(const std::string& labelPath, const LeadByteTable& lead) {
    std::vector<std::string> names;
    std::size_t start = 0;
    for (;;) {
        const std::size_t slash = FindCharacter(labelPath, '\\', start, lead);
        if (slash == std::string::npos) {
            names.push_back(labelPath.substr(start));
            return names;
        }
        names.push_back(labelPath.substr(start, slash - start));
        start = slash + 1;
    }
}

bool ContainsForbiddenCharacter(const std::string& name, const LeadByteTable& lead) {
    for (std::size_t i = 0; i < name.size();) {
        const std::size_t next = NextCharacter(name, i, lead);
        if (next - i == 1) {
            const auto byte = static_cast<unsigned char>(name[i]);
            if (byte < 0x20 || byte == 0x7F || std::strchr("\\/:*?\"<>|", name[i]) != nullptr)
                return true;
        }
        i = next;
    }
    return false;
}

const char* ByteLimitUnit(const std::string& text, const LeadByteTable& lead) {
    return CharacterCount(text, lead) == text.size() ? "characters" : "bytes";
}

std::string CharactersAndBytes(const std::string& text, const LeadByteTable& lead) {
    const std::size_t characters = CharacterCount(text, lead);
    std::string length = std::to_string(characters) + " characters";
    if (characters != text.size())
        length += ", " + std::to_string(text.size()) + " bytes";
    return length;
}

namespace {

// BreakLongWords for either text; next(i) is the position of the character after the one at i.
template <typename Text, typename Next> Text BreakWords(const Text& text, std::size_t maxChars, Next next) {
    using Char = typename Text::value_type;
    if (maxChars < 2)
        return text;
    Text out;
    out.reserve(text.size() + text.size() / maxChars + 1);
    std::vector<std::size_t> word; // where each character of the word being copied starts in out
    for (std::size_t i = 0; i < text.size();) {
        const std::size_t after = next(i);
        const Char c = text[i];
        if (c == Char(' ') || c == Char('\t') || c == Char('\n') || c == Char('\r')) {
            word.clear();
        } else {
            if (word.size() == maxChars) {
                // A line break after the last separator of the word's second half, else here. A lead byte
                // is never a separator, so only a character's first byte is looked at.
                std::size_t cut = word.size();
                for (std::size_t k = word.size(); k > maxChars / 2; --k) {
                    const Char d = out[word[k - 1]];
                    if (d == Char('\\') || d == Char('/')) {
                        cut = k;
                        break;
                    }
                }
                out.insert(out.begin() +
                               static_cast<std::ptrdiff_t>(cut < word.size() ? word[cut] : out.size()),
                           Char('\n'));
                std::vector<std::size_t> rest;
                for (std::size_t k = cut; k < word.size(); ++k)
                    rest.push_back(word[k] + 1);
                word.swap(rest);
            }
            word.push_back(out.size());
        }
        out.append(text, i, after - i);
        i = after;
    }
    return out;
}

} // namespace

std::string BreakLongWords(const std::string& text, std::size_t maxChars, const LeadByteTable& lead) {
    return BreakWords(text, maxChars, [&](std::size_t i) { return NextCharacter(text, i, lead); });
}

std::wstring BreakLongWords(const std::wstring& text, std::size_t maxChars) {
    return BreakWords(text, maxChars, [](std::size_t i) { return i + 1; });
}
