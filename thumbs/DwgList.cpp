#include "thumbs/DwgList.h"

#include "hostapi/NarrowText.h"
#include "thumbs/NameCollation.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <utility>
#include <vector>

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

namespace {

// One record's place in the sort by name: the first 16 bytes of its key as two integers (most
// comparisons end there, without a look at the keys' buffer), then where the rest of its key lies.
struct NameSortEntry {
    std::uint64_t head[2];
    std::uint32_t start;  // of the whole key in the buffer
    std::uint32_t length; // of the whole key
    int index;            // of the record
};

std::uint64_t BigEndianAt(const std::string& keys, std::size_t at, std::size_t end) {
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < 8; ++i)
        value = (value << 8) | (at + i < end ? static_cast<unsigned char>(keys[at + i]) : 0u);
    return value;
}

} // namespace

void SortByName(NameCollation& collation) {
    const int count = DwgList.GetSize();
    // Every key once, side by side in one buffer: the sort then compares bytes, never the locale.
    std::string keys;
    keys.reserve(static_cast<std::size_t>(count) * 32);
    std::vector<NameSortEntry> entries(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i) {
        const std::size_t start = keys.size();
        collation.AppendSortKey(DwgList[i].m_strName, keys);
        NameSortEntry& e = entries[i];
        e.start = static_cast<std::uint32_t>(start);
        e.length = static_cast<std::uint32_t>(keys.size() - start);
        e.index = i;
    }
    // The heads once the buffer has stopped moving. A key shorter than a head is padded with zeros, which
    // no weight is; the lengths then tell "a" from "a" followed by a zero byte.
    for (NameSortEntry& e : entries) {
        const std::size_t end = e.start + e.length;
        e.head[0] = BigEndianAt(keys, e.start, end);
        e.head[1] = BigEndianAt(keys, e.start + 8, end);
    }
    const char* base = keys.data();
    std::sort(entries.begin(), entries.end(), [base](const NameSortEntry& a, const NameSortEntry& b) {
        if (a.head[0] != b.head[0])
            return a.head[0] < b.head[0];
        if (a.head[1] != b.head[1])
            return a.head[1] < b.head[1];
        if (a.length > 16 && b.length > 16) {
            const int rest =
                std::memcmp(base + a.start + 16, base + b.start + 16, std::min(a.length, b.length) - 16);
            if (rest != 0)
                return rest < 0;
        }
        if (a.length != b.length)
            return a.length < b.length;
        // Equal keys ("file01" and "file1", "b" and a full-width b): by their bytes, then as they were.
        const int byName = DwgList[a.index].m_strName.compare(DwgList[b.index].m_strName);
        if (byName != 0)
            return byName < 0;
        return a.index < b.index;
    });
    std::vector<DwgData> sorted;
    sorted.reserve(entries.size());
    for (const NameSortEntry& e : entries)
        sorted.push_back(std::move(DwgList[e.index]));
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
