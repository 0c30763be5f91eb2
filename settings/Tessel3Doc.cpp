#include "settings/Tessel3Doc.h"

#include "settings/SettingsPath.h"

#include <cstdlib>

CTessel3Doc* g_pTessel3Doc = nullptr;

namespace {

constexpr const char kSectionCurrentPath[] = "CurrentPath";
constexpr const char kSectionSize[] = "Size";
constexpr const char kSectionView[] = "View";

constexpr int kDefaultSplitterSize = 100;

} // namespace

CTessel3Doc::CTessel3Doc() {
    g_pTessel3Doc = this;
    Load(ExplorerSettingsPath());
}

CTessel3Doc::CTessel3Doc(const std::string& settingsFile) {
    g_pTessel3Doc = this;
    Load(settingsFile);
}

CTessel3Doc::~CTessel3Doc() {
    // The settings are not worth an exception escaping a destructor: a failed save is lost quietly.
    try {
        Save();
    } catch (...) {
    }
}

void CTessel3Doc::Load(const std::string& settingsFile) {
    m_IniFile.SetPath(settingsFile);
    if (m_IniFile.ReadFile()) {
        m_strPath = m_IniFile.GetValue(kSectionCurrentPath, "Path");
        m_strName = m_IniFile.GetValue(kSectionCurrentPath, "Name");
        m_strShellPath = m_IniFile.GetValue(kSectionCurrentPath, "ShellPath");
        m_nSplitterSize = std::atoi(m_IniFile.GetValue(kSectionSize, "SplitterSize").c_str());
        m_nWindowWidth = std::atoi(m_IniFile.GetValue(kSectionSize, "WindowWidth").c_str());
        m_nWindowHeight = std::atoi(m_IniFile.GetValue(kSectionSize, "WindowHeight").c_str());
        m_nPictureWidth = std::atoi(m_IniFile.GetValue(kSectionView, "PictureWidth").c_str());
        m_nPictureHeight = std::atoi(m_IniFile.GetValue(kSectionView, "PictureHeight").c_str());
        m_nSort = std::atoi(m_IniFile.GetValue(kSectionView, "Sort").c_str());
    }
    if (m_nSplitterSize == 0)
        m_nSplitterSize = kDefaultSplitterSize;
}

void CTessel3Doc::Save() {
    m_IniFile.SetValue(kSectionCurrentPath, "Path", m_strPath, true);
    m_IniFile.SetValue(kSectionCurrentPath, "Name", m_strName, true);
    m_IniFile.SetValue(kSectionCurrentPath, "ShellPath", m_strShellPath, true);
    m_IniFile.SetValueI(kSectionSize, "SplitterSize", m_nSplitterSize, true);
    m_IniFile.SetValueI(kSectionSize, "WindowWidth", m_nWindowWidth, true);
    m_IniFile.SetValueI(kSectionSize, "WindowHeight", m_nWindowHeight, true);
    m_IniFile.SetValueI(kSectionView, "PictureWidth", m_nPictureWidth, true);
    m_IniFile.SetValueI(kSectionView, "PictureHeight", m_nPictureHeight, true);
    m_IniFile.SetValueI(kSectionView, "Sort", m_nSort, true);
    m_IniFile.WriteFile();
}
