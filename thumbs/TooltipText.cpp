#include "thumbs/TooltipText.h"

#include "hostapi/NarrowText.h"

#include <algorithm>
#include <cstdio>

std::string TooltipSizeText(std::uint64_t size) {
    return "Size=" + std::to_string(size) + " ";
}

std::string TooltipDateText(const std::tm* local) {
    int day = 0, month = 0, year = 0, hour = -1, minute = -1, second = -1;
    if (local != nullptr) {
        day = local->tm_mday;
        month = local->tm_mon + 1;
        year = local->tm_year + 1900;
        hour = local->tm_hour;
        minute = local->tm_min;
        second = local->tm_sec;
    }
    char buffer[96];
    std::snprintf(buffer, sizeof buffer, "%02d/%02d/%4d;%02d.%02d.%02d", day, month, year, hour, minute,
                  second);
    return buffer;
}

bool LocalTimeOf(std::int64_t timeWrite, std::tm& out) {
#ifdef _WIN32
    const __time64_t t = timeWrite;
    return _localtime64_s(&out, &t) == 0;
#else
    const std::time_t t = static_cast<std::time_t>(timeWrite);
    return localtime_r(&t, &out) != nullptr;
#endif
}

ThumbTooltip BuildTooltip(const std::string& name, std::uint64_t size, const std::tm* local,
                          const LeadByteTable& lead) {
    ThumbTooltip tip;
    tip.sizeText = TooltipSizeText(size);
    tip.dateText = TooltipDateText(local);
    // Characters, not bytes: a double-byte character is one.
    const std::size_t nameLength = CharacterCount(name, lead);
    const std::size_t width = std::max({nameLength, tip.sizeText.size(), tip.dateText.size()});
    tip.width = static_cast<int>(width);
    tip.lines[0] = name + std::string(width - nameLength + 1, ' ');
    tip.lines[1] = tip.sizeText + std::string(width - tip.sizeText.size(), ' ');
    tip.lines[2] = tip.dateText + std::string(width - tip.dateText.size(), ' ');
    tip.text = tip.lines[0] + tip.lines[1] + tip.lines[2];
    return tip;
}

ThumbTooltip BuildTooltipForTime(const std::string& name, std::uint64_t size, std::int64_t timeWrite) {
    std::tm local{};
    const bool ok = LocalTimeOf(timeWrite, local);
    return BuildTooltip(name, size, ok ? &local : nullptr);
}

int TooltipPixelWidth(const ThumbTooltip& tip, const std::function<int(const std::string&)>& measure) {
    if (!measure)
        return 0;
    // Each line with the blanks that pad it: where a line may break between two characters (Japanese,
    // Chinese), the system breaks there rather than at blanks that do not fit.
    return std::max({measure(tip.lines[0]), measure(tip.lines[1]), measure(tip.lines[2])});
}

namespace {

// A line without the blanks that pad it.
std::string Unpadded(const std::string& line) {
    const std::size_t end = line.find_last_not_of(' ');
    return end == std::string::npos ? std::string() : line.substr(0, end + 1);
}

} // namespace

int TooltipWidthFor(const ThumbTooltip& tip, int maxWidth,
                    const std::function<int(const std::string&)>& measure) {
    if (!measure)
        return 0;
    // One blank more than the widest line: the system breaks a line that is exactly as wide as the
    // tooltip (after "-" in a name, or at any character), as it would not one with room to spare.
    int widest = 0;
    for (const std::string& line : tip.lines)
        widest = std::max(widest, measure(Unpadded(line)));
    return std::min(widest + measure(" "), maxWidth);
}

std::string TooltipShownText(const ThumbTooltip& tip, int width,
                             const std::function<int(const std::string&)>& measure,
                             const LeadByteTable& lead) {
    // The room of a line: one blank less than the tooltip's width (see TooltipWidthFor).
    const int room = measure ? width - std::max(1, measure(" ")) : 0;
    std::string text;
    for (int i = 0; i < 3; ++i) {
        const std::string line = Unpadded(tip.lines[i]);
        if (i > 0)
            text += "\r\n";
        if (!measure || measure(line) <= room) {
            text += line;
            continue;
        }
        // The longest pieces that fit, at least one character each.
        std::vector<std::size_t> starts = CharacterStarts(line, lead);
        starts.push_back(line.size());
        for (std::size_t from = 0; from + 1 < starts.size();) {
            std::size_t to = from + 1;
            while (to + 1 < starts.size() &&
                   measure(line.substr(starts[from], starts[to + 1] - starts[from])) <= room)
                ++to;
            if (from > 0)
                text += "\r\n";
            text += line.substr(starts[from], starts[to] - starts[from]);
            from = to;
        }
    }
    return text;
}
