#include "host/Orvex.h"

#include "host/AdsListUser.h"
#include "hostapi/HostApi.h"
#include "hostapi/NarrowText.h"
#include "hostapi/TextConv.h"
#include "settings/FolderSettings.h"
#include "settings/IniFile.h"
#include "thumbs/DrawingFolder.h"

#include <cwchar>
#include <utility>

namespace {

const wchar_t kMissingParameters[] = L"\nMissing parametrs\n";
const wchar_t kNotShort[] = L"\nArgument should be an short";
const wchar_t kAlreadyOpen[] = L"\nOrvex: the explorer is already open; this call returns nil\n";

void PrintAndAlert(const wchar_t* text) {
    acutPrintf(L"%ls", text);
    acedAlert(text);
}

// A string argument that does not fit its bound is refused as a whole: better no start than a wrong one.
bool RefuseTooLong(const wchar_t* what, std::size_t length, std::size_t limit) {
    if (length < limit)
        return false;
    acutPrintf(L"\nOrvex: the %ls is too long (%d characters; at most %d)\n", what, static_cast<int>(length),
               static_cast<int>(limit - 1));
    acedAlert(L"\nOrvex: an argument is too long");
    return true;
}

// A start path with a line break or another control character is refused: no folder name of Windows
// holds one, and written into the settings it would make lines of its own.
bool RefuseControlCharacters(const std::wstring& startPath) {
    for (std::size_t i = 0; i < startPath.size(); ++i) {
        const wchar_t c = startPath[i];
        if (c >= 0x20 && c != 0x7F)
            continue;
        acutPrintf(
            L"\nOrvex: the start path holds a control character (code %d at character %d); it is refused\n",
            static_cast<int>(c), static_cast<int>(i + 1));
        acedAlert(L"\nOrvex: the start path holds a control character");
        return true;
    }
    return false;
}

void AppendParameters(ads_list_user& list, const std::string& folder) {
    CIniFile ini;
    ini.SetPath(FolderSettingsFilePath(folder));
    if (ini.ReadFile()) {
        const std::string layer = ini.GetValue("Default Parameters", "Layer");
        const std::string color = ini.GetValue("Default Parameters", "Color");
        const std::string command = ini.GetValue("Default Parameters", "Lisp command");
        list + BeginList() + layer.c_str() + color.c_str() + command.c_str() + EndList();
    } else {
        list + BeginList() + "" + "" + "" + EndList();
    }
}

} // namespace

int Orvex(PickerPlatform& platform) {
    // One explorer at a time: a second call made while one is open (a host that runs LISP from its own
    // timers or another document while the explorer's loop runs) would share the open one's document,
    // captions and main window, and destroy them under it. It is refused and returns nil.
    static bool s_running = false;
    if (s_running) {
        if (resbuf* args = acedGetArgs())
            acutRelRb(args);
        PrintAndAlert(kAlreadyOpen);
        acedRetNil();
        return 1;
    }
    struct Running {
        Running() { s_running = true; }
        ~Running() { s_running = false; }
        Running(const Running&) = delete;
        Running& operator=(const Running&) = delete;
    } running;

    resbuf* args = acedGetArgs();
    if (!args) {
        PrintAndAlert(kMissingParameters);
        return 0;
    }
    if (args->restype != RTSHORT) {
        acutPrintf(L"%ls", kNotShort);
        acedAlert(kNotShort);
        acutRelRb(args);
        return 0;
    }
    const resbuf* second = args->rbnext;
    if (!second) {
        acutPrintf(L"%ls", kMissingParameters);
        acedAlert(kNotShort); // the alert repeats the type message on purpose
        acutRelRb(args);
        return 0;
    }
    const resbuf* path = second->rbnext;
    const resbuf* accept = path ? path->rbnext : nullptr;
    const resbuf* cancel = accept ? accept->rbnext : nullptr;
    auto isString = [](const resbuf* rb) { return rb && rb->restype == RTSTR && rb->resval.rstring; };
    if (second->restype != RTSHORT || !isString(path) || !isString(accept) || !isString(cancel)) {
        acutRelRb(args);
        acedAlert(kNotShort);
        acutPrintf(L"%ls", kNotShort);
        return 0;
    }

    // Copies of the three texts, within the bounds of what a call may hand on.
    const std::size_t pathLength = std::wcslen(path->resval.rstring);
    const std::size_t acceptLength = std::wcslen(accept->resval.rstring);
    const std::size_t cancelLength = std::wcslen(cancel->resval.rstring);
    if (RefuseTooLong(L"start path", pathLength, kPathChars) ||
        RefuseTooLong(L"accept caption", acceptLength, kCaptionChars) ||
        RefuseTooLong(L"cancel caption", cancelLength, kCaptionChars)) {
        acutRelRb(args);
        return 0;
    }
    const std::wstring startPath(path->resval.rstring, pathLength);
    const std::wstring acceptText(accept->resval.rstring, acceptLength);
    const std::wstring cancelText(cancel->resval.rstring, cancelLength);
    acutRelRb(args);
    if (RefuseControlCharacters(startPath))
        return 0;

    const std::string acceptCaption = acceptText.empty() ? "Ok" : NarrowAnsi(acceptText);
    const std::string cancelCaption = cancelText.empty() ? "Cancel" : NarrowAnsi(cancelText);
    // The tree opens along a whole path, and the scan makes its folder the current one: a relative start
    // path is taken against the host's current folder now, before the explorer changes it.
    const std::string narrowPath =
        startPath.empty() ? std::string() : platform.WholeStartPath(NarrowAnsi(startPath));
    // The bounds count characters, in the narrow text as in the wide: a character of a double-byte code
    // page is two bytes, and a message that gave bytes would call a 161-character path 301 characters.
    if (RefuseTooLong(L"accept caption", CharacterCount(acceptCaption), kCaptionChars) ||
        RefuseTooLong(L"cancel caption", CharacterCount(cancelCaption), kCaptionChars))
        return 0;
    if (RefuseTooLong(L"start path", CharacterCount(narrowPath), kPathChars)) // made whole, it may have grown
        return 0;

    // This call's arguments exist only here, once every check has passed, and go to this run alone: a
    // refused call leaves nothing behind, and one refused while another is open cannot reach the open one's.
    PickerArguments call{acceptCaption, cancelCaption, narrowPath, std::string()};
    if (!narrowPath.empty()) {
        std::string shellPath = platform.StartShellPath(narrowPath);
        if (CharacterCount(shellPath) < kPathChars)
            call.startShellPath = std::move(shellPath);
        else
            acutPrintf(L"\nOrvex: the start folder's shell path is too long; starting at the last folder\n");
    }

    // However the run ends, even by an exception, the document goes (it saves the settings) and the
    // host's drawing view takes the keyboard again.
    struct EndOfRun {
        PickerPlatform& platform;
        ~EndOfRun() {
            platform.DestroyDocument();
            platform.FocusHostView();
        }
    } endOfRun{platform};

    const int result = platform.RunDialog(call);
    const DrawingFolder* folder = platform.Folder();
    // Accept with no drawing chosen is a cancel: a folder is never returned as the picked drawing.
    const std::string picked = result == 1 && folder ? folder->ChosenPath() : std::string();
    if (!picked.empty()) {
        ads_list_user list;
        list + picked.c_str();
        AppendParameters(list, folder->Folder());
        list.RetList();
        list.Release();
    } else {
        acedRetNil();
    }
    return 1;
}
