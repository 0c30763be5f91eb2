#include "fileops/ForFileCommands.h"

#include "fileops/DropBlock.h"
#include "fileops/ShellContextMenu.h"
#include "fileops/ShellFileOp.h"
#include "framework/afxfiledlg.h"
#include "framework/afxwin.h"
#include "hostapi/NarrowText.h"

#include <shellapi.h>
#include <shlobj.h>

#include <cstring>
#include <io.h>

const char* const kCopyFileTitle = "Copy file";
const char* const kOverwriteQuestion = "File already exists!Are you sure you want to overwrite it?";
const char* const kOverwriteCaption = "Confirm overwriting";
const char* const kCannotCopy = "Cannot copy file:";

namespace {

// The clipboard's sequence number right after the last cut was put there (0: no cut pending). While the
// clipboard still holds that list, a paste moves.
DWORD g_cutSequence = 0;

class ClipboardOpen {
public:
    explicit ClipboardOpen(HWND owner) {
        // Another program may hold the clipboard for a moment.
        for (int attempt = 0; attempt < 5 && !m_open; ++attempt) {
            m_open = ::OpenClipboard(owner) != FALSE;
            if (!m_open)
                ::Sleep(20);
        }
    }
    ~ClipboardOpen() {
        if (m_open)
            ::CloseClipboard();
    }
    ClipboardOpen(const ClipboardOpen&) = delete;
    ClipboardOpen& operator=(const ClipboardOpen&) = delete;
    explicit operator bool() const { return m_open; }

private:
    bool m_open = false;
};

// The explorer's code page holds the name exactly: no character replaced by a default or a look-alike
// (a name pasted under another name would be another file).
bool ToAnsiExactly(const std::u16string& wide, std::string& narrow) {
    const auto* text = reinterpret_cast<const wchar_t*>(wide.c_str());
    const int length = static_cast<int>(wide.size());
    BOOL usedDefault = FALSE;
    const int bytes =
        ::WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, text, length, nullptr, 0, nullptr, &usedDefault);
    if (bytes <= 0 || usedDefault)
        return false;
    narrow.assign(static_cast<std::size_t>(bytes), '\0');
    if (::WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, text, length, &narrow[0], bytes, nullptr,
                              &usedDefault) != bytes ||
        usedDefault)
        return false;
    // And back: the narrow name names the same file.
    std::wstring back(static_cast<std::size_t>(length) + 1, L'\0');
    const int units = ::MultiByteToWideChar(CP_ACP, MB_ERR_INVALID_CHARS, narrow.data(), bytes, &back[0],
                                            static_cast<int>(back.size()));
    return units == length && back.compare(0, static_cast<std::size_t>(units), text, wide.size()) == 0;
}

std::wstring WideText(const std::u16string& text) {
    return std::wstring(text.begin(), text.end());
}

} // namespace

std::string PasteRefusedMessage(std::size_t count) {
    return count == 1
               ? "This file was not pasted: its name holds characters the system's code page cannot hold, "
                 "and it is not pasted under another name:"
               : "These " + std::to_string(count) +
                     " files were not pasted: their names hold characters the system's code page cannot "
                     "hold, and they are not pasted under other names:";
}

DropList ClipboardDropList() {
    ClipboardOpen clipboard(nullptr);
    if (!clipboard || !::IsClipboardFormatAvailable(CF_HDROP))
        return {};
    HGLOBAL handle = ::GetClipboardData(CF_HDROP);
    if (!handle)
        return {};
    const SIZE_T size = ::GlobalSize(handle);
    const void* data = ::GlobalLock(handle);
    if (!data)
        return {};
    // A private copy: the block belongs to the clipboard.
    std::vector<unsigned char> copy(static_cast<const unsigned char*>(data),
                                    static_cast<const unsigned char*>(data) + size);
    ::GlobalUnlock(handle);
    return ReadDropList(copy.data(), copy.size(), &ToAnsiExactly);
}

namespace {

// The shell's result of an operation, or kFileOpNotDone when the user said no to it.
int Outcome(const CShellFileOp& op, int result) {
    if (result == ERROR_CANCELLED || (result == 0 && op.Aborted()))
        return kFileOpNotDone;
    return result;
}

} // namespace

std::vector<std::string> ClipboardFileList() {
    return ClipboardDropList().names;
}

