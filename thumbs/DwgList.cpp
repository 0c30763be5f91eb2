#include "thumbs/DwgList.h"

#include "hostapi/NarrowText.h"
#include "thumbs/NameCollation.h"

#include <algorithm>
#include <cstring>
#include <utility>

CDwgArray DwgList;

DwgData::DwgData(const DwgFindEntry& found)
    : m_bSelected(0), m_strName(found.name), m_timeWrite(found.timeWrite), m_nSize(found.size) {}

DwgData::DwgData(DwgFindEntry&& found)
    : m_bSelected(0), m_strName(std::move(found.name)), m_timeWrite(found.timeWrite), m_nSize(found.size) {}

bool AcceptScanEntry(DwgFindEntry& entry, const char* needle) {
    if (entry.isDirectory && (entry.name.empty() || entry.name[0] != '.'))
        return false;
    FoldNameInPlace(entry.name);
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

std::string FolderPathProblem(const std::string& folder) {
    if (folder.empty())
        return "No folder to read";
    // The runtime's path limit counts characters, as the messages do.
    const bool separator = EndsWithSeparator(folder);
    const std::size_t length = CharacterCount(folder);
    const std::size_t pattern = length + (separator ? 1 : 2);
    if (pattern <= kMaxPathChars)
        return {};
    const std::size_t longest = kMaxPathChars - (separator ? 1 : 2);
    return "The folder cannot be read: its path is " + std::to_string(length) + " characters long, at most " +
           std::to_string(longest) + " are possible";
}

bool FullPathFits(const std::string& folder, const std::string& name) {
    const bool separator = EndsWithSeparator(folder);
    return CharacterCount(folder) + (separator ? 0 : 1) + CharacterCount(name) <= kMaxPathChars;
}

std::string SkippedFilesMessage(int skipped) {
    if (skipped <= 0)
        return {};
    return std::to_string(skipped) + (skipped == 1 ? " drawing is" : " drawings are") +
           " not shown: the full path is longer than " + std::to_string(kMaxPathChars) + " characters";
}

void SortByName(NameCollation& collation) {
    const int count = DwgList.GetSize();
    // Every key once, side by side in one buffer: the sort then compares bytes, never the locale.
    std::string keys;
    keys.reserve(static_cast<std::size_t>(count) * 32);
    std::vector<std::size_t> starts(static_cast<std::size_t>(count) + 1);
    for (int i = 0; i < count; ++i) {
        starts[i] = keys.size();
        collation.AppendSortKey(DwgList[i].m_strName, keys);
    }
    starts[count] = keys.size();
    std::vector<int> order(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i)
        order[i] = i;
    const char* base = keys.data();
    std::sort(order.begin(), order.end(), [&](int a, int b) {
        const std::size_t lengthA = starts[a + 1] - starts[a];
        const std::size_t lengthB = starts[b + 1] - starts[b];
        const int byKey = std::memcmp(base + starts[a], base + starts[b], std::min(lengthA, lengthB));
        if (byKey != 0)
            return byKey < 0;
        if (lengthA != lengthB)
            return lengthA < lengthB;
        // Equal keys ("file01" and "file1", "b" and a full-width b): by their bytes, then as they were.
        const int byName = DwgList[a].m_strName.compare(DwgList[b].m_strName);
        if (byName != 0)
            return byName < 0;
        return a < b;
    });
    std::vector<DwgData> sorted;
    sorted.reserve(order.size());
    for (int i : order)
        sorted.push_back(std::move(DwgList[i]));
    for (int i = 0; i < count; ++i)
        DwgList[i] = std::move(sorted[i]);
}

void SortDwgList(int mode) {
    const int count = DwgList.GetSize();
    if (count == 0)
        return;
    DwgData* first = DwgList.GetData();
    DwgData* last = first + count;
    switch (mode) {
    case DwgSortByName:
        SortByName(ActiveNameCollation());
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

int CountListed(const std::string& name) {
    int listed = 0;
    const int count = DwgList.GetSize();
    for (int i = 0; i < count; ++i)
        if (DwgList[i].m_strName == name)
            ++listed;
    return listed;
}

DwgPrefixSearch FindByPrefix(const std::string& text) {
    DwgPrefixSearch result;
    const int count = DwgList.GetSize();
    if (text.empty() || count == 0)
        return result;
    result.ran = true;
    DeselectAllFlags();
    NameCollation& collation = ActiveNameCollation();
    for (int i = 0; i < count; ++i) {
        if (collation.StartsWith(DwgList[i].m_strName, text)) {
            result.match = i;
            DwgList[i].Select();
            break;
        }
    }
    return result;
}

int FindByPrefixIndex(const std::string& text) {
    return FindByPrefix(text).match;
}
