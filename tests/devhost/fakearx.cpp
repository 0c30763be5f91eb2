// A small extension library for devhost's tests. It exports the four entry functions the way the
// product does, binds the host's operations by name from the process, and defines LISP functions that
// show what the host does with each kind of result, print and alert, and a picker dialog.
#include "hostapi/arxhost.h"
#include "thumbs/AppMessages.h"

#include <windows.h>
#include <commctrl.h>

#include <cstdint>
#include <new>
#include <string>
#include <vector>

extern "C" IMAGE_DOS_HEADER __ImageBase;

namespace {

struct HostOperations {
#define FAKE_MEMBER(ret, name, params) ret(*name) params = nullptr;
    ORVEX_HOST_OPERATIONS(FAKE_MEMBER)
#undef FAKE_MEMBER
};

HostOperations& Host() {
    static HostOperations ops = [] {
        HostOperations bound;
        HMODULE exe = GetModuleHandleW(nullptr);
#define FAKE_BIND(ret, name, params)                                                                         \
    bound.name = reinterpret_cast<ret(*) params>(reinterpret_cast<void*>(GetProcAddress(exe, #name)));
        ORVEX_HOST_OPERATIONS(FAKE_BIND)
#undef FAKE_BIND
        return bound;
    }();
    return ops;
}

// Documents are named by the order in which they were created: #1, #2, ...
std::vector<AcApDocument*> g_documents;

int DocumentNumber(AcApDocument* document) {
    for (std::size_t i = 0; i < g_documents.size(); ++i)
        if (g_documents[i] == document)
            return static_cast<int>(i) + 1;
    return 0;
}

class Reactor final : public AcApDocManagerReactor {
public:
    void documentCreated(AcApDocument* document) override {
        g_documents.push_back(document);
        Host().acutPrintf(L"fake: created #%d\n", DocumentNumber(document));
    }
    void documentToBeDestroyed(AcApDocument* document) override {
        Host().acutPrintf(L"fake: to be destroyed #%d\n", DocumentNumber(document));
    }
    void documentActivated(AcApDocument* document) override {
        Host().acutPrintf(L"fake: activated #%d\n", DocumentNumber(document));
    }
};

// Registered while the library is loaded, as the product's per-document data manager is.
struct ReactorRegistration {
    Reactor reactor;
    ReactorRegistration() {
        if (Host().acDocManagerPtr)
            Host().acDocManagerPtr()->addReactor(&reactor);
    }
    ~ReactorRegistration() {
        if (Host().acDocManagerPtr)
            Host().acDocManagerPtr()->removeReactor(&reactor);
    }
} g_registration;

// ---- LISP functions ----

void Echo() {
    resbuf* args = Host().acedGetArgs();
    Host().acedRetList(args);
    Host().acutRelRb(args); // the host must not free these again
}

void Keep() { // leaves the arguments to the host
    resbuf* args = Host().acedGetArgs();
    Host().acedRetList(args);
}

void Nothing() {
    Host().acedRetNil();
}

void Void() {}

void Talk() {
    Host().acutPrintf(L"\nhello %ls %d %ls", L"wide", 42, L"1.50 narrow");
    Host().acedAlert(L"\nline1\nline2\t\\end");
    Host().acdbFail(L"oops\n");
}

void Build() {
    const double point[3] = {1, 2, 3};
    resbuf* list =
        Host().acutBuildList(RTSTR, L"a", RTLB, RTSHORT, 1, RTLONG, static_cast<std::int32_t>(100000), RTREAL,
                             2.5, RTPOINT, point, RTLE, RTNIL, 0);
    Host().acedRetList(list);
    Host().acutRelRb(list);
}

void Layer() {
    resbuf* args = Host().acedGetArgs();
    int color = -1;
    if (args && args->restype == RTSTR && Host().acdbGetLayerColor(args->resval.rstring, &color)) {
        resbuf* list = Host().acutBuildList(RTSTR, args->resval.rstring, RTSHORT, color, RTLONG,
                                            static_cast<std::int32_t>(Host().acedGetRGB(color)), 0);
        Host().acedRetList(list);
        Host().acutRelRb(list);
    } else {
        Host().acedRetNil();
    }
    Host().acutRelRb(args);
}

std::wstring ClassOf(HWND hwnd) {
    wchar_t name[128] = L"(none)";
    if (hwnd)
        GetClassNameW(hwnd, name, 128);
    return name;
}

void Windows() {
    const std::wstring frame = ClassOf(Host().acedGetAcadFrame());
    const std::wstring app = ClassOf(Host().acedGetAcadWinApp());
    const std::wstring view = ClassOf(Host().acedGetAcadDwgView());
    const bool visible = IsWindowVisible(Host().acedGetAcadDwgView());
    const bool child = GetParent(Host().acedGetAcadDwgView()) == Host().acedGetAcadFrame();
    resbuf* list = Host().acutBuildList(RTSTR, frame.c_str(), RTSTR, app.c_str(), RTSTR, view.c_str(),
                                        RTSHORT, visible ? 1 : 0, RTSHORT, child ? 1 : 0, 0);
    Host().acedRetList(list);
    Host().acutRelRb(list);
}

void Misc() {
    int color = 3;
    const bool chosen = Host().acedSetColorDialog(&color, false, 7);
    const bool drawn =
        Host().acdbDisplayPreviewFromDwg(L"no-such-file.dwg", Host().acedGetAcadDwgView(), nullptr);
    resbuf* list = Host().acutBuildList(RTSHORT, chosen ? 1 : 0, RTSHORT, color, RTSHORT, drawn ? 1 : 0,
                                        RTSHORT, Host().acedGetFunCode(), 0);
    Host().acedRetList(list);
    Host().acutRelRb(list);
}

// Draws a drawing's preview into the view and tells whether it was drawn, whether a grid of the view's
// pixels then shows more than one colour, and the colour of its centre (0x00BBGGRR, as a long).
void Preview() {
    resbuf* args = Host().acedGetArgs();
    HWND view = Host().acedGetAcadDwgView();
    const std::uint32_t white = 0x00FFFFFF;
    const bool drawn = args && args->restype == RTSTR &&
                       Host().acdbDisplayPreviewFromDwg(args->resval.rstring, view, &white);
    std::vector<COLORREF> colours;
    RECT client{};
    GetClientRect(view, &client);
    HDC dc = GetDC(view);
    for (int y = 0; y < 24; ++y) {
        for (int x = 0; x < 24; ++x) {
            const COLORREF c = GetPixel(dc, client.right * x / 24, client.bottom * y / 24);
            bool seen = false;
            for (COLORREF known : colours)
                seen = seen || known == c;
            if (!seen)
                colours.push_back(c);
        }
    }
    const COLORREF centre = GetPixel(dc, client.right / 2, client.bottom / 2);
    ReleaseDC(view, dc);
    resbuf* list = Host().acutBuildList(RTSHORT, drawn ? 1 : 0, RTSHORT, static_cast<int>(colours.size() > 1),
                                        RTLONG, static_cast<std::int32_t>(centre), 0);
    Host().acedRetList(list);
    Host().acutRelRb(list);
    Host().acutRelRb(args);
}

wchar_t g_pickedText[256];

INT_PTR CALLBACK PickerProc(HWND dialog, UINT message, WPARAM wParam, LPARAM) {
    switch (message) {
    case WM_INITDIALOG:
        return TRUE;
    case WM_COMMAND:
        if (LOWORD(wParam) == 1001) {
            GetDlgItemTextW(dialog, 1002, g_pickedText, 256);
            EndDialog(dialog, 7);
            return TRUE;
        }
        if (LOWORD(wParam) == IDCANCEL) {
            EndDialog(dialog, 2);
            return TRUE;
        }
        return FALSE;
    case WM_ORVEX_RESULT: // kAppAccept or kAppCancel, as the explorer posts it
        EndDialog(dialog, static_cast<INT_PTR>(wParam));
        return TRUE;
    default:
        return FALSE;
    }
}

// The tree picker's items: label and level, in order. All are there from the start, collapsed.
struct TreeEntry {
    const wchar_t* label;
    int level;
};
const TreeEntry kTreeEntries[] = {
    {L"Desktop", 0}, {L"My Computer", 1}, {L"Drive C", 2}, {L"Drive Z", 2}, {L"work", 3},
    {L"plans", 4},   {L"old", 3},         {L"Network", 1}, {L"Recycle", 0},
};

void FillTree(HWND tree) {
    HTREEITEM parents[8] = {TVI_ROOT};
    for (const TreeEntry& entry : kTreeEntries) {
        TVINSERTSTRUCTW insert{};
        insert.hParent = parents[entry.level];
        insert.hInsertAfter = TVI_LAST;
        insert.item.mask = TVIF_TEXT;
        insert.item.pszText = const_cast<wchar_t*>(entry.label);
        parents[entry.level + 1] = reinterpret_cast<HTREEITEM>(
            SendMessageW(tree, TVM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&insert)));
    }
}

std::wstring TreeItemText(HWND tree, HTREEITEM item) {
    wchar_t text[128] = {};
    TVITEMW query{};
    query.mask = TVIF_TEXT | TVIF_HANDLE;
    query.hItem = item;
    query.pszText = text;
    query.cchTextMax = 128;
    if (!item || !SendMessageW(tree, TVM_GETITEMW, 0, reinterpret_cast<LPARAM>(&query)))
        return L"(none)";
    return text;
}

// Tells on the command line which item a right click hit and which item a pick took.
INT_PTR CALLBACK TreePickerProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_INITDIALOG) {
        FillTree(GetDlgItem(dialog, 1003));
        return TRUE;
    }
    if (message == WM_NOTIFY && reinterpret_cast<NMHDR*>(lParam)->idFrom == 1003 &&
        reinterpret_cast<NMHDR*>(lParam)->code == NM_RCLICK) {
        HWND tree = GetDlgItem(dialog, 1003);
        TVHITTESTINFO hit{};
        GetCursorPos(&hit.pt);
        ScreenToClient(tree, &hit.pt);
        SendMessageW(tree, TVM_HITTEST, 0, reinterpret_cast<LPARAM>(&hit));
        Host().acutPrintf(L"fake: tree right-click %ls\n", TreeItemText(tree, hit.hItem).c_str());
        SetWindowLongPtrW(dialog, DWLP_MSGRESULT, 1);
        return TRUE;
    }
    if (message == WM_COMMAND && LOWORD(wParam) == 1001) {
        HWND tree = GetDlgItem(dialog, 1003);
        const std::wstring picked = TreeItemText(
            tree, reinterpret_cast<HTREEITEM>(SendMessageW(tree, TVM_GETNEXTITEM, TVGN_CARET, 0)));
        lstrcpynW(g_pickedText, picked.c_str(), 256);
        EndDialog(dialog, 7);
        return TRUE;
    }
    return PickerProc(dialog, message, wParam, lParam);
}

// (picker) shows the picker with an edit, (picker "tree") the one with a tree.
void Picker() {
    g_pickedText[0] = 0;
    resbuf* args = Host().acedGetArgs();
    const bool tree = args && args->restype == RTSTR && std::wstring(args->resval.rstring) == L"tree";
    if (args)
        Host().acutRelRb(args);
    const INT_PTR result =
        DialogBoxParamW(reinterpret_cast<HINSTANCE>(&__ImageBase), MAKEINTRESOURCEW(tree ? 101 : 100),
                        Host().acedGetAcadFrame(), tree ? &TreePickerProc : &PickerProc, 0);
    resbuf* list =
        Host().acutBuildList(RTSTR, L"picker", RTSHORT, static_cast<int>(result), RTSTR, g_pickedText, 0);
    Host().acedRetList(list);
    Host().acutRelRb(list);
    SetFocus(Host().acedGetAcadDwgView());
}

struct Function {
    const wchar_t* name;
    void (*body)();
};

const Function kFunctions[] = {
    {L"echo", &Echo}, {L"keep", &Keep},     {L"nothing", &Nothing}, {L"void", &Void},
    {L"talk", &Talk}, {L"build", &Build},   {L"layer", &Layer},     {L"windows", &Windows},
    {L"misc", &Misc}, {L"picker", &Picker}, {L"preview", &Preview},
};
constexpr int kFunctionCount = sizeof kFunctions / sizeof kFunctions[0];

// ---- module object ----

class FakeModule final : public OdRxModule {
public:
    void addRef() override { ++m_refs; }
    void release() override { --m_refs; }
    long numRefs() const override { return m_refs; }
    void* sysData() override { return &__ImageBase; }
    void deleteModule() override;
    OdString moduleName() const override {
        wchar_t name[OdString::kCapacity] = {};
        GetModuleFileNameW(reinterpret_cast<HMODULE>(&__ImageBase), name, OdString::kCapacity);
        return OdString(name);
    }
    void initApp() override {
        Host().acutPrintf(L"fake: initApp\n");
        Host().onLoadArxApp(moduleName().c_str());
    }
    void uninitApp() override {
        Host().acutPrintf(L"fake: uninitApp\n");
        Host().onUnloadArxApp(moduleName().c_str());
    }

private:
    long m_refs = 0;
};

FakeModule* g_module = nullptr;

void FakeModule::deleteModule() {
    g_module = nullptr;
    this->~FakeModule();
    Host().odrxFree(this);
}

} // namespace

