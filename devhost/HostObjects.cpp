#include "devhost/HostObjects.h"

#include "devhost/Output.h"

#include <algorithm>
#include <atomic>

namespace devhost {
namespace {

// The descriptor is a distinct address; nothing reads through it.
struct ClassTag {
    int unused;
} g_dynamicLinkerClass;

} // namespace

const AcRxClass* DynamicLinkerClass() {
    return reinterpret_cast<const AcRxClass*>(&g_dynamicLinkerClass);
}

HostState& Host() {
    static HostState state;
    return state;
}

namespace {
std::atomic<int> g_callsPending{0};
} // namespace

void SetCallsPending(int count) {
    g_callsPending = count;
}

void CallReturned() {
    if (g_callsPending > 0)
        --g_callsPending;
}

int CallsPending() {
    return g_callsPending;
}

std::wstring UpperCase(std::wstring text) {
    if (!text.empty())
        CharUpperBuffW(text.data(), static_cast<DWORD>(text.size()));
    return text;
}

std::wstring LowerCase(std::wstring text) {
    if (!text.empty())
        CharLowerBuffW(text.data(), static_cast<DWORD>(text.size()));
    return text;
}

void DocManager::addReactor(AcApDocManagerReactor* reactor) {
    if (reactor && std::find(m_reactors.begin(), m_reactors.end(), reactor) == m_reactors.end())
        m_reactors.push_back(reactor);
    if (Host().options.verbose)
        WriteLine(L"[host] document manager: reactor added");
}

void DocManager::removeReactor(AcApDocManagerReactor* reactor) {
    m_reactors.erase(std::remove(m_reactors.begin(), m_reactors.end(), reactor), m_reactors.end());
    if (Host().options.verbose)
        WriteLine(L"[host] document manager: reactor removed");
}

// A reactor may remove itself while it is told: tell a copy of the list, skipping removed ones.
void DocManager::NotifyCreated(AcApDocument* document) {
    const auto reactors = m_reactors;
    for (AcApDocManagerReactor* reactor : reactors)
        if (std::find(m_reactors.begin(), m_reactors.end(), reactor) != m_reactors.end())
            reactor->documentCreated(document);
}

void DocManager::NotifyToBeDestroyed(AcApDocument* document) {
    const auto reactors = m_reactors;
    for (AcApDocManagerReactor* reactor : reactors)
        if (std::find(m_reactors.begin(), m_reactors.end(), reactor) != m_reactors.end())
            reactor->documentToBeDestroyed(document);
}

void DocManager::NotifyActivated(AcApDocument* document) {
    const auto reactors = m_reactors;
    for (AcApDocManagerReactor* reactor : reactors)
        if (std::find(m_reactors.begin(), m_reactors.end(), reactor) != m_reactors.end())
            reactor->documentActivated(document);
}

bool DynamicLinker::isKindOf(const AcRxClass* cls) const {
    return cls == DynamicLinkerClass();
}

bool DynamicLinker::unlockApplication(void* appId) {
    const bool ours = appId == Host().appId;
    m_unlocked = m_unlocked || ours;
    if (Host().options.verbose)
        WriteLine(ours ? L"[host] application unlocked"
                       : L"[host] unlockApplication: unknown application id");
    return ours;
}

bool DynamicLinker::registerAppMDIAware(void* appId) {
    const bool ours = appId == Host().appId;
    m_mdiAware = m_mdiAware || ours;
    if (Host().options.verbose)
        WriteLine(ours ? L"[host] application registered MDI-aware"
                       : L"[host] registerAppMDIAware: unknown application id");
    return ours;
}

bool SysRegistry::isKindOf(const AcRxClass*) const {
    return false;
}

AcRxObject* SysRegistry::at(const wchar_t* key) {
    if (key && std::wstring_view(key) == L"DynamicLinker")
        return &Host().linker;
    return nullptr;
}

} // namespace devhost