bool PutFileListOnClipboard(const std::vector<std::string>& paths, bool cut) {
    const std::vector<unsigned char> block = BuildDropBlock(paths);
    HGLOBAL handle = ::GlobalAlloc(GMEM_MOVEABLE | GMEM_ZEROINIT | GMEM_SHARE, block.size());
    if (!handle)
        return false;
    if (void* data = ::GlobalLock(handle)) {
        std::memcpy(data, block.data(), block.size());
        ::GlobalUnlock(handle);
    }
    // The clipboard needs an owner window for SetClipboardData to follow EmptyClipboard: a message-only
    // window of the library's own lives for the moment the list is put there, so no window of the
    // explorer (nor the library) is tied to the clipboard afterwards.
    HWND owner = ::CreateWindowExA(0, "STATIC", "", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    struct OwnerGone {
        HWND hwnd;
        ~OwnerGone() {
            if (hwnd)
                ::DestroyWindow(hwnd);
        }
    } ownerGone{owner};
    {
        ClipboardOpen clipboard(owner);
        if (!clipboard) {
            ::GlobalFree(handle);
            return false;
        }
        ::EmptyClipboard();
        if (!::SetClipboardData(CF_HDROP, handle)) {
            ::GlobalFree(handle);
            return false;
        }
    }
    g_cutSequence = cut ? ::GetClipboardSequenceNumber() : 0;
    return true;
}

bool ForFileCommands::ClipboardHoldsDrawings() const {
    return DropListHoldsDrawings(ClipboardDropList());
}

void ForFileCommands::TellRefused(HWND owner, const std::vector<std::u16string>& unheld) const {
    const std::string first = PasteRefusedMessage(unheld.size()); // ASCII
    std::wstring text(first.begin(), first.end());
    for (const std::u16string& name : unheld)
        text += L"\n" + WideText(name);
    if (tellUser)
        tellUser(text);
    else
        ::MessageBoxW(owner, BreakLongWords(text, kMessageWordChars).c_str(), L"Paste",
                      MB_OK | MB_ICONWARNING);
}

int ForFileCommands::PasteInto(const std::string& folder, HWND owner) const {
    const DropList list = ClipboardDropList();
    // What Paste is offered for: a list that names a drawing. Then every file of it is pasted, but for
    // those whose names the code page cannot hold: they are said, and left where they are.
    if (!DropListHoldsDrawings(list))
        return kFileOpNotDone;
    if (!list.unheld.empty())
        TellRefused(owner, list.unheld);
    const std::vector<std::string>& names = list.names;
    if (names.empty())
        return kFileOpNotDone;
    const bool move = g_cutSequence != 0 && g_cutSequence == ::GetClipboardSequenceNumber();
    if (folder.empty())
        return kFileOpNotDone;
    CShellFileOp op;
    op.SetOwner(owner);
    for (const std::string& name : names)
        op.AddName(CShellFileOp::kSource, name);
    op.AddName(CShellFileOp::kDestination, folder);
    const int result = move ? op.Move() : op.Copy();
    if (result == 0 && move && !op.Aborted()) {
        // The files are gone from where the list says: the list goes too, as after a cut in the system's
        // file manager.
        ClipboardOpen clipboard(nullptr);
        if (clipboard && g_cutSequence == ::GetClipboardSequenceNumber())
            ::EmptyClipboard();
        g_cutSequence = 0;
    }
    return Outcome(op, result);
}

namespace {

// A rename that changes only the letters' case. The file itself answers to the new name: the shell takes
// it for another file in the way, and a plain move may find nothing to do (Wine's does). The file goes
// through a name of its own and back; it keeps its old name when the second step fails.
int RenameLetterCase(const std::string& source, const std::string& destination) {
    const std::string step = destination + ".orvex-rename";
    if (::GetFileAttributesA(step.c_str()) != INVALID_FILE_ATTRIBUTES)
        return ERROR_ALREADY_EXISTS;
    if (!::MoveFileA(source.c_str(), step.c_str()))
        return static_cast<int>(::GetLastError());
    if (!::MoveFileA(step.c_str(), destination.c_str())) {
        const int error = static_cast<int>(::GetLastError());
        ::MoveFileA(step.c_str(), source.c_str());
        return error;
    }
    return 0;
}

} // namespace

int ForFileCommands::RenameFile(const std::string& source, const std::string& destination,
                                CEdit* label) const {
    int result = 0;
    if (::lstrcmpiA(source.c_str(), destination.c_str()) == 0) {
        result = RenameLetterCase(source, destination);
    } else {
        CShellFileOp op;
        op.AddName(CShellFileOp::kSource, source);
        op.AddName(CShellFileOp::kDestination, destination);
        // No flags: a name that is taken fails (the shell says why) instead of replacing the other file.
        result = op.Rename();
    }
    if (result != 0 && label && label->m_hWnd) {
        const auto separator = LastCharacterOf(source, "\\");
        label->SetWindowText(separator == std::string::npos ? source : source.substr(separator + 1));
    }
    return result;
}

int ForFileCommands::CopyToFile(const std::string& source, HWND owner) const {
    CFileDialog dialog(false, nullptr, source.c_str(), OFN_HIDEREADONLY, "All files (*.*)|*.*||");
    dialog.m_ofn.hwndOwner = owner;
    dialog.m_strTitle = kCopyFileTitle;
    dialog.DoModal();
    // Whatever closed the dialog, its name decides.
    const std::string chosen = dialog.GetPathName();
    if (chosen.empty())
        return 1;
    const std::string target = CopyTargetName(chosen);
    __finddata64_t found{};
    const intptr_t search = ::_findfirst64(target.c_str(), &found);
    if (search != -1) {
        ::_findclose(search);
        if (::MessageBoxA(owner, kOverwriteQuestion, kOverwriteCaption,
                          MB_YESNO | MB_ICONQUESTION | MB_DEFBUTTON2) != IDYES)
            return 1;
    }
    if (!::CopyFileA(source.c_str(), target.c_str(), FALSE))
        AfxMessageBox(BreakLongWords(std::string(kCannotCopy) + source, kMessageWordChars), MB_OK);
    return 1;
}

int DeleteFiles(HWND owner, const std::vector<std::string>& paths) {
    if (paths.empty())
        return kFileOpNotDone;
    CShellFileOp op;
    op.SetOwner(owner);
    for (const std::string& path : paths)
        op.AddName(CShellFileOp::kSource, path);
    return Outcome(op, op.Delete());
}

namespace {

// Runs a verb of the item's own shell menu, as its right-click menu in the file manager would.
bool InvokeItemVerb(const std::string& path, const char* verb) {
    const HRESULT com = ::CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    bool invoked = false;
    {
        wchar_t wide[MAX_PATH * 2] = L"";
        PIDLIST_ABSOLUTE absolute = nullptr;
        IShellFolder* parent = nullptr;
        PCUITEMID_CHILD child = nullptr;
        if (::MultiByteToWideChar(CP_ACP, 0, path.c_str(), -1, wide, MAX_PATH * 2) &&
            SUCCEEDED(::SHParseDisplayName(wide, nullptr, &absolute, 0, nullptr)) &&
            SUCCEEDED(
                ::SHBindToParent(absolute, IID_IShellFolder, reinterpret_cast<void**>(&parent), &child))) {
            CShellContextMenu menu;
            if (menu.SetObject(parent, child)) {
                CMINVOKECOMMANDINFO command{};
                command.cbSize = sizeof command;
                command.lpVerb = verb;
                command.nShow = SW_SHOW;
                invoked = SUCCEEDED(menu.Menu()->InvokeCommand(&command));
            }
        }
        if (parent)
            parent->Release();
        ::CoTaskMemFree(absolute);
    }
    if (SUCCEEDED(com))
        ::CoUninitialize();
    return invoked;
}

} // namespace

bool ShowFileProperties(const std::string& path) {
    SHELLEXECUTEINFOA info{};
    info.cbSize = sizeof info;
    // Without the shell's own error box: when it cannot route the verb, the item's menu is asked instead.
    info.fMask = SEE_MASK_INVOKEIDLIST | SEE_MASK_FLAG_NO_UI;
    info.hwnd = nullptr;
    info.lpVerb = "properties";
    info.lpFile = path.c_str();
    info.nShow = SW_SHOW;
    if (::ShellExecuteExA(&info))
        return true;
    // Some shells (Wine's) do not pass "properties" on to the item's menu from ShellExecuteEx; the menu
    // itself shows the same sheet.
    return InvokeItemVerb(path, "properties");
}