extern "C" __declspec(dllexport) AcRx::AppRetCode acrxEntryPoint(AcRx::AppMsgCode message, void* appId) {
    HostOperations& host = Host();
    switch (message) {
    case AcRx::kInitAppMsg: {
        AcRxObject* object = host.acrxSysRegistry()->at(L"DynamicLinker");
        const bool linker = object && object->isKindOf(host.acrxDynamicLinkerDesc());
        const bool unlocked = linker && static_cast<AcRxDynamicLinker*>(object)->unlockApplication(appId);
        const bool mdi = linker && static_cast<AcRxDynamicLinker*>(object)->registerAppMDIAware(appId);
        const bool wrongId =
            linker && static_cast<AcRxDynamicLinker*>(object)->unlockApplication(&g_documents);
        host.acutPrintf(L"fake: message 1 linker %d unlock %d mdi %d other id %d\n", linker, unlocked, mdi,
                        wrongId);
        break;
    }
    case AcRx::kUnloadAppMsg:
        host.acutPrintf(L"fake: message 2\n");
        break;
    case AcRx::kLoadDwgMsg: {
        int defined = 0;
        for (int i = 0; i < kFunctionCount; ++i)
            defined += host.acedDefun(kFunctions[i].name, i) == RTNORM;
        host.acutPrintf(L"fake: message 3 in #%d defined %d\n",
                        DocumentNumber(host.acDocManagerPtr()->curDocument()), defined);
        break;
    }
    case AcRx::kUnloadDwgMsg: {
        int undefined = 0;
        for (int i = 0; i < kFunctionCount; ++i)
            undefined += host.acedUndef(kFunctions[i].name, i) == RTNORM;
        host.acutPrintf(L"fake: message 4 in #%d undefined %d\n",
                        DocumentNumber(host.acDocManagerPtr()->curDocument()), undefined);
        break;
    }
    case AcRx::kInvkSubrMsg: {
        host.acedRetVoid();
        const int code = host.acedGetFunCode();
        if (code >= 0 && code < kFunctionCount)
            kFunctions[code].body();
        break;
    }
    default:
        break;
    }
    return AcRx::kRetOK;
}

extern "C" __declspec(dllexport) int acrxGetApiVersion(std::uint32_t* major, std::uint32_t* minor,
                                                       std::uint32_t* build, std::uint32_t* patch) {
    *major = 19;
    *minor = 5;
    *build = 0;
    *patch = 0;
    return 0;
}

extern "C" __declspec(dllexport) OdRxModule* odrxCreateModuleObject() {
    if (!g_module) {
        void* memory = Host().odrxAlloc(sizeof(FakeModule));
        if (!memory)
            return nullptr;
        g_module = new (memory) FakeModule();
    }
    return g_module;
}
