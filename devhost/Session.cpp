#include "devhost/Session.h"

#include "devhost/ColorDialog.h"
#include "devhost/HostObjects.h"
#include "devhost/HostWindows.h"
#include "devhost/Lisp.h"
#include "devhost/Output.h"
#include "devhost/ResultBuffers.h"
#include "devhost/Script.h"
#include "devhost/ScriptRunner.h"
#include "devhost/Text.h"
#include "devhost/FileDelay.h"
#include "devhost/Timing.h"
#include "tests/support/MessagePump.h" // pumped wide: devhost's windows are Unicode
#include "tests/support/ProcessResources.h"
#include "thumbs/AppMessages.h"

#include <windows.h>

#include <cwchar>
#include <map>
#include <memory>
#include <set>
#include <vector>

namespace devhost {
namespace {

// The application id given to the entry point: an address of the host's, unique per loaded library.
int g_applicationIdentity;

constexpr UINT_PTR kPostRetryMs = 50;
constexpr UINT_PTR kRepostMs = 500;

std::wstring SystemMessage(DWORD code) {
    wchar_t* buffer = nullptr;
    const DWORD length = FormatMessageW(FORMAT_MESSAGE_ALLOCATE_BUFFER | FORMAT_MESSAGE_FROM_SYSTEM |
                                            FORMAT_MESSAGE_IGNORE_INSERTS,
                                        nullptr, code, 0, reinterpret_cast<wchar_t*>(&buffer), 0, nullptr);
    std::wstring text = length ? std::wstring(buffer, length) : std::wstring();
    if (buffer)
        LocalFree(buffer);
    while (!text.empty() &&
           (text.back() == L'\n' || text.back() == L'\r' || text.back() == L' ' || text.back() == L'.'))
        text.pop_back();
    return L"error " + std::to_wstring(code) + (text.empty() ? L"" : L", " + text);
}

std::wstring ExeDirectory() {
    std::wstring path(MAX_PATH, L'\0');
    for (;;) {
        const DWORD length = GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size()));
        if (length < path.size()) {
            path.resize(length);
            break;
        }
        path.resize(path.size() * 2);
    }
    const std::size_t slash = path.find_last_of(L"\\/");
    return slash == std::wstring::npos ? std::wstring() : path.substr(0, slash + 1);
}

// Waits for a thread while the user-interface thread keeps answering its windows.
void WaitPumping(HANDLE thread) {
    for (;;) {
        const DWORD result = MsgWaitForMultipleObjects(1, &thread, FALSE, INFINITE, QS_ALLINPUT);
        if (result != WAIT_OBJECT_0 + 1)
            return;
        testsupport::PumpMessages(testsupport::Chars::Wide);
    }
}

// --after-ms: a thread timer (it fires inside the library's modal loop) that posts the accept or cancel
// message to the run dialog once it is there, and cancels the colour dialog if one is open.
WPARAM g_postValue = 0;
bool g_posted = false;

void CALLBACK PostTimer(HWND, UINT, UINT_PTR timer, DWORD) {
    // A menu, a message box or a shell dialog running its own loop on top of the run dialog's would take
    // the posted message and drop it: end those first, and post once only the run dialog's loop is left.
    const int ended = EndNestedLoops(GetCurrentThreadId());
    if (ended) {
        if (Host().options.verbose)
            WriteLine(L"[host] ended " + std::to_wstring(ended) + L" nested loop(s)");
        SetTimer(nullptr, timer, kPostRetryMs, &PostTimer);
        return;
    }
    if (HWND dialog = FindRunDialog(GetCurrentThreadId())) {
        // A call waiting in the colour dialog ends too. The dialog goes first: its loop would dispatch the
        // result message to the run dialog, which takes it only from the library's own loop.
        CancelColorDialog();
        PostMessageW(dialog, WM_ORVEX_RESULT, g_postValue, 0);
        if (!g_posted && Host().options.verbose)
            WriteLine(g_postValue == kAppAccept ? L"[host] posted accept" : L"[host] posted cancel");
        g_posted = true;
        // Posted again while the call runs: a loop that began meanwhile may have taken it.
        SetTimer(nullptr, timer, kRepostMs, &PostTimer);
        return;
    }
    // Not there yet: look again shortly. A call waiting in the colour dialog meanwhile has had its time.
    CancelColorDialog();
    SetTimer(nullptr, timer, kPostRetryMs, &PostTimer);
}

