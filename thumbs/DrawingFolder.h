// The folder the explorer shows, its drawings and the drawing the user has chosen, in one place.
//
// One object per explorer call, owned by the application object that opens the explorer. The tree,
// the grid, its thumbnails, the frame, the file commands, the run dialog and the LISP function ask it;
// it tells its owner what changed through two handlers, and the owner passes that on.
//
// Who writes what:
// - Show (and Refresh, which shows the same folder again) is the only scan: it alone fills the drawing
//   list, changes the process's current directory and writes the document's folder (`Path`).
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

#include <functional>
#include <string>
#include <vector>

class CTessel3Doc;

// How a folder's drawings are listed and how a folder becomes the process's current directory: the
// runtime's file search in the library, lists in memory in the tests.
class FolderReader {
public:
    virtual ~FolderReader() = default;
    // Lists folder's drawings by the scan's rules (AcceptScanEntry), in the file system's order. False
    // when the folder could not be read. problem receives what the user should be told (a refused path,
    // files left out), or stays empty.
    virtual bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem) = 0;
    // Makes folder the process's current directory: the host's preview operation opens bare names.
    virtual void MakeCurrentDirectory(const std::string& folder) = 0;
};

class DrawingFolder {
public:
    // document may be null (nothing is kept between runs then).
    DrawingFolder(FolderReader& reader, CTessel3Doc* document);
    DrawingFolder(const DrawingFolder&) = delete;
    DrawingFolder& operator=(const DrawingFolder&) = delete;

    // Set by the owner. onShown: the list was filled anew (a folder shown, or none). onChosen: the chosen
    // drawing changed (a drawing chosen, or none).
    std::function<void()> onShown;
    std::function<void()> onChosen;

    // Reads folder and shows it: the list holds its drawings (unsorted), nothing is chosen or selected,
    // the folder becomes the current directory and the document's folder. A folder that cannot be read
    // is still the folder shown, with an empty list; the current directory stays where it was. True
    // when the folder was read.
    bool Show(const std::string& folder);
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
    void Fill(std::vector<DwgData>&& drawings, const std::string& keepChosen = std::string());
    void TellShown();
    void TellChosen();

    FolderReader& m_reader;
    CTessel3Doc* m_pDocument;
    std::string m_strFolder;
    std::string m_strProblem;
    bool m_bRead = false;
    int m_nChosen = -1;
};

#ifdef _WIN32
// The runtime's file search, and SetCurrentDirectory.
class FileSystemFolderReader : public FolderReader {
public:
    bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem) override;
    void MakeCurrentDirectory(const std::string& folder) override;
};
#endif
