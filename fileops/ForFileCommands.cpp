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

} // namespace

std::vector<std::string> ClipboardFileList() {
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
    return ReadDropBlock(copy.data(), copy.size());
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
    return ListHoldsDrawings(ClipboardFileList());
}

bool ForFileCommands::PasteInto(const std::string& folder, HWND owner) const {
    const std::vector<std::string> names = ClipboardFileList();
    // What Paste is offered for: a list that names a drawing. Then every file of it is pasted.
    if (!ListHoldsDrawings(names))
        return false;
    const bool move = g_cutSequence != 0 && g_cutSequence == ::GetClipboardSequenceNumber();
    if (folder.empty())
        return false;
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
    return result == 0;
}

int ForFileCommands::RenameFile(const std::string& source, const std::string& destination,
                                CEdit* label) const {
    CShellFileOp op;
    op.AddName(CShellFileOp::kSource, source);
    op.AddName(CShellFileOp::kDestination, destination);
    // No flags: a name that is taken fails (the shell says why) instead of replacing the other file.
    const int result = op.Rename();
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
        AfxMessageBox(std::string(kCannotCopy) + source, MB_OK);
    return 1;
}

int DeleteFiles(HWND owner, const std::vector<std::string>& paths) {
    if (paths.empty())
        return 1;
    CShellFileOp op;
    op.SetOwner(owner);
    for (const std::string& path : paths)
        op.AddName(CShellFileOp::kSource, path);
    return op.Delete();
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
