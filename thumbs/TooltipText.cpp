#include "thumbs/TooltipText.h"

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

ThumbTooltip BuildTooltip(const std::string& name, std::uint64_t size, const std::tm* local) {
    ThumbTooltip tip;
    tip.sizeText = TooltipSizeText(size);
    tip.dateText = TooltipDateText(local);
    const std::size_t width = std::max({name.size(), tip.sizeText.size(), tip.dateText.size()});
    tip.width = static_cast<int>(width);
    tip.text = name;
    tip.text.append(width - name.size(), ' ');
    tip.text += ' ';
    tip.text += tip.sizeText;
    tip.text.append(width - tip.sizeText.size(), ' ');
    tip.text += tip.dateText;
    tip.text.append(width - tip.dateText.size(), ' ');
    return tip;
}

ThumbTooltip BuildTooltipForTime(const std::string& name, std::uint64_t size, std::int64_t timeWrite) {
    std::tm local{};
    const bool ok = LocalTimeOf(timeWrite, local);
    return BuildTooltip(name, size, ok ? &local : nullptr);
}
