// The tooltip text of a thumbnail: the file name, its size and its last-write date, each padded with
// blanks to the same width so that a tooltip as wide as its widest line breaks it into three lines.
// Portable: no <windows.h>.
#pragma once

#include <cstdint>
#include <ctime>
#include <functional>
#include <string>

#include "hostapi/NarrowText.h"

struct ThumbTooltip {
    std::string sizeText; // "Size=1234 "
    std::string dateText; // "05/03/2021;14.07.09"
    int width = 0;        // the longest of name, size text and date text, in characters
    std::string lines[3]; // padded name + one blank, padded size text, padded date text
    std::string text;     // the three lines one after the other
};

// "Size=N " with the size in bytes as an unsigned decimal (all 64 bits: files of 4 GiB and more too).
std::string TooltipSizeText(std::uint64_t size);
// "%02d/%02d/%4d;%02d.%02d.%02d" (day, month, year, hour, minute, second) of a local time; nullptr
// stands for a failed conversion: -1 for hour, minute and second, 0 for day, month and year.
std::string TooltipDateText(const std::tm* local);
// Converts a last-write time to local time; false when the runtime cannot.
bool LocalTimeOf(std::int64_t timeWrite, std::tm& out);

// lead: the code page of name (its length counts characters).
ThumbTooltip BuildTooltip(const std::string& name, std::uint64_t size, const std::tm* local,
                          const LeadByteTable& lead = ActiveLeadBytes());
// Same from the record's last-write time, converted to local time here.
ThumbTooltip BuildTooltipForTime(const std::string& name, std::uint64_t size, std::int64_t timeWrite);

// The tooltip's width in pixels: the widest of its three lines (name, size text, date text, each with the
// blanks that pad it) as measure gives them in the tooltip's font. Narrower, a line would break inside
// itself (between two Japanese or Chinese characters of a name); the blanks between the lines still break.
int TooltipPixelWidth(const ThumbTooltip& tip, const std::function<int(const std::string&)>& measure);

// The tooltip's width in pixels: its widest line (name, size text, date text, without the blanks that pad
// them) as measure gives it in the tooltip's font and one blank, at most maxWidth (the screen's).
int TooltipWidthFor(const ThumbTooltip& tip, int maxWidth,
                    const std::function<int(const std::string&)>& measure);
// The text the tooltip shows: the name, the size text and the date text, each on a line of its own
// ("\r\n" between them). Padded with blanks, as `text` is, a tooltip would break the lines by the width
// of the characters: a name of wide letters is wider than the blanks that pad the size text to its length,
// and the size and the date ran into one line; a name wider than the screen needs a tooltip width that
// no padding can hold (the system keeps at most 1024 characters of a tooltip's text).
// A line wider than width (a name wider than the screen) is cut into lines that fit, between characters:
// the system breaks lines at blanks and hyphens only.
std::string TooltipShownText(const ThumbTooltip& tip, int width,
                             const std::function<int(const std::string&)>& measure,
                             const LeadByteTable& lead = ActiveLeadBytes());