class Session {
public:
    explicit Session(const Options& options) : m_options(options) {}
    ~Session() {
        if (m_library)
            FreeLibrary(m_library);
        m_frame.Destroy();
    }

    int Run();

private:
    bool LoadScript();
    bool CreateWindows();
    bool LoadLibraryAndEntryPoints();
    void CreateModule();
    void OpenDocuments();
    void CloseDocuments();
    void Activate(AcApDocument* document);
    void Evaluate(const std::wstring& expression);
    void EvaluateDuringACall(const std::wstring& expression);
    void StartScript();
    void LoadPrograms();
    void Send(AcRx::AppMsgCode message);

    const Options& m_options;
    FrameWindow m_frame;
    std::wstring m_libraryPath;
    HMODULE m_library = nullptr;
    AcrxEntryPointFn m_entryPoint = nullptr;
    OdrxCreateModuleObjectFn m_createModule = nullptr;
    OdRxModule* m_module = nullptr;
    std::unique_ptr<ScriptRunner> m_script;
    int m_exitCode = kExitOk;
    bool m_resourcesCounted = false; // --resources: the counts before the first call are printed
};

// The bytes of a file of the user's (a script, a LISP program), up to 16 MiB; false with the system's
// message.
bool ReadFileBytes(const std::wstring& path, std::string& bytes, std::wstring& error) {
    HANDLE file = CreateFileW(path.c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                              FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        error = SystemMessage(GetLastError());
        return false;
    }
    bytes.clear();
    char buffer[4096];
    DWORD read = 0;
    while (ReadFile(file, buffer, sizeof buffer, &read, nullptr) && read > 0 && bytes.size() < (1u << 24))
        bytes.append(buffer, read);
    CloseHandle(file);
    return true;
}

bool Session::LoadScript() {
    if (m_options.script.empty())
        return true;
    std::string bytes;
    std::wstring error;
    if (!ReadFileBytes(m_options.script, bytes, error)) {
        WriteError(L"cannot read the script " + m_options.script + L": " + error);
        return false;
    }
    std::vector<ScriptCommand> commands;
    if (!ReadScript(FromUtf8(bytes), commands, error)) {
        WriteError(L"script " + m_options.script + L", " + error);
        return false;
    }
    m_script = std::make_unique<ScriptRunner>(std::move(commands), GetCurrentThreadId());
    return true;
}

