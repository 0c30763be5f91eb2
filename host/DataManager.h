// Per-document data, dropped when the host destroys the document.
#pragma once

#include "hostapi/HostApi.h"

#include <map>

// What the library keeps per open drawing: nothing yet, but the place exists.
struct CDocData {};

template <class T> class AsdkDataManager : public AcApDocManagerReactor {
public:
    AsdkDataManager() {
        if (AcApDocManager* manager = acDocManagerPtr())
            manager->addReactor(this);
    }
    virtual ~AsdkDataManager() {
        if (AcApDocManager* manager = acDocManagerPtr())
            manager->removeReactor(this);
    }
    AsdkDataManager(const AsdkDataManager&) = delete;
    AsdkDataManager& operator=(const AsdkDataManager&) = delete;

    void documentToBeDestroyed(AcApDocument* doc) override {
        auto range = m_dataMap.equal_range(doc);
        m_dataMap.erase(range.first, range.second);
    }

    T& docData(AcApDocument* doc) { return m_dataMap[doc]; }
    T& docData() { return docData(acDocManagerPtr() ? acDocManagerPtr()->curDocument() : nullptr); }
    std::size_t size() const { return m_dataMap.size(); }

private:
    std::map<AcApDocument*, T> m_dataMap;
};
