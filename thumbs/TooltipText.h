// The tooltip text of a thumbnail: the file name, its size and its last-write date, each padded with
// blanks to the same width so that a tooltip as narrow as that width breaks it into three lines.
// Portable: no <windows.h>.
#pragma once

#include <cstdint>
#include <ctime>
#include <string>

struct ThumbTooltip {
    std::string sizeText; // "Size=1234 "
    std::string dateText; // "05/03/2021;14.07.09"
    int width = 0;        // the longest of name, size text and date text, in characters
    std::string text;     // padded name + one blank, padded size text, padded date text
};

// "Size=N " with the size in bytes as an unsigned decimal (all 64 bits: files of 4 GiB and more too).
std::string TooltipSizeText(std::uint64_t size);
// "%02d/%02d/%4d;%02d.%02d.%02d" (day, month, year, hour, minute, second) of a local time; nullptr
// stands for a failed conversion: -1 for hour, minute and second, 0 for day, month and year.
std::string TooltipDateText(const std::tm* local);
// Converts a last-write time to local time; false when the runtime cannot.
bool LocalTimeOf(std::int64_t timeWrite, std::tm& out);

ThumbTooltip BuildTooltip(const std::string& name, std::uint64_t size, const std::tm* local);
// Same from the record's last-write time, converted to local time here.
ThumbTooltip BuildTooltipForTime(const std::string& name, std::uint64_t size, std::int64_t timeWrite);
