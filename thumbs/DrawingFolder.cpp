#include "thumbs/DrawingFolder.h"

#include "settings/Tessel3Doc.h"
#include "hostapi/NarrowText.h"
#include "thumbs/NameFold.h"

#include <utility>

namespace {

constexpr char kSeparator = '\\';
constexpr char kOtherSeparator = '/';

// True when the character is a one-byte separator ("\" or "/").
bool SeparatorAt(const std::string& text, const std::vector<std::size_t>& starts, std::size_t character) {
    const std::size_t start = starts[character];
    const std::size_t end = character + 1 < starts.size() ? starts[character + 1] : text.size();
    return end - start == 1 && (text[start] == kSeparator || text[start] == kOtherSeparator);
}

// "\\server\share" (a share's root, which keeps a separator at its end): two separators, a server name, a
// separator, a share name and nothing more.
bool IsShareRoot(const std::string& text, const std::vector<std::size_t>& starts) {
    if (starts.size() < 5 || !SeparatorAt(text, starts, 0) || !SeparatorAt(text, starts, 1))
        return false;
    int separators = 0;
    for (std::size_t c = 2; c < starts.size(); ++c) {
        if (SeparatorAt(text, starts, c)) {
            if (c == 2 || c + 1 == starts.size())
                return false; // no server name, or no share name
            ++separators;
        }
    }
    return separators == 1;
}

} // namespace

void RunFolderScan(FolderReader& reader, FolderScan& scan) {
    try {
        scan.read = reader.Read(scan.folder, scan.drawings, scan.problem, scan.progress);
    } catch (...) {
        // Out of memory in a folder of millions: nothing of it is shown.
        scan.read = false;
        scan.drawings.clear();
        scan.problem.clear();
    }
    scan.ended.store(true, std::memory_order_release);
}

void FolderReader::Start(const std::shared_ptr<FolderScan>& scan, unsigned) {
    RunFolderScan(*this, *scan);
}

DrawingFolder::DrawingFolder(FolderReader& reader, CTessel3Doc* document)
    : m_reader(reader), m_pDocument(document) {}

DrawingFolder::~DrawingFolder() {
    AbandonScan();
}

std::string DrawingFolder::Spelling(const std::string& folder) {
    std::string text = folder;
    std::vector<std::size_t> starts = CharacterStarts(text);
    // Separators at the end go, but for the one a root keeps.
    while (starts.size() > 1 && SeparatorAt(text, starts, starts.size() - 1)) {
        const bool driveRoot = starts.size() == 3 && text[1] == ':' && starts[2] == 2;
        if (driveRoot)
            break;
        text.erase(starts.back());
        starts.pop_back();
    }
    if (starts.size() == 2 && text.size() == 2 && text[1] == ':')
        text += kSeparator; // "C:" is C's current folder elsewhere; here it names the drive's root
    else if (IsShareRoot(text, starts))
        text += kSeparator;
    return text;
}

std::string DrawingFolder::Join(const std::string& folder, const std::string& name) {
    if (folder.empty())
        return name;
    return WithSeparator(folder) + name;
}

bool DrawingFolder::SameFolder(const std::string& a, const std::string& b) {
    const std::string one = Spelling(a);
    return !one.empty() && CompareNamesNoCase(one, Spelling(b)) == 0;
}

// ---- the folder shown ----------------------------------------------------------------------------------

bool DrawingFolder::Show(const std::string& folder) {
    // The same folder read again (F5, a file command): the drawing chosen stays chosen while it is there,
    // also when the read before this one had not ended yet.
    const std::string previous = m_strFolder;
    const std::string chosen = m_pScan ? m_strKeepChosen : ChosenName();
    AbandonScan();
    m_strFolder = Spelling(folder);
    const std::string keep = SameFolder(previous, m_strFolder) ? chosen : std::string();
    m_strProblem.clear();
    if (m_pDocument)
        m_pDocument->m_strPath = m_strFolder;
    if (m_strFolder.empty()) {
        m_bRead = false;
        Fill({});
        return false;
    }
    // The reader refuses a path the runtime's buffers cannot hold before anything uses it.
    auto scan = std::make_shared<FolderScan>(m_strFolder);
    m_reader.Start(scan, kQuickScanMs);
    if (scan->ended.load(std::memory_order_acquire)) {
        Accept(*scan, keep);
        return m_bRead;
    }
    // Shown as being read: nothing of the folder before stays in the list meanwhile.
    m_pScan = std::move(scan);
    m_strKeepChosen = keep;
    m_bRead = false;
    Fill({});
    return false;
}

int DrawingFolder::ScanCount() const {
    return m_pScan ? m_pScan->progress.found.load(std::memory_order_relaxed) : 0;
}

bool DrawingFolder::TakeEndedScan() {
    if (!m_pScan || !m_pScan->ended.load(std::memory_order_acquire))
        return false;
    const std::shared_ptr<FolderScan> scan = std::move(m_pScan);
    m_pScan.reset();
    const std::string keep = std::move(m_strKeepChosen);
    m_strKeepChosen.clear();
    Accept(*scan, keep);
    return true;
}

