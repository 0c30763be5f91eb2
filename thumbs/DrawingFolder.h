// The folder the explorer shows, its drawings and the drawing the user has chosen, in one place.
//
// One object per explorer call, owned by the application object that opens the explorer. The tree,
// the grid, its thumbnails, the frame, the file commands, the run dialog and the LISP function ask it;
// it tells its owner what changed through two handlers, and the owner passes that on.
//
// Who writes what:
// - Show (and Refresh, which shows the same folder again) is the only scan: it alone fills the drawing
//   list, changes the process's current directory and writes the document's folder (`Path`). A scan that
//   has not ended within kQuickScanMs goes on on a thread of its own: the list stays empty meanwhile
//   (IsScanning, ScanCount), and TakeEndedScan, on this thread, fills it once the scan has ended. A later
//   Show, ShowNoFolder or the model's end abandons it: its result is never shown.
// - Choose and ChooseNone alone change the chosen drawing, and with it the document's `Name`.
// - The selection flags of the records are set and cleared through Select, Deselect, SelectAll,
//   DeselectAll and SelectFirstStartingWith; sorting goes through Sort.
// - ChosenPath and PathOf are the only places a folder and a drawing's name are put together.
//
// The folder is kept in one spelling, the one the system gives the current directory: no separator at
// the end except where it is part of a root ("C:\", "\\server\share\"). A separator ("\" or "/") is found
// by character in the names' code page, never taken from the second byte of a double-byte character.
// Portable: no <windows.h>; the Windows file search comes in through FolderReader.
#pragma once

#include "thumbs/DwgList.h"

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

class CTessel3Doc;

// What the thread that reads a folder and the thread that shows it share while the read goes on.
struct ScanProgress {
    // Set by the thread that shows: the read stops at its next entry, and its result is dropped.
    std::atomic<bool> abandoned{false};
    // Drawings taken so far, written by the reader: the status bar counts them.
    std::atomic<int> found{0};
};

// One read of a folder, shared by the thread that reads it and the one that shows it; whoever lets go
// last frees it. The result is written by the reading thread only, before `ended` is set, and read by
// the showing thread only after it has seen `ended`.
struct FolderScan {
    explicit FolderScan(std::string folderToRead) : folder(std::move(folderToRead)) {}
    const std::string folder;
    ScanProgress progress;
    std::atomic<bool> ended{false};
    bool read = false;
    std::vector<DwgData> drawings;
    std::string problem;
};

// How a folder's drawings are listed and how a folder becomes the process's current directory: the
// system's file search in the library, lists in memory in the tests.
class FolderReader {
public:
    virtual ~FolderReader() = default;
    // Lists folder's drawings by the scan's rules (AcceptScanEntry), in the file system's order. False
    // when the folder could not be read, or when progress says it was abandoned. problem receives what
    // the user should be told (a refused path, files left out), or stays empty. May run on any thread.
    virtual bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem,
                      ScanProgress& progress) = 0;
    // Makes folder the process's current directory: the host's preview operation opens bare names.
    virtual void MakeCurrentDirectory(const std::string& folder) = 0;
    // Reads scan's folder (Read) and sets its `ended`; returns once it has ended or waitMs have passed,
    // whichever comes first. This one reads on the caller's thread; the library's reads on a thread of
    // its own.
    virtual void Start(const std::shared_ptr<FolderScan>& scan, unsigned waitMs);
};

// Runs the reader's Read for scan and sets `ended`, whatever happens (nothing is thrown out of it).
void RunFolderScan(FolderReader& reader, FolderScan& scan);

class DrawingFolder {
public:
    // document may be null (nothing is kept between runs then).
    // How long Show waits for a scan before the explorer shows the folder as being read.
    static constexpr unsigned kQuickScanMs = 150;

    // document may be null (nothing is kept between runs then).
    DrawingFolder(FolderReader& reader, CTessel3Doc* document);
    // A scan still going on is abandoned.
    ~DrawingFolder();
    DrawingFolder(const DrawingFolder&) = delete;
    DrawingFolder& operator=(const DrawingFolder&) = delete;

    // Set by the owner. onShown: the list was filled anew (a folder shown, or none). onChosen: the chosen
    // drawing changed (a drawing chosen, or none).
    std::function<void()> onShown;
    std::function<void()> onChosen;

