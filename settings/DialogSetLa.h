// "Folder settings": the modal dialog that edits a drawing folder's insertion parameters (layer, LISP
// command, colour) in the folder's "datains.ini".
//
// Use. SetFolder first (it refuses a folder whose settings file would not fit the path buffer, before
// copying anything), then DoModal. Accept deletes the file (box "Use current layer" checked, no command),
// keeps the dialog open with an alert (box clear, no layer name; or a layer name or command longer than
// the file reads back), or writes Layer, Lisp command and Color and keeps every other key the file had.
// The edits take no more than the file reads back; when typing or a paste reaches that, a note under them
// says so. After a write or a delete onChanged tells the owner, which
// shows the folder's layer again. A write or a delete that fails (a read-only, locked or unreadable
// file) leaves the file as it was, is said on the command line and in an alert, and keeps the dialog
// open with what the user entered.
//
// Ownership. The controls are dialog items subclassed by the members below; they go with the dialog.
#pragma once

#include "framework/afxwin.h"
#include "settings/IniFile.h"
#include "settings/FolderSettings.h"
#include "settings/StaticColor.h"

#include <functional>
#include <string>

class CDialogSetLa : public CDialog {
public:
    explicit CDialogSetLa(CWnd* parent = nullptr);

    // Copies the folder into the path buffer; false, and nothing copied, when the folder and
    // "\datains.ini" would not fit it.
    bool SetFolder(const std::string& folder);
    // The buffer: the folder, or the settings file's path once the dialog is initialised.
    const char* GetPathBuffer() const { return m_szPath; }

    // Set by the owner: the folder's file was written or deleted.
    std::function<void()> onChanged;

    bool OnInitDialog() override;
    void OnOK() override;

protected:
    bool OnCommand(WPARAM wParam, LPARAM lParam) override;

private:
    void OnUseCurrentLayer();
    bool UseCurrentLayer() const;
    void TellNotSaved();

    CIniFile m_IniFile;
    char m_szPath[kFolderPathBufferSize] = "";
    CEdit m_LispCommand;
    CStaticColor m_StaticColor;
    CEdit m_LayerName;
};

// The name of a folder as the folder settings caption shows it: its last part ("C:\Drawings\Doors"
// gives "Doors"), a drive's root as it is written.
std::string FolderCaptionName(const std::string& folder);
