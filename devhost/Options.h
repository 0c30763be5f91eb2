// devhost's command line. Portable.
#pragma once

#include <string>
#include <vector>

namespace devhost {

struct LayerOption {
    std::wstring name;
    int colorIndex = 7;
};

struct Options {
    enum class Order { ModuleFirst, EntryFirst };
    enum class Post { None, Accept, Cancel };

    std::wstring arx; // empty: Orvex1.arx beside devhost.exe
    Order order = Order::ModuleFirst;
    int drawings = 1;
    std::vector<LayerOption> layers;
    bool alertBox = false;
    int afterMs = -1; // -1: nothing is posted
    Post post = Post::None;
    std::vector<std::wstring> evals;
    std::vector<std::wstring> loads; // LISP program files read (not run) before the calls
    std::wstring script;
    bool verbose = false;
    bool timing = false;     // [timing] lines: when previews are drawn and keys are taken, in ms
    bool timingSent = false; // with timing: also first paints sent while the library works (slower)
    enum class Preview { Real, Flat };
    Preview preview = Preview::Real; // flat: the preview operation fills the window, reads no file
    bool checkHeaps = false;         // validate every heap of the process after each call
    bool resources = false;    // print the process's GDI objects, windows, handles, threads after each call
    int fileLatencyMs = 0;     // added to every read of a drawing file, on the thread that reads
    std::wstring fileHang;     // reads of the drawing file of this name wait until the process ends
    int scanLatencyMs = 0;     // added to every entry of the library's folder searches
    std::wstring refuseWindow; // top-level windows whose class begins with this are refused (a test aid)
    bool help = false;
};

// Parses the arguments after the program name. False with a one-line message for bad usage.
bool ParseOptions(const std::vector<std::wstring>& args, Options& options, std::wstring& error);

extern const wchar_t* const kUsage;

} // namespace devhost
