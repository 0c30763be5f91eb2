// devhost's standard output, which plays the host's command line. Every write goes out at once (no
// buffering), under a lock, so that printed text, alerts, results and script lines keep their order.
#pragma once

#include <string>
#include <string_view>

namespace devhost {

// Text exactly as the library printed it.
void WriteText(std::wstring_view text);

// One line of the host's own (an alert, a result, an error, a script fact): it starts on a line of its
// own, so a line feed goes first when the printed text left the line unfinished.
void WriteLine(std::wstring_view line);

// devhost's own complaints (usage, a library that cannot be loaded) go to standard error.
void WriteError(std::wstring_view line);

} // namespace devhost
