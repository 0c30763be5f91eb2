// A growable array with an explicit grow step, as the explorer's lists use it. Portable: no <windows.h>.
//
// Growth happens in steps of the grow step (or by a heuristic when it is 0 or negative), FreeExtra()
// shrinks the allocation to the element count, and every index outside 0..count-1 throws
// CInvalidArgException. ARG_TYPE is accepted for the familiar signature; elements are passed by const
// reference either way.
#pragma once

#include "afxexcept.h"

#include <algorithm>
#include <cstddef>
#include <new>
#include <utility>
#include <vector>

template <class TYPE, class ARG_TYPE = const TYPE&>
class CArray {
public:
    CArray() = default;
    CArray(const CArray&) = delete; // the lists of this program are never copied whole
    CArray& operator=(const CArray&) = delete;

    int GetSize() const { return static_cast<int>(m_data.size()); }
    int GetCount() const { return GetSize(); }
    bool IsEmpty() const { return m_data.empty(); }
    int GetUpperBound() const { return GetSize() - 1; }
    std::size_t GetAllocated() const { return m_data.capacity(); }
    int GetGrowBy() const { return m_nGrowBy; }

    // Resizes to nNewSize elements; nGrowBy >= 0 also sets the grow step.
    void SetSize(int nNewSize, int nGrowBy = -1) {
        if (nNewSize < 0)
            AfxThrowInvalidArgException();
        if (nGrowBy >= 0)
            m_nGrowBy = nGrowBy;
        if (nNewSize == 0) {
            std::vector<TYPE>().swap(m_data); // emptied: storage freed
            return;
        }
        Reserve(static_cast<std::size_t>(nNewSize));
        m_data.resize(static_cast<std::size_t>(nNewSize));
    }

    void RemoveAll() { SetSize(0, -1); }

    // Releases the spare capacity.
    void FreeExtra() {
        if (m_data.capacity() != m_data.size()) {
            std::vector<TYPE> exact;
            exact.reserve(m_data.size());
            for (auto& e : m_data)
                exact.push_back(std::move(e));
            m_data.swap(exact);
        }
    }

    int Add(const TYPE& element) {
        Reserve(m_data.size() + 1);
        m_data.push_back(element);
        return GetSize() - 1;
    }

    void InsertAt(int nIndex, const TYPE& element) {
        if (nIndex < 0 || nIndex > GetSize())
            AfxThrowInvalidArgException();
        Reserve(m_data.size() + 1);
        m_data.insert(m_data.begin() + nIndex, element);
    }

    void RemoveAt(int nIndex, int nCount = 1) {
        if (nIndex < 0 || nCount < 0 || nIndex + nCount > GetSize())
            AfxThrowInvalidArgException();
        m_data.erase(m_data.begin() + nIndex, m_data.begin() + nIndex + nCount);
    }

    TYPE& ElementAt(int nIndex) {
        Check(nIndex);
        return m_data[static_cast<std::size_t>(nIndex)];
    }
    const TYPE& GetAt(int nIndex) const {
        Check(nIndex);
        return m_data[static_cast<std::size_t>(nIndex)];
    }
    void SetAt(int nIndex, const TYPE& element) { ElementAt(nIndex) = element; }
    TYPE& operator[](int nIndex) { return ElementAt(nIndex); }
    const TYPE& operator[](int nIndex) const { return GetAt(nIndex); }

    // Raw access for algorithms over a range (sorting); valid until the next growth.
    TYPE* GetData() { return m_data.empty() ? nullptr : m_data.data(); }
    const TYPE* GetData() const { return m_data.empty() ? nullptr : m_data.data(); }

private:
    void Check(int nIndex) const {
        if (nIndex < 0 || nIndex >= GetSize())
            AfxThrowInvalidArgException();
    }

    // Grows the allocation in whole steps so that appends do not reallocate one by one.
    void Reserve(std::size_t needed) {
        if (needed <= m_data.capacity())
            return;
        std::size_t step = m_nGrowBy > 0 ? static_cast<std::size_t>(m_nGrowBy)
                                         : std::max<std::size_t>(4, std::min<std::size_t>(1024, m_data.size() / 8));
        std::size_t capacity = m_data.capacity();
        while (capacity < needed)
            capacity += step;
        try {
            m_data.reserve(capacity);
        } catch (const std::bad_alloc&) {
            AfxThrowMemoryException();
        } catch (const std::length_error&) {
            AfxThrowMemoryException();
        }
    }

    std::vector<TYPE> m_data;
    int m_nGrowBy = 0;
};
