#include "thumbs/DwgList.h"

#include <utility>

#include <algorithm>
#include <cctype>
#include <cstring>

CDwgArray DwgList;

DwgData::DwgData(const DwgFindEntry& found)
    : m_bSelected(0), m_strName(found.name), m_timeWrite(found.timeWrite), m_nSize(found.size) {}

DwgData::DwgData(DwgFindEntry&& found)
    : m_bSelected(0), m_strName(std::move(found.name)), m_timeWrite(found.timeWrite), m_nSize(found.size) {}

bool AcceptScanEntry(DwgFindEntry& entry, const char* needle) {
    if (entry.isDirectory && (entry.name.empty() || entry.name[0] != '.'))
        return false;
    for (char& c : entry.name)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return std::strstr(entry.name.c_str(), needle) != nullptr;
}

void BeginScan() {
    DwgList.SetSize(0, kDwgListGrowBy);
}

void AppendScanEntry(const DwgFindEntry& entry) {
    DwgList.Add(DwgData(entry));
}

void AppendScanRecords(std::vector<DwgData>&& records) {
    const int start = DwgList.GetSize();
    DwgList.SetSize(start + static_cast<int>(records.size()));
    for (std::size_t i = 0; i < records.size(); ++i)
        DwgList[start + static_cast<int>(i)] = std::move(records[i]);
    records.clear();
}

void EndScan() {
    DwgList.FreeExtra();
}

int ScanEntries(const DwgFindEntry* entries, int count, const char* needle) {
    BeginScan();
    if (count <= 0)
        return 0;
    for (int i = 0; i < count; ++i) {
        DwgFindEntry entry = entries[i];
        if (AcceptScanEntry(entry, needle))
            AppendScanEntry(entry);
    }
    EndScan();
    return 1;
}

namespace {

inline unsigned char FoldAscii(unsigned char c) {
    return (c >= 'A' && c <= 'Z') ? c + ('a' - 'A') : c;
}

// Compares the first n bytes of a and b, folding ASCII letters.
int CompareFolded(const char* a, const char* b, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) {
        const unsigned char ca = FoldAscii(static_cast<unsigned char>(a[i]));
        const unsigned char cb = FoldAscii(static_cast<unsigned char>(b[i]));
        if (ca != cb)
            return ca < cb ? -1 : 1;
    }
    return 0;
}

} // namespace

int CompareNoCaseAscii(const std::string& a, const std::string& b) {
    const std::size_t n = std::min(a.size(), b.size());
    if (int r = CompareFolded(a.data(), b.data(), n))
        return r;
    if (a.size() == b.size())
        return 0;
    return a.size() < b.size() ? -1 : 1;
}

void SortDwgList(int mode) {
    const int count = DwgList.GetSize();
    if (count == 0)
        return;
    // The last record is left out on purpose: the last file the scan found stays last.
    DwgData* first = DwgList.GetData();
    DwgData* last = first + (count - 1);
    switch (mode) {
    case DwgSortByName:
        std::sort(first, last, [](const DwgData& a, const DwgData& b) {
            return CompareNoCaseAscii(a.m_strName, b.m_strName) < 0;
        });
        break;
    case DwgSortByDate:
        std::sort(first, last,
                  [](const DwgData& a, const DwgData& b) { return a.m_timeWrite < b.m_timeWrite; });
        break;
    case DwgSortBySize:
        std::sort(first, last, [](const DwgData& a, const DwgData& b) { return a.m_nSize < b.m_nSize; });
        break;
    default:
        break;
    }
}

void DeselectAllFlags() {
    const int count = DwgList.GetSize();
    for (int i = 0; i < count; ++i)
        DwgList[i].Deselect();
}

bool AnySelected() {
    const int count = DwgList.GetSize();
    for (int i = 0; i < count; ++i)
        if (DwgList[i].IsSelected())
            return true;
    return false;
}

DwgPrefixSearch FindByPrefix(const std::string& text) {
    DwgPrefixSearch result;
    const int count = DwgList.GetSize();
    if (text.empty() || count == 0)
        return result;
    result.ran = true;
    DeselectAllFlags();
    for (int i = 0; i < count; ++i) {
        const std::string& name = DwgList[i].m_strName;
        // A name as long as the text never matches, even when equal to it.
        if (name.size() > text.size() && CompareFolded(name.data(), text.data(), text.size()) == 0) {
            result.match = i;
            DwgList[0].Deselect();
            DwgList[i].Select();
            break;
        }
    }
    result.nameIndex = result.match >= 0 ? result.match : 0;
    return result;
}

int FindByPrefixIndex(const std::string& text) {
    return FindByPrefix(text).match;
}