namespace {

std::wstring g_refusedClassPrefix;

// Refuses the creation of top-level windows of the named classes, as a system out of window handles
// or memory would: the library must cope with a window that cannot be made.
LRESULT CALLBACK RefuseWindowHook(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND) {
        const auto* create = reinterpret_cast<const CBT_CREATEWNDW*>(lParam);
        wchar_t className[256] = L"";
        GetClassNameW(reinterpret_cast<HWND>(wParam), className, 256);
        const std::size_t n = g_refusedClassPrefix.size();
        if (!(create->lpcs->style & WS_CHILD) && std::wcslen(className) >= n &&
            CompareStringOrdinal(className, static_cast<int>(n), g_refusedClassPrefix.c_str(),
                                 static_cast<int>(n), TRUE) == CSTR_EQUAL) {
            WriteLine(L"[host] refused to create a window of class " + std::wstring(className));
            return 1;
        }
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

} // namespace

// Validates every heap of the process; with Wine's heap checks on (WINEDEBUG=warn+heap) that includes the
// fill of freed blocks, so a write into a freed object shows here.
// --resources: "[host] resources WHEN: gdi=G windows=W handles=H threads=T".
static void PrintResources(const wchar_t* when) {
    const testsupport::ProcessResources counted = testsupport::CountProcessResources();
    WriteLine(L"[host] resources " + std::wstring(when) + L": gdi=" + std::to_wstring(counted.gdiObjects) +
              L" windows=" + std::to_wstring(counted.windows) + L" handles=" +
              std::to_wstring(counted.handles) + L" threads=" + std::to_wstring(counted.threads));
}

static void CheckHeaps() {
    std::vector<HANDLE> heaps(64);
    DWORD count = GetProcessHeaps(static_cast<DWORD>(heaps.size()), heaps.data());
    if (count > heaps.size()) {
        heaps.resize(count);
        count = GetProcessHeaps(count, heaps.data());
    }
    int damaged = 0;
    for (DWORD i = 0; i < count && i < heaps.size(); ++i)
        if (!HeapValidate(heaps[i], 0, nullptr))
            ++damaged;
    WriteLine(damaged ? L"[host] heap damaged (" + std::to_wstring(damaged) + L" heaps)"
                      : L"[host] heaps valid");
}

bool Session::CreateWindows() {
    m_frame.onCall = [this](const std::wstring& expression) { EvaluateDuringACall(expression); };
    if (!RegisterHostClasses() || !m_frame.Create()) {
        WriteError(L"cannot create the host's windows: " + SystemMessage(GetLastError()));
        return false;
    }
    Host().frame = m_frame.Handle();
    testsupport::PumpMessages(testsupport::Chars::Wide);
    if (!m_options.refuseWindow.empty()) {
        g_refusedClassPrefix = m_options.refuseWindow;
        SetWindowsHookExW(WH_CBT, &RefuseWindowHook, nullptr, GetCurrentThreadId());
    }
    return true;
}

bool Session::LoadLibraryAndEntryPoints() {
    m_libraryPath = m_options.arx.empty() ? ExeDirectory() + L"Orvex1.arx" : m_options.arx;
    if (GetFileAttributesW(m_libraryPath.c_str()) == INVALID_FILE_ATTRIBUTES) {
        WriteError(L"cannot load " + m_libraryPath + L": no such file");
        return false;
    }
    m_library = LoadLibraryW(m_libraryPath.c_str());
    if (!m_library) {
        WriteError(L"cannot load " + m_libraryPath + L": " + SystemMessage(GetLastError()));
        return false;
    }
    m_entryPoint = reinterpret_cast<AcrxEntryPointFn>(
        reinterpret_cast<void*>(GetProcAddress(m_library, "acrxEntryPoint")));
    m_createModule = reinterpret_cast<OdrxCreateModuleObjectFn>(
        reinterpret_cast<void*>(GetProcAddress(m_library, "odrxCreateModuleObject")));
    if (!m_entryPoint || !m_createModule) {
        WriteError(m_libraryPath + L" does not export " +
                   (m_entryPoint ? L"odrxCreateModuleObject" : L"acrxEntryPoint"));
        return false;
    }
    if (m_options.verbose)
        WriteLine(L"[host] loaded " + m_libraryPath);
    TimingWatchLibrary(m_library);
    FileDelayWatch(m_library);
    ScanDelayWatch(m_library);
    FileDelayWatch(GetModuleHandleW(nullptr)); // the host's own preview operation reads drawings too
    return true;
}

void Session::Send(AcRx::AppMsgCode message) {
    if (m_options.verbose)
        WriteLine(L"[host] message " + std::to_wstring(static_cast<int>(message)));
    m_entryPoint(message, Host().appId);
}

void Session::CreateModule() {
    m_module = m_createModule();
    if (!m_module) {
        WriteLine(L"[host] odrxCreateModuleObject returned no module object");
        return;
    }
    m_module->initApp();
}

void Session::Activate(AcApDocument* document) {
    HostState& host = Host();
    const bool changed = host.docManager.curDocument() != document;
    host.docManager.SetCurrent(document);
    ShowOnlyView(host.frame, document ? document->View() : nullptr);
    if (document && document->View())
        SetFocus(document->View());
    if (changed && document)
        host.docManager.NotifyActivated(document);
}

// Drawings open after the library is initialised and close before it is unloaded, each one current
// while it is loaded or unloaded.
void Session::OpenDocuments() {
    HostState& host = Host();
    for (int i = 0; i < m_options.drawings; ++i) {
        auto document = std::make_unique<AcApDocument>(L"Drawing" + std::to_wstring(i + 1) + L".dwg");
        document->SetView(CreateDrawingView(host.frame, document->Name(), i));
        AcApDocument* opened = document.get();
        host.documents.push_back(std::move(document));
        host.docManager.NotifyCreated(opened);
        Activate(opened);
        Send(AcRx::kLoadDwgMsg);
    }
    Activate(host.documents.front().get());
    testsupport::PumpMessages(testsupport::Chars::Wide);
}

void Session::CloseDocuments() {
    HostState& host = Host();
    while (!host.documents.empty()) {
        AcApDocument* document = host.documents.front().get();
        Activate(document);
        Send(AcRx::kUnloadDwgMsg);
        host.docManager.NotifyToBeDestroyed(document);
        host.docManager.SetCurrent(nullptr);
        if (document->View())
            DestroyWindow(document->View());
        host.documents.erase(host.documents.begin());
    }
    testsupport::PumpMessages(testsupport::Chars::Wide);
}

// Every call in the forms of a function the library defined: with constant arguments it is printed as a
// call --eval can make; with arguments computed when the program runs, it is said so.
void ReportLibraryCalls(const std::vector<LispForm>& forms, const std::map<std::wstring, int>& functions) {
    for (const LispForm& form : forms) {
        if (form.kind != LispForm::Kind::List)
            continue; // a quoted form is data, not a call
        if (!form.items.empty() && form.items[0].kind == LispForm::Kind::Symbol &&
            functions.count(LowerCase(form.items[0].text))) {
            bool constant = true;
            for (std::size_t i = 1; i < form.items.size(); ++i)
                constant = constant && IsLispConstant(form.items[i]);
            WriteLine(std::wstring(constant ? L"[load] call " : L"[load] call with computed arguments ") +
                      PrintLispForm(form) + L" (line " + std::to_wstring(form.line) + L")");
        }
        ReportLibraryCalls(form.items, functions);
    }
}

void Session::LoadPrograms() {
    for (const std::wstring& path : m_options.loads) {
        std::string bytes;
        std::wstring error;
        std::vector<LispForm> forms;
        if (!ReadFileBytes(path, bytes, error)) {
            WriteLine(L"; error: cannot read " + path + L": " + error);
        } else if (!ReadLispProgram(FromUtf8(bytes), forms, error)) {
            WriteLine(L"; error: " + path + L": " + error);
        } else {
            WriteLine(L"[load] " + path + L": " + std::to_wstring(forms.size()) + L" forms");
            for (const LispForm& form : forms)
                if (form.kind == LispForm::Kind::List && form.items.size() >= 3 &&
                    form.items[0].kind == LispForm::Kind::Symbol &&
                    LowerCase(form.items[0].text) == L"defun" && form.items[1].kind == LispForm::Kind::Symbol)
                    WriteLine(L"[load] defun " + form.items[1].text);
            ReportLibraryCalls(forms, Host().docManager.curDocument()->Functions());
            continue;
        }
        m_exitCode = m_exitCode == kExitOk ? kExitLispError : m_exitCode;
    }
}

void Session::StartScript() {
    if (m_script && !m_script->Started() && !m_script->Start()) {
        WriteLine(L"[script] error: cannot start the script thread");
        m_exitCode = kExitScript;
    }
}

void Session::Evaluate(const std::wstring& expression) {
    HostState& host = Host();
    LispCall call;
    std::wstring error;
    if (!ReadLispCall(expression, call, error)) {
        WriteLine(L"; error: " + error);
        m_exitCode = m_exitCode == kExitOk ? kExitLispError : m_exitCode;
        return;
    }
    AcApDocument* document = host.docManager.curDocument();
    const auto& functions = document->Functions();
    const auto found = functions.find(LowerCase(call.function));
    if (found == functions.end()) {
        WriteLine(L"; error: no function definition: " + EscapeControls(call.function));
        m_exitCode = m_exitCode == kExitOk ? kExitLispError : m_exitCode;
        return;
    }
    host.args = BuildArgumentChain(call.args);
    if (!call.args.empty() && !host.args) {
        WriteLine(L"; error: out of memory");
        m_exitCode = m_exitCode == kExitOk ? kExitLispError : m_exitCode;
        return;
    }
    host.liveArgNodes.clear();
    for (const resbuf* node = host.args; node; node = node->rbnext)
        host.liveArgNodes.insert(node);
    host.functionCode = found->second;
    host.result = CallResult::Void;
    const bool nested = host.inCall;
    host.inCall = true;

    UINT_PTR timer = 0;
    if (nested) {
        // A call made while another runs (the script's `call`): no timers, marks or script of its own.
        m_entryPoint(AcRx::kInvkSubrMsg, host.appId);
    } else if (m_options.afterMs >= 0) {
        g_postValue = m_options.post == Options::Post::Accept ? kAppAccept : kAppCancel;
        g_posted = false;
        timer = SetTimer(nullptr, 0, static_cast<UINT>(m_options.afterMs), &PostTimer);
    }
    if (!nested) {
        if (m_options.resources && !m_resourcesCounted) {
            PrintResources(L"before the first call");
            m_resourcesCounted = true;
        }
        StartScript();
        TimingCallBegins();
        m_entryPoint(AcRx::kInvkSubrMsg, host.appId);
        TimingCallEnded();
        if (m_options.checkHeaps)
            CheckHeaps();
        if (m_options.resources)
            PrintResources(L"after the call");
    }

    if (timer)
        KillTimer(nullptr, timer);
    host.inCall = false;
    host.functionCode = RTERROR;
    switch (host.result) {
    case CallResult::Void:
        WriteLine(L"=> (no value)");
        break;
    case CallResult::Nil:
        WriteLine(L"=> nil");
        break;
    case CallResult::List:
        WriteLine(L"=> " + PrintChain(host.resultList));
        break;
    }
    if (!nested)
        CallReturned(); // after the value is printed: a script that waits for it reads it there
    // The argument nodes the library did not release are still the host's.
    for (const resbuf* node : host.liveArgNodes) {
        resbuf* own = const_cast<resbuf*>(node);
        own->rbnext = nullptr;
        FreeChain(own);
    }
    host.liveArgNodes.clear();
    host.args = nullptr;
    FreeChain(host.resultList);
    host.resultList = nullptr;
    host.result = CallResult::Void;
    if (!nested)
        testsupport::PumpMessages(testsupport::Chars::Wide);
}

// The state of the running call is put aside while the second one runs and comes back after it, as a
// host's LISP interpreter keeps each call's arguments and value apart.
void Session::EvaluateDuringACall(const std::wstring& expression) {
    HostState& host = Host();
    if (!host.inCall) {
        Evaluate(expression);
        return;
    }
    const int functionCode = host.functionCode;
    resbuf* args = host.args;
    std::set<const resbuf*> liveArgNodes;
    liveArgNodes.swap(host.liveArgNodes);
    const CallResult result = host.result;
    resbuf* resultList = host.resultList;
    host.args = nullptr;
    host.resultList = nullptr;

    Evaluate(expression); // sees inCall: a nested call

    host.inCall = true;
    host.functionCode = functionCode;
    host.args = args;
    host.liveArgNodes.swap(liveArgNodes);
    host.result = result;
    host.resultList = resultList;
}

int Session::Run() {
    HostState& host = Host();
    host.options = m_options;
    host.appId = &g_applicationIdentity;
    host.layers[L"0"] = 7; // every drawing has layer 0
    for (const LayerOption& layer : m_options.layers)
        host.layers[UpperCase(layer.name)] = layer.colorIndex;

    if (!LoadScript())
        return kExitUsage;
    if (!CreateWindows())
        return kExitHost;
    if (!LoadLibraryAndEntryPoints())
        return kExitLoad;

    if (m_options.order == Options::Order::ModuleFirst) {
        CreateModule();
        Send(AcRx::kInitAppMsg);
    } else {
        Send(AcRx::kInitAppMsg);
        CreateModule();
    }
    OpenDocuments();
    LoadPrograms();

    SetCallsPending(static_cast<int>(m_options.evals.size()));
    for (const std::wstring& expression : m_options.evals)
        Evaluate(expression);
    SetCallsPending(0);
    StartScript(); // a script runs even without a LISP call, on the host's own windows
    if (m_script && m_script->Started()) {
        WaitPumping(m_script->Thread());
        if (m_script->Failed())
            m_exitCode = kExitScript;
    }

    CloseDocuments();
    Send(AcRx::kUnloadAppMsg);
    if (m_module)
        m_module->uninitApp();
    if (m_options.verbose)
        WriteLine(L"[host] unloading " + m_libraryPath);
    FreeLibrary(m_library);
    m_library = nullptr;
    return m_exitCode;
}

} // namespace

int RunSession(const Options& options) {
    Session session(options);
    return session.Run();
}

} // namespace devhost
