// The drawing files of the current folder: one record per file and the one list the whole explorer
// shares, with the scan filter, the sort orders, the selection flags and the find-by-prefix of the
// search edit. Portable: no <windows.h>. The Windows side (file search, thumbnails, grid) calls this.
#pragma once

#include "framework/CArray.h"

#include <cstdint>
#include <string>
#include <vector>

// One entry of a folder search, as the runtime library's file search reports it.
struct DwgFindEntry {
    std::string name;
    bool isDirectory = false;
    std::int64_t timeWrite = 0; // seconds since 1970-01-01 UTC
    std::uint32_t size = 0;
};

// One drawing file of the current folder. The name is bare (relative to the current folder).
class DwgData {
public:
    DwgData() = default;
    explicit DwgData(const DwgFindEntry& found);
    explicit DwgData(DwgFindEntry&& found); // takes the name over: one allocation less per file
    DwgData(const DwgData&) = default;
    DwgData(DwgData&&) noexcept = default;
    DwgData& operator=(const DwgData&) = default;
    DwgData& operator=(DwgData&&) noexcept = default;
    virtual ~DwgData() = default;

    bool IsSelected() const { return m_bSelected != 0; }
    void Select() { m_bSelected = 1; }
    void Deselect() { m_bSelected = 0; }

    std::uint8_t m_bSelected = 0;
    std::string m_strName;
    std::int64_t m_timeWrite = 0;
    std::uint32_t m_nSize = 0;
};

using CDwgArray = CArray<DwgData, DwgData&>;

// The one list of the process, in display order.
extern CDwgArray DwgList;

// Grow step of the list while a scan appends to it.
constexpr int kDwgListGrowBy = 100;

// Sort modes, as the frame keeps them.
enum DwgSortMode { DwgSortByName = 0, DwgSortByDate = 1, DwgSortBySize = 2 };

// --- Folder scan ---------------------------------------------------------------------------------

// Decides whether one search entry becomes a record. Directories are passed over unless their name
// begins with "." (those go through the name test like files; kept on purpose). The name is
// lower-cased in place by the current C locale, then taken when it contains needle anywhere.
bool AcceptScanEntry(DwgFindEntry& entry, const char* needle);

// Empties the list (storage freed) and sets its grow step for the appends of a new scan.
void BeginScan();
// Appends one accepted entry.
void AppendScanEntry(const DwgFindEntry& entry);
// Appends a whole folder's records at once: the list grows by its step in one allocation instead of one
// step per hundred records (which copies the list over and over in a folder of many thousand files).
void AppendScanRecords(std::vector<DwgData>&& records);
// Releases the spare room once the last record is in.
void EndScan();

// Runs the scan rules over entries already listed (the file system's order). Returns 1 when there was
// at least one entry, 0 for none; the Windows scan gives the same answers.
int ScanEntries(const DwgFindEntry* entries, int count, const char* needle);

// --- Sorting -------------------------------------------------------------------------------------

// Byte-wise case-insensitive comparison; only ASCII letters fold. Negative, 0 or positive.
int CompareNoCaseAscii(const std::string& a, const std::string& b);

// Sorts every record but the last one by name (0), date (1) or size (2), ascending; the last record
// found by the scan stays last. Other modes leave the list as it is.
void SortDwgList(int mode);

// --- Selection and search ------------------------------------------------------------------------

// Clears m_bSelected on every record (the thumbnails' redraw is the caller's).
void DeselectAllFlags();
// True when any record is selected; false for an empty list.
bool AnySelected();

// What a search for a name prefix did.
struct DwgPrefixSearch {
    bool ran = false;   // false: empty text or empty list, nothing was touched
    int match = -1;     // index of the first match, -1 when none
    int nameIndex = -1; // record whose name becomes the current drawing (the match, else record 0)
};

// Searches for the first record whose name is strictly longer than text and starts with it, case
// ignored. When it runs it first clears every flag, then on a match clears record 0's flag and sets
// the match's. The caller then shows the match, sets the current name from nameIndex, the title and
// the pick button.
DwgPrefixSearch FindByPrefix(const std::string& text);
// Same search; the index of the match or -1.
int FindByPrefixIndex(const std::string& text);

#ifdef _WIN32
// Scans one folder with the runtime library's file search: makes path the current directory, lists
// "path\*" and fills DwgList with the entries AcceptScanEntry takes. 1 when the folder was read to its
// end, 0 when it could not be searched (the list is then empty).
int ScanFolderPath(const char* path, const char* needle);
#endif
