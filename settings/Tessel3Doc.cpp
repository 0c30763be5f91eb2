#include "settings/Tessel3Doc.h"

#include "settings/SettingsPath.h"

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
    if (g_pTessel3Doc == this)
        g_pTessel3Doc = nullptr;
}

void CTessel3Doc::Load(const std::string& settingsFile) {
    // No name: the settings file could not be named (that has been reported); defaults, nothing saved.
    m_bSaveOnClose = !settingsFile.empty();
    m_IniFile.SetPath(settingsFile);
    if (m_bSaveOnClose && m_IniFile.ReadFile()) {
        m_strPath = m_IniFile.GetValue(kSectionCurrentPath, "Path");
        m_strName = m_IniFile.GetValue(kSectionCurrentPath, "Name");
        m_strShellPath = m_IniFile.GetValue(kSectionCurrentPath, "ShellPath");
        m_nSplitterSize = LenientInt(m_IniFile.GetValue(kSectionSize, "SplitterSize"));
        m_nWindowWidth = LenientInt(m_IniFile.GetValue(kSectionSize, "WindowWidth"));
        m_nWindowHeight = LenientInt(m_IniFile.GetValue(kSectionSize, "WindowHeight"));
        m_nPictureWidth = LenientInt(m_IniFile.GetValue(kSectionView, "PictureWidth"));
        m_nPictureHeight = LenientInt(m_IniFile.GetValue(kSectionView, "PictureHeight"));
        m_nSort = LenientInt(m_IniFile.GetValue(kSectionView, "Sort"));
        const int cacheMiB = LenientInt(m_IniFile.GetValue(kSectionView, "PictureCacheMiB"));
        if (cacheMiB >= 1 && cacheMiB <= 1024)
            m_nPictureCacheMiB = cacheMiB;
    }
    if (m_nSplitterSize == 0)
        m_nSplitterSize = kDefaultSplitterSize;
}

void CTessel3Doc::Save() {
    if (!m_bSaveOnClose)
        return;
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
