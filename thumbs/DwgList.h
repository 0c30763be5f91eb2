// The drawing files of the current folder: one record per file and the one list the whole explorer
// shares, with the scan filter, the sort orders, the selection flags and the find-by-prefix of the
// search edit. Portable: no <windows.h>. The Windows side (file search, thumbnails, grid) calls this.
#pragma once

#include "framework/CArray.h"
#include "thumbs/NameFold.h"

#include <cstdint>
#include <string>
#include <vector>

// One entry of a folder search, as the runtime library's file search reports it.
struct DwgFindEntry {
    std::string name;
    bool isDirectory = false;
    std::int64_t timeWrite = 0; // seconds since 1970-01-01 UTC
    std::uint64_t size = 0;     // bytes: files of 2 GiB and more are drawings too
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
    std::uint64_t m_nSize = 0;
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
// lower-cased in place through the code page's fold table, then taken when it contains needle anywhere.
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

// What a file name must contain to be listed.
constexpr const char* kDrawingNeedle = ".dwg";

// Longest path the runtime library's file functions take: MAX_PATH less the terminator.
constexpr std::size_t kMaxPathChars = 259;

// Why a folder cannot be scanned, or empty when it can: its search pattern (the folder, "\", "*") must
// fit the runtime's path buffers, so a longer path is refused before anything is copied or searched.
std::string FolderPathProblem(const std::string& folder);
// True when the file's full path (folder, "\", name) fits the path buffers: the thumbnails open it by
// its bare name against the current directory, which cannot reach a longer one.
bool FullPathFits(const std::string& folder, const std::string& name);
// What the scan says when it left out files whose full path is too long; empty for none.
std::string SkippedFilesMessage(int skipped);

// --- Sorting -------------------------------------------------------------------------------------

// Sorts every record by name (0), date (1) or size (2), ascending. Other modes leave the list as it is.
// By name: the collation's order (ActiveNameCollation: the user's locale, case and width ignored, runs of
// digits by value); names with equal keys by their bytes, and the same names as they were.
void SortDwgList(int mode);

class NameCollation;
// The sort by name with the keys of collation, each built once.
void SortByName(NameCollation& collation);

// --- Selection and search ------------------------------------------------------------------------

// Clears m_bSelected on every record (the thumbnails' redraw is the caller's).
void DeselectAllFlags();
// True when any record is selected; false for an empty list.
bool AnySelected();

// How many records carry exactly this name: more than one when the folder holds names that differ only
// in case, or names the code page turned into the same one.
int CountListed(const std::string& name);

// What a search for a name prefix did.
struct DwgPrefixSearch {
    bool ran = false; // false: empty text or empty list, nothing was touched
    int match = -1;   // index of the first match, -1 when none
};

// Searches for the first record whose name starts with text (a whole name matches too), case and width
// ignored, character by character as the name collation tells them apart. When it runs it first clears every
// flag, then sets the match's. The caller then shows the match and makes it the current drawing, or, without
// a match, leaves none current.
DwgPrefixSearch FindByPrefix(const std::string& text);
// Same search; the index of the match or -1.
int FindByPrefixIndex(const std::string& text);

#ifdef _WIN32
// Whether the drawing folder\name, as the scan listed it, can be handed back as a path that names that
// one file.
enum class PickedName {
    Exact,         // one file of the folder is listed under this name, and its name is the path's
    Missing,       // no file of the folder is listed under it (deleted, moved, or never a file)
    NotInCodePage, // a file listed under it has a name the system's code page cannot hold: the path
                   // would name no file, or another one whose name looks alike
    Ambiguous,     // several files are listed under it (names that differ only in case)
};
// Reads the folder's names as the file system holds them (wide) and looks for those the scan turns
// into name. Costs one listing of the folder: for a pick, not for every file.
PickedName CheckPickedName(const std::string& folder, const std::string& name);
// What the status bar says of a folder the scan could not open: it is a file, it does not exist, access
// is denied, or it cannot be reached (a drive not ready, a network share gone); error: the system's.
std::string UnreadableFolderMessage(const std::string& folder, bool existsAsFile, unsigned long error);
#endif
