// Fuzzes the argument checks of the `Orvex` LISP function through the fake host: the input is a LISP call
// as the command line reads it, its arguments become the result-buffer chain the host hands over. Five
// arguments (two short integers, three strings within their bounds) run the explorer; anything else is
// refused with a printed and alerted message, no run and nothing handed to the platform. Either way the
// arguments are released; a run is handed exactly the narrowed captions and path, and ends with the
// document destroyed and the host's view focused.
#include "devhost/Lisp.h"
#include "devhost/ResultBuffers.h"
#include "devhost/Text.h"
#include "host/Orvex.h"
#include "tests/support/PickedDrawing.h"
#include "hostapi/TextConv.h"
#include "settings/Tessel3Doc.h"
#include "tests/host/FakeHost.h"

#include <cstdint>
#include <cstdlib>
#include <cwchar>
#include <string>
#include <vector>

namespace {

constexpr char kPickFolder[] = "/nonexistent-orvex-fuzz\\";
constexpr char kPickName[] = "door-900.dwg";

// Plays the explorer: picks a drawing when the accept caption has an odd length, cancels otherwise.
struct FuzzPlatform : PickerPlatform {
    std::vector<std::string> steps;
    std::string shellPathAskedFor;
    std::vector<PickerArguments> handed;
    bool pick = false;
    CTessel3Doc doc{std::string()}; // no settings file: nothing read, nothing saved

    std::string StartShellPath(const std::string& path) override {
        shellPathAskedFor = path;
        steps.push_back("shell");
        return "Desktop\\" + path;
    }
    int RunDialog(const PickerArguments& arguments) override {
        steps.push_back("dialog");
        handed.push_back(arguments);
        picked.Pick(kPickFolder, kPickName);
        return pick ? 1 : 2;
    }
    CTessel3Doc* Document() override { return &doc; }
    const DrawingFolder* Folder() override { return &picked.Folder(); }
    testsupport::PickedDrawing picked;
    void DestroyDocument() override { steps.push_back("destroy"); }
    void FocusHostView() override { steps.push_back("focus"); }
};

int CountNodes(const resbuf* rb) {
    int n = 0;
    for (; rb; rb = rb->rbnext)
        ++n;
    return n;
}

bool IsString(const resbuf* rb) {
    return rb && rb->restype == RTSTR && rb->resval.rstring;
}

bool Contains(const std::vector<std::string>& events, const std::string& prefix) {
    for (const auto& e : events)
        if (e.rfind(prefix, 0) == 0)
            return true;
    return false;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::wstring text = devhost::FromUtf8(std::string_view(reinterpret_cast<const char*>(data), size));
    devhost::LispCall call;
    std::wstring error;
    if (!devhost::ReadLispCall(text, call, error))
        return 0;

    FakeHost host;
    host.args = devhost::BuildArgumentChain(call.args);
    host.liveNodes = CountNodes(host.args);

    // What the checks should decide, from the chain itself.
    const resbuf* a[5] = {};
    const resbuf* rb = host.args;
    for (int i = 0; i < 5 && rb; ++i, rb = rb->rbnext)
        a[i] = rb;
    bool valid = a[0] && a[0]->restype == RTSHORT && a[1] && a[1]->restype == RTSHORT && IsString(a[2]) &&
                 IsString(a[3]) && IsString(a[4]);
    std::wstring path, accept, cancel;
    if (valid) {
        path = a[2]->resval.rstring;
        accept = a[3]->resval.rstring;
        cancel = a[4]->resval.rstring;
        valid = path.size() < kPathChars && accept.size() < kCaptionChars && cancel.size() < kCaptionChars;
        // A start path with a line break or another control character is refused.
        for (const wchar_t c : path)
            if (c < 0x20 || c == 0x7F)
                valid = false;
    }

    FuzzPlatform platform;
    platform.pick = valid && accept.size() % 2 == 1;
    const int rc = Orvex(platform);

    if (host.liveNodes != 0) // the arguments and the result list are released
        std::abort();
    if (rc != (valid ? 1 : 0))
        std::abort();
    if (!valid) {
        // Refused: said on the command line and in an alert, nothing run, nothing handed on.
        if (!platform.steps.empty() || !platform.handed.empty() || host.result != "unset" ||
            !Contains(host.events, "print:") || !Contains(host.events, "alert:"))
            std::abort();
        return 0;
    }
    const std::string expectAccept = accept.empty() ? "Ok" : NarrowAnsi(accept);
    const std::string expectCancel = cancel.empty() ? "Cancel" : NarrowAnsi(cancel);
    const std::string narrowPath = NarrowAnsi(path);
    // The run is handed exactly these, and a shell path only when there is a start path and it fits.
    const std::string shellPath = path.empty() ? std::string() : "Desktop\\" + narrowPath;
    const std::string expectShellPath = shellPath.size() < kPathChars ? shellPath : std::string();
    if (platform.handed.size() != 1)
        std::abort();
    const PickerArguments& handed = platform.handed.front();
    if (handed.acceptCaption != expectAccept || handed.cancelCaption != expectCancel ||
        handed.startPath != narrowPath || handed.startShellPath != expectShellPath)
        std::abort();
    // The shell is asked about a start path only, and the run always ends with destroy and focus.
    const std::vector<std::string> expectSteps =
        path.empty() ? std::vector<std::string>{"dialog", "destroy", "focus"}
                     : std::vector<std::string>{"shell", "dialog", "destroy", "focus"};
    if (platform.steps != expectSteps || (!path.empty() && platform.shellPathAskedFor != narrowPath))
        std::abort();
    const std::string expectResult =
        platform.pick ? std::string("(\"") + kPickFolder + kPickName + "\" (\"\" \"\" \"\"))"
                      : std::string("nil");
    if (host.result != expectResult)
        std::abort();
    return 0;
}