void DrawingFolder::Accept(FolderScan& scan, const std::string& keepChosen) {
    m_strProblem = std::move(scan.problem);
    m_bRead = scan.read;
    // Set here, on the thread that shows: the host's preview operation opens bare names against it.
    if (m_bRead)
        m_reader.MakeCurrentDirectory(m_strFolder);
    Fill(std::move(scan.drawings), keepChosen);
}

void DrawingFolder::AbandonScan() {
    if (!m_pScan)
        return;
    m_pScan->progress.abandoned.store(true, std::memory_order_relaxed);
    m_pScan.reset();
    m_strKeepChosen.clear();
}

bool DrawingFolder::Refresh() {
    if (m_strFolder.empty()) {
        ShowNoFolder();
        return false;
    }
    return Show(m_strFolder);
}

void DrawingFolder::ShowNoFolder() {
    AbandonScan();
    m_strProblem.clear();
    Fill({});
}

void DrawingFolder::Fill(std::vector<DwgData>&& drawings, const std::string& keepChosen) {
    m_nChosen = -1;
    if (m_pDocument)
        m_pDocument->m_strName.clear();
    BeginScan();
    AppendScanRecords(std::move(drawings));
    EndScan();
    if (!keepChosen.empty()) {
        for (int i = 0; i < Count() && m_nChosen < 0; ++i) {
            if (Drawing(i).m_strName == keepChosen) {
                DwgList[i].Select();
                m_nChosen = i;
                if (m_pDocument)
                    m_pDocument->m_strName = keepChosen;
            }
        }
    }
    TellShown();
    if (m_nChosen >= 0)
        TellChosen();
}

void DrawingFolder::TellShown() {
    if (onShown)
        onShown();
}

void DrawingFolder::TellChosen() {
    if (onChosen)
        onChosen();
}

// ---- the drawings --------------------------------------------------------------------------------------

int DrawingFolder::Count() const {
    return DwgList.GetSize();
}

const DwgData& DrawingFolder::Drawing(int index) const {
    return static_cast<const CDwgArray&>(DwgList)[index];
}

std::string DrawingFolder::PathOf(int index) const {
    if (index < 0 || index >= Count())
        return {};
    return Join(m_strFolder, Drawing(index).m_strName);
}

std::vector<std::string> DrawingFolder::SelectedPaths() const {
    std::vector<std::string> paths;
    for (int i = 0; i < Count(); ++i)
        if (Drawing(i).IsSelected())
            paths.push_back(PathOf(i));
    return paths;
}

int DrawingFolder::Find(const std::string& name) const {
    const NameFoldTable& fold = NameFold();
    for (int i = 0; i < Count(); ++i)
        if (CompareNamesNoCase(Drawing(i).m_strName, name, fold) == 0)
            return i;
    return -1;
}

int DrawingFolder::CountNamed(const std::string& name) const {
    return CountListed(name);
}

void DrawingFolder::Sort(int mode) {
    const std::string chosen = ChosenName();
    SortDwgList(mode);
    if (m_nChosen < 0)
        return;
    // The same drawing, wherever the sort put it (two of the same name are one to the user anyway).
    for (int i = 0; i < Count(); ++i) {
        if (Drawing(i).m_strName == chosen) {
            m_nChosen = i;
            return;
        }
    }
}

// ---- selection -----------------------------------------------------------------------------------------

bool DrawingFolder::IsSelected(int index) const {
    return index >= 0 && index < Count() && Drawing(index).IsSelected();
}

void DrawingFolder::Select(int index) {
    DwgList[index].Select();
}

void DrawingFolder::Deselect(int index) {
    DwgList[index].Deselect();
}

void DrawingFolder::SelectAll() {
    for (int i = 0; i < Count(); ++i)
        DwgList[i].Select();
}

void DrawingFolder::DeselectAll() {
    DeselectAllFlags();
}

bool DrawingFolder::AnySelected() const {
    return ::AnySelected();
}

DwgPrefixSearch DrawingFolder::SelectFirstStartingWith(const std::string& text) {
    return FindByPrefix(text);
}

// ---- the chosen drawing --------------------------------------------------------------------------------

void DrawingFolder::Choose(int index) {
    if (index < 0 || index >= Count()) {
        ChooseNone();
        return;
    }
    m_nChosen = index;
    if (m_pDocument)
        m_pDocument->m_strName = Drawing(index).m_strName;
    TellChosen();
}

void DrawingFolder::ChooseNone() {
    m_nChosen = -1;
    if (m_pDocument)
        m_pDocument->m_strName.clear();
    TellChosen();
}

std::string DrawingFolder::ChosenName() const {
    return m_nChosen >= 0 && m_nChosen < Count() ? Drawing(m_nChosen).m_strName : std::string();
}

std::string DrawingFolder::ChosenPath() const {
    return PathOf(m_nChosen);
}
