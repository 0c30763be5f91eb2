// Dispatching what is queued for this thread: the one pump of the Windows test programs, the benchmarks
// and devhost. Callers differ in how a message is dispatched, so those choices are arguments, not copies.
// Windows only; header-only, so that devhost takes it without linking anything of the tests.
#pragma once

#include <windows.h>

namespace testsupport {

// Whether messages are taken and dispatched through the ANSI or the Unicode functions. A message
// keeps its characters only when it goes the way its window reads them: devhost's windows are Unicode,
// the framework's ANSI.
enum class Chars { Narrow, Wide };

// A hook offered every message before it is translated and dispatched; true when it took the message.
// The grid tests pass the framework's, so that windows see their PreTranslateMessage as in a modal loop.
using PreTranslate = bool (*)(MSG*);

// Dispatches everything queued for this thread, without waiting.
inline void PumpMessages(Chars chars = Chars::Narrow, PreTranslate preTranslate = nullptr) {
    MSG msg;
    for (;;) {
        const BOOL got = chars == Chars::Wide ? ::PeekMessageW(&msg, nullptr, 0, 0, PM_REMOVE)
                                              : ::PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE);
        if (!got)
            return;
        if (preTranslate && preTranslate(&msg))
            continue;
        ::TranslateMessage(&msg);
        if (chars == Chars::Wide)
            ::DispatchMessageW(&msg);
        else
            ::DispatchMessageA(&msg);
    }
}

// Pumps (narrow), resting 20 ms between rounds, until done() holds or `milliseconds` have passed, for
// what another thread or process brings in its own time. Returns done().
template <class Done> bool PumpUntil(Done done, DWORD milliseconds) {
    const ULONGLONG until = ::GetTickCount64() + milliseconds;
    while (!done() && ::GetTickCount64() < until) {
        PumpMessages();
        ::Sleep(20);
    }
    return done();
}

} // namespace testsupport
