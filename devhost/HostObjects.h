// The objects devhost hands to the library (document manager, system registry, dynamic linker, the open
// documents) and the state of the LISP call that is running. One host per process: this is the
// application, so its state is process-wide.
#pragma once

#include "devhost/Options.h"
#include "hostapi/arxhost.h"

#include <windows.h>

#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

// An open drawing. The library only ever uses its address, as a key.
class AcApDocument {
public:
    explicit AcApDocument(std::wstring name) : m_name(std::move(name)) {}
    AcApDocument(const AcApDocument&) = delete;
    AcApDocument& operator=(const AcApDocument&) = delete;

    const std::wstring& Name() const { return m_name; }
    HWND View() const { return m_view; }
    void SetView(HWND view) { m_view = view; }

    // The LISP functions defined in this drawing: name (lower case, as LISP ignores case) -> code.
    std::map<std::wstring, int>& Functions() { return m_functions; }

private:
    std::wstring m_name;
    HWND m_view = nullptr; // owned by the frame's window tree; destroyed with the document
    std::map<std::wstring, int> m_functions;
};

namespace devhost {

class DocManager final : public AcApDocManager {
public:
    void addReactor(AcApDocManagerReactor* reactor) override;
    void removeReactor(AcApDocManagerReactor* reactor) override;
    AcApDocument* curDocument() override { return m_current; }

    void SetCurrent(AcApDocument* document) { m_current = document; }
    void NotifyCreated(AcApDocument* document);
    void NotifyToBeDestroyed(AcApDocument* document);
    void NotifyActivated(AcApDocument* document);

private:
    std::vector<AcApDocManagerReactor*> m_reactors; // not owned
    AcApDocument* m_current = nullptr;
};

class DynamicLinker final : public AcRxDynamicLinker {
public:
    bool isKindOf(const AcRxClass* cls) const override;
    bool unlockApplication(void* appId) override;
    bool registerAppMDIAware(void* appId) override;

    bool Unlocked() const { return m_unlocked; }
    bool MdiAware() const { return m_mdiAware; }

private:
    bool m_unlocked = false;
    bool m_mdiAware = false;
};

class SysRegistry final : public AcRxDictionary {
public:
    bool isKindOf(const AcRxClass* cls) const override;
    AcRxObject* at(const wchar_t* key) override;
};

// The class descriptor of the dynamic linker (only its address matters).
const AcRxClass* DynamicLinkerClass();

// Where the value of a LISP call stands.
enum class CallResult { Void, Nil, List };

struct HostState {
    Options options;
    DocManager docManager;
    SysRegistry registry;
    DynamicLinker linker;
    void* appId = nullptr; // what the entry point is given as the application id

    HWND frame = nullptr;
    std::vector<std::unique_ptr<AcApDocument>> documents;
    std::map<std::wstring, int> layers; // upper-case name -> colour index

    // The running call (message 5).
    bool inCall = false;
    int functionCode = RTERROR;
    resbuf* args = nullptr;               // what acedGetArgs hands out
    std::set<const resbuf*> liveArgNodes; // its nodes the library has not released
    CallResult result = CallResult::Void;
    resbuf* resultList = nullptr; // the copy acedRetList keeps
};

HostState& Host();

// How many LISP calls of the command line have not returned yet; unlike HostState::inCall it may be read
// from the script's thread.
void SetCallsPending(int count);
void CallReturned();
int CallsPending();

// Upper case for layer names, lower case for LISP names (both ignore case).
std::wstring UpperCase(std::wstring text);
std::wstring LowerCase(std::wstring text);

} // namespace devhost
