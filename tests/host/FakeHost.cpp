#include "FakeHost.h"

#include "devhost/ResultBuffers.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <cwchar>

FakeHost* FakeHost::current = nullptr;

namespace {

std::string Narrow(const std::wstring& w) {
    std::string s;
    for (wchar_t c : w)
        s.push_back(static_cast<char>(c));
    return s;
}

bool Allocate() {
    FakeHost* h = FakeHost::current;
    if (h->failAllocationAt > 0 && --h->failAllocationAt == 0)
        return false;
    return true;
}

int CountNodes(const resbuf* rb) {
    int count = 0;
    for (; rb; rb = rb->rbnext)
        ++count;
    return count;
}

// The nodes and strings are devhost's, so the library meets the same heap rules as in the real host;
// the fake adds the counting and the refused allocations.
resbuf* NewNode(int type) {
    if (!Allocate())
        return nullptr;
    resbuf* rb = devhost::NewNode(type);
    if (rb)
        ++FakeHost::current->liveNodes;
    return rb;
}

int RelRb(resbuf* rb) {
    FakeHost::current->liveNodes -= CountNodes(rb);
    devhost::FreeChain(rb);
    return RTNORM;
}

resbuf* BuildList(int type, ...) {
    va_list ap;
    va_start(ap, type);
    resbuf* head = devhost::BuildChainV(type, ap);
    va_end(ap);
    // A refused allocation anywhere in the chain refuses the whole list, as the host does.
    const int nodes = CountNodes(head);
    for (int i = 0; i < nodes; ++i) {
        if (!Allocate()) {
            devhost::FreeChain(head);
            return nullptr;
        }
    }
    FakeHost::current->liveNodes += nodes;
    return head;
}

int Printf(const wchar_t* format, ...) {
    wchar_t text[4096];
    va_list ap;
    va_start(ap, format);
    std::vswprintf(text, 4096, format, ap);
    va_end(ap);
    FakeHost::current->events.push_back("print:" + Narrow(text));
    return RTNORM;
}

int Alert(const wchar_t* text) {
    FakeHost::current->events.push_back("alert:" + Narrow(text));
    return RTNORM;
}

void Fail(const wchar_t* text) {
    FakeHost::current->events.push_back("fail:" + Narrow(text));
}

resbuf* GetArgs() {
    resbuf* a = FakeHost::current->args;
    FakeHost::current->args = nullptr; // the caller releases them
    return a;
}

int RetList(const resbuf* rb) {
    FakeHost::current->result = PrintChain(rb);
    return RTNORM;
}
int RetNil() {
    FakeHost::current->result = "nil";
    return RTNORM;
}
int RetVoid() {
    FakeHost::current->result = "void";
    return RTNORM;
}
int GetFunCode() {
    return FakeHost::current->funCode;
}

int Defun(const wchar_t* name, int code) {
    FakeHost* h = FakeHost::current;
    h->calls.push_back("defun " + Narrow(name) + " " + std::to_string(code));
    if (h->failDefunAt > 0 && --h->failDefunAt == 0)
        return RTERROR;
    return RTNORM;
}
int Undef(const wchar_t* name, int code) {
    FakeHost::current->calls.push_back("undef " + Narrow(name) + " " + std::to_string(code));
    return RTNORM;
}

const AcRxClass* LinkerDesc() {
    return reinterpret_cast<const AcRxClass*>(&LinkerDesc);
}

struct FakeLinker : AcRxDynamicLinker {
    bool isKindOf(const AcRxClass* cls) const override { return cls == LinkerDesc(); }
    bool unlockApplication(void* appId) override {
        FakeHost::current->calls.push_back("unlock " +
                                           std::to_string(reinterpret_cast<std::uintptr_t>(appId)));
        return true;
    }
    bool registerAppMDIAware(void* appId) override {
        FakeHost::current->calls.push_back("mdi " + std::to_string(reinterpret_cast<std::uintptr_t>(appId)));
        return true;
    }
};

struct FakeRegistry : AcRxDictionary {
    FakeLinker linker;
    bool isKindOf(const AcRxClass*) const override { return false; }
    AcRxObject* at(const wchar_t* key) override {
        FakeHost::current->calls.push_back("lookup " + Narrow(key));
        return std::wcscmp(key, L"DynamicLinker") == 0 ? &linker : nullptr;
    }
};

AcRxDictionary* SysRegistry() {
    static FakeRegistry registry;
    return &registry;
}

} // namespace

FakeHost::FakeHost() {
    current = this;
    HostApi api;
    api.acutNewRb = &NewNode;
    api.acutRelRb = &RelRb;
    api.acutBuildList = &BuildList;
    api.acutPrintf = &Printf;
    api.acedAlert = &Alert;
    api.acdbFail = &Fail;
    api.acedGetArgs = &GetArgs;
    api.acedRetList = &RetList;
    api.acedRetNil = &RetNil;
    api.acedRetVoid = &RetVoid;
    api.acedGetFunCode = &GetFunCode;
    api.acedDefun = &Defun;
    api.acedUndef = &Undef;
    api.acrxSysRegistry = &SysRegistry;
    api.acrxDynamicLinkerDesc = &LinkerDesc;
    SetHostApi(api);
}

FakeHost::~FakeHost() {
    RelRb(args);
    SetHostApi(HostApi{});
    current = nullptr;
}

std::string FakeHost::printed() const {
    std::string all;
    for (const auto& e : events)
        if (e.rfind("print:", 0) == 0)
            all += e.substr(6);
    return all;
}

namespace {

void Append(resbuf*& args, resbuf* node) {
    resbuf** link = &args;
    while (*link)
        link = &(*link)->rbnext;
    *link = node;
}

} // namespace

void FakeHost::AddShort(short v) {
    resbuf* rb = NewNode(RTSHORT);
    rb->resval.rint = v;
    Append(args, rb);
}

void FakeHost::AddString(const std::wstring& s) {
    resbuf* rb = NewNode(RTSTR);
    rb->resval.rstring = devhost::DuplicateString(s.c_str());
    Append(args, rb);
}

void FakeHost::AddReal(double v) {
    resbuf* rb = NewNode(RTREAL);
    rb->resval.rreal = v;
    Append(args, rb);
}

std::string PrintChain(const resbuf* rb) {
    std::string out;
    bool needSpace = false;
    for (; rb; rb = rb->rbnext) {
        if (rb->restype == RTLE) {
            out += ")";
            needSpace = true;
            continue;
        }
        if (needSpace)
            out += " ";
        needSpace = true;
        switch (rb->restype) {
        case RTLB:
            out += "(";
            needSpace = false;
            break;
        case RTSTR:
            out += "\"" + Narrow(rb->resval.rstring) + "\"";
            break;
        case RTSHORT:
            out += std::to_string(rb->resval.rint);
            break;
        case RTLONG:
            out += std::to_string(rb->resval.rlong);
            break;
        case RTREAL: {
            char buf[64];
            std::snprintf(buf, sizeof buf, "%g", rb->resval.rreal);
            out += buf;
            break;
        }
        case RTPOINT: {
            char buf[128];
            std::snprintf(buf, sizeof buf, "(%g %g %g)", rb->resval.rpoint[0], rb->resval.rpoint[1],
                          rb->resval.rpoint[2]);
            out += buf;
            break;
        }
        case RTENAME:
            out += "<ename " + std::to_string(rb->resval.rlname[0]) + " " +
                   std::to_string(rb->resval.rlname[1]) + ">";
            break;
        default:
            out += "?" + std::to_string(rb->restype);
            break;
        }
    }
    return "(" + out + ")";
}
