// Builds a LISP result list as a chain of the host's result buffers.
//
//   ads_list_user list;
//   list + "C:\\dwg\\a.dwg" + BeginList() + "0" + "7" + "" + EndList();
//   list.RetList(); list.Release();
//
// The list owns its chain until Release(); destruction does not free it (the owner decides when the
// host is done with it). Allocation failures are reported through the host's failure report and leave
// the list as it was.
#pragma once

#include "hostapi/arxhost.h"

#include <cstddef>

typedef short ads_int;

class ads_list_user {
public:
    ads_list_user() = default;
    ads_list_user(const ads_list_user& other); // deep copy
    ads_list_user& operator=(const ads_list_user&) = delete;
    ~ads_list_user() = default;

    ads_list_user& operator+(ads_int value);
    ads_list_user& operator+(long value);
    ads_list_user& operator+(ads_real value);
    ads_list_user& operator+(const char* text);
    ads_list_user& operator+(const long name[2]);
    ads_list_user& operator+(const ads_point point);
    ads_list_user& operator+(resbuf* chain); // linked in as it is: list markers, or a built chain

    // A new heap list holding a deep copy of this one.
    ads_list_user* Copy() const;

    void ResetCursor() { m_pCursor = m_pHead; }
    resbuf* Next(); // the node at the cursor, then the cursor moves on; nullptr at the end
    bool IsEmpty() const { return m_pHead == nullptr; }
    resbuf* Head() const { return m_pHead; }
    resbuf* LastAppended() const { return m_pLast; }

    int RetList() const; // hands a copy to LISP (acedRetList)
    void Release();      // frees the chain (acutRelRb) and empties the list

    // How the deep copy allocates a string node's text; the host frees it with the chain. Tests swap it
    // for one that fails on demand.
    using TextAllocator = void* (*)(std::size_t bytes);
    static TextAllocator s_allocText;

private:
    void Append(resbuf* chain);
    void AppendNode(resbuf* node, const wchar_t* failure);

    resbuf* m_pHead = nullptr;
    resbuf* m_pTail = nullptr;
    resbuf* m_pCursor = nullptr;
    resbuf* m_pLast = nullptr;
};

// One-node chains for the list markers.
resbuf* BeginList(); // RTLB
resbuf* EndList();   // RTLE
