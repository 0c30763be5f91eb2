// The explorer's document: the settings the explorer keeps between runs. The constructor loads them
// from the settings file, the explorer reads and changes the fields while it runs, and the destructor
// writes them back. Portable: no <windows.h>.
#pragma once

#include "framework/afxdoc.h"
#include "settings/IniFile.h"

#include <string>

class CTessel3Doc : public CDocument {
public:
    // Loads the settings file beside the extension module (ExplorerSettingsPath); an empty name (the
    // module's folder is too long) gives the defaults and saves nothing.
    CTessel3Doc();
    // Loads the given settings file.
    explicit CTessel3Doc(const std::string& settingsFile);
    // Saves the fields into the file. A file that cannot be written, or that was not read whole (too
    // large, a line too long, unreadable), is left as it was, and the reporter says so.
    ~CTessel3Doc() override;

    std::string m_strPath;      // current folder of the browser          [CurrentPath] Path
    std::string m_strName;      // selected drawing within m_strPath       [CurrentPath] Name
    std::string m_strShellPath; // folder selected in the shell tree        [CurrentPath] ShellPath
    int m_nSplitterSize = 0;    // width of the left pane, 100 when unset  [Size] SplitterSize
    int m_nWindowWidth = 0;     // frame width, 0 keeps the created size   [Size] WindowWidth
    int m_nWindowHeight = 0;    //                                          [Size] WindowHeight
    int m_nPictureWidth = 0;    // thumbnail picture size, used when both  [View] PictureWidth
    int m_nPictureHeight = 0;   // are non-zero                            [View] PictureHeight
    int m_nSort = 0;            // 0 name, 1 date, 2 size                  [View] Sort
    // The bound of the decoded pictures kept in memory, in MiB (1 to 1024; [View] PictureCacheMiB). Only
    // read: a key the user set stays in the file as written, like any key the explorer does not change.
    int m_nPictureCacheMiB = kDefaultPictureCacheMiB;
    static constexpr int kDefaultPictureCacheMiB = 64;

    // Kept for the document's lifetime so keys the explorer does not know survive the save.
    CIniFile m_IniFile;
    // False when the settings file could not be named: the explorer then runs with defaults only.
    bool m_bSaveOnClose = true;

private:
    void Load(const std::string& settingsFile);
    void Save();
};

// The explorer document of the current call: set by the constructor, cleared by the destructor of the
// document it points to. The host reaches the document through it; windows get theirs from their
// creation context.
extern CTessel3Doc* g_pTessel3Doc;