    // Reads folder and shows it: the list holds its drawings (unsorted), nothing is chosen or selected,
    // the folder becomes the current directory and the document's folder. A folder that cannot be read
    // is still the folder shown, with an empty list; the current directory stays where it was. True
    // when the folder was read. A scan that takes longer than kQuickScanMs is left running: the folder
    // is the one shown, with an empty list, IsScanning is true and Show returns false; TakeEndedScan
    // shows its drawings later. A scan still going on from before is abandoned.
    bool Show(const std::string& folder);
    // Whether a scan of the folder shown is still going on.
    bool IsScanning() const { return m_pScan != nullptr; }
    // The drawings the scan going on has found so far (0 when none goes on).
    int ScanCount() const;
    // When the scan going on has ended, shows its result as Show would have (onShown is told) and
    // returns true; else false. Called on the thread that shows, from its timer.
    bool TakeEndedScan();
    // Reads the folder shown again (after a file command, or F5).
    bool Refresh();
    // Shows no folder (the tree's Desktop or My Computer): an empty list, nothing chosen; the folder, the
    // current directory and the document keep what they had.
    void ShowNoFolder();

    // The folder shown, in its one spelling; empty before the first Show.
    const std::string& Folder() const { return m_strFolder; }
    // What the last Show has to tell the user (a refused path, files left out), or empty.
    const std::string& Problem() const { return m_strProblem; }
    // Whether the last Show read its folder (false too while no folder has been shown).
    bool IsRead() const { return m_bRead; }

    int Count() const;
    // The drawing at index (display order). Outside the list: the invalid-argument error.
    const DwgData& Drawing(int index) const;
    // The full path of the drawing at index; empty outside the list.
    std::string PathOf(int index) const;
    // The full paths of the selected drawings, in display order.
    std::vector<std::string> SelectedPaths() const;
    // The index of the drawing named name (case ignored), or -1.
    int Find(const std::string& name) const;
    // How many drawings carry exactly this name (more than one: names differing only in case, or names
    // the code page turned into the same one).
    int CountNamed(const std::string& name) const;

    // Sorts by name (0), date (1) or size (2); the chosen drawing stays chosen wherever it goes.
    void Sort(int mode);

    bool IsSelected(int index) const;
    void Select(int index);
    void Deselect(int index);
    void SelectAll();
    void DeselectAll();
    bool AnySelected() const;
    // The search as you type: clears every selection, then selects the first drawing whose name starts
    // with text (case ignored). The index selected, or -1; nothing happens for an empty text or list.
    DwgPrefixSearch SelectFirstStartingWith(const std::string& text);

    // Makes the drawing at index the chosen one (the one accept returns). Outside the list: none.
    void Choose(int index);
    void ChooseNone();
    // The chosen drawing's index, or -1.
    int Chosen() const { return m_nChosen; }
    // The chosen drawing's name, or empty.
    std::string ChosenName() const;
    // The chosen drawing's full path, or empty when none is chosen.
    std::string ChosenPath() const;

    // The one spelling of a folder path (see above): "C:\x\" gives "C:\x", "C:" and "C:\\" give "C:\".
    static std::string Spelling(const std::string& folder);
    // A name inside folder, folder being in its one spelling.
    static std::string Join(const std::string& folder, const std::string& name);
    // Whether two paths name the same folder as written: case and a separator at the end aside.
    static bool SameFolder(const std::string& a, const std::string& b);

private:
    // keepChosen: the name of a drawing that stays chosen (and selected) if it is still there.
    void Accept(FolderScan& scan, const std::string& keepChosen = std::string());
    void AbandonScan();
    void Fill(std::vector<DwgData>&& drawings, const std::string& keepChosen = std::string());
    void TellShown();
    void TellChosen();

    FolderReader& m_reader;
    CTessel3Doc* m_pDocument;
    std::string m_strFolder;
    std::string m_strProblem;
    bool m_bRead = false;
    int m_nChosen = -1;
    std::shared_ptr<FolderScan> m_pScan; // the scan going on, shared with its thread
    std::string m_strKeepChosen;         // the drawing chosen again when that scan ends (F5 during it)
};

#ifdef _WIN32
// The system's file search, and SetCurrentDirectory. Start reads on a thread of its own that holds its
// own reference on the library: a scan left running when the call returns (a million files, a share that
// stopped answering) ends by itself, at its next entry, and cannot run code that was unloaded. The
// reader keeps nothing of a scan: it may go before the scans it started.
class FileSystemFolderReader : public FolderReader {
public:
    bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem,
              ScanProgress& progress) override;
    void MakeCurrentDirectory(const std::string& folder) override;
    void Start(const std::shared_ptr<FolderScan>& scan, unsigned waitMs) override;
};
#endif
