#include "settings/DialogSetLa.h"

#include "hostapi/HostApi.h"
#include "hostapi/NarrowText.h"
#include "hostapi/TextConv.h"
#include "settings/SettingsReport.h"
#include "res/resource.h"

#include <cstring>
#include <string>

namespace {

bool RemovalFailureIsHarmless(DWORD error) {
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
}

std::string RemovalFailureReason(const char* file, DWORD error) {
    const DWORD attributes = ::GetFileAttributesA(file);
    if (attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY))
        return "it is read-only";
    if (error == ERROR_SHARING_VIOLATION || error == ERROR_LOCK_VIOLATION)
        return "it is in use by another program";
    if (error == ERROR_ACCESS_DENIED)
        return "access was denied";
    return "Windows error " + std::to_string(error);
}

} // namespace

std::string FolderCaptionName(const std::string& folder) {
    // The folder's own name, as the tree shows it: a whole path would not fit the caption and would cut
    // off just that name. A drive's root has no name of its own: the path it is.
    std::string path = folder;
    while (path.size() > 1 && EndsWithSeparator(path))
        path.pop_back(); // a separator is one byte
    const auto separator = LastSeparator(path);
    if (separator == std::string::npos || separator + 1 >= path.size() || path.back() == ':')
        return folder;
    return path.substr(separator + 1);
}

CDialogSetLa::CDialogSetLa(CWnd* parent) : CDialog(IDD_SETLA, parent) {}

void CDialogSetLa::TellNotSaved() {
    // The dialog stays with what the user entered: Accept again once the file is free, or Cancel.
    ::acedAlert(WidenAnsi(FolderSettingsNotSavedAlert(m_szPath)).c_str());
}

bool CDialogSetLa::SetFolder(const std::string& folder) {
    if (!FolderSettingsPathFits(folder))
        return false;
    std::memcpy(m_szPath, folder.c_str(), folder.size() + 1);
    return true;
}

bool CDialogSetLa::OnInitDialog() {
    CDialog::OnInitDialog();
    // The settings are the folder's own: the caption says which folder they belong to.
    SetWindowText("Folder settings - " + FolderCaptionName(m_szPath));
    m_LispCommand.SubclassDlgItem(IDC_SETLA_COMMAND, this);
    m_StaticColor.SubclassDlgItem(IDC_SETLA_COLOR, this);
    m_LayerName.SubclassDlgItem(IDC_SETLA_LAYER, this);
    // No more than the file reads back: typing stops there and a paste is cut, with a note saying so.
    m_LispCommand.LimitText(MaxFolderCommandChars());
    m_LayerName.LimitText(MaxFolderLayerChars());

    // SetFolder made sure the file name fits behind the folder.
    const std::string file = FolderSettingsFilePath(m_szPath);
    std::memcpy(m_szPath, file.c_str(), file.size() + 1);
    m_IniFile.SetPath(m_szPath);
    const bool read = m_IniFile.ReadFile();

    const FolderSettingsView view = ReadFolderSettingsView(m_IniFile, read);
    CheckDlgButton(IDC_SETLA_USE_CURRENT, view.useCurrentLayer ? BST_CHECKED : BST_UNCHECKED);
    m_LayerName.EnableWindow(view.layerEditEnabled);
    m_StaticColor.EnableWindow(view.swatchEnabled);
    if (!view.layer.empty())
        m_LayerName.SetWindowText(view.layer);
    if (view.colorFromFile)
        m_StaticColor.SetColorIndex(view.colorIndex);
    if (read)
        m_LispCommand.SetWindowText(view.command);
    return true;
}

bool CDialogSetLa::UseCurrentLayer() const {
    return IsDlgButtonChecked(IDC_SETLA_USE_CURRENT) == BST_CHECKED;
}

void CDialogSetLa::OnUseCurrentLayer() {
    const bool own = !UseCurrentLayer();
    m_LayerName.EnableWindow(own);
    m_StaticColor.EnableWindow(own);
}

bool CDialogSetLa::OnCommand(WPARAM wParam, LPARAM lParam) {
    if (LOWORD(wParam) == IDC_SETLA_USE_CURRENT && HIWORD(wParam) == BN_CLICKED) {
        OnUseCurrentLayer();
        return true;
    }
    if (HIWORD(wParam) == EN_MAXTEXT &&
        (LOWORD(wParam) == IDC_SETLA_COMMAND || LOWORD(wParam) == IDC_SETLA_LAYER)) {
        SetDlgItemText(IDC_SETLA_LIMIT_NOTE,
                       LOWORD(wParam) == IDC_SETLA_COMMAND ? CommandLimitNote() : LayerLimitNote());
        return true;
    }
    return CDialog::OnCommand(wParam, lParam);
}

void CDialogSetLa::OnOK() {
    const std::string command = m_LispCommand.GetWindowText();
    const bool useCurrent = UseCurrentLayer();
    const std::string layer = useCurrent ? std::string() : m_LayerName.GetWindowText();
    switch (DecideFolderSettingsAccept(useCurrent, layer, command)) {
    case FolderSettingsAction::DeleteFile:
        // A folder without the file is what is asked for: one that is not there already is fine.
        if (!::DeleteFileA(m_szPath) && !RemovalFailureIsHarmless(::GetLastError())) {
            ReportSettingsProblem("\nOrvex: " + std::string(m_szPath) +
                                  " was not removed: " + RemovalFailureReason(m_szPath, ::GetLastError()) +
                                  "; the file is left as it was\n");
            TellNotSaved();
            return;
        }
        if (onChanged)
            onChanged();
        EndDialog(IDOK);
        return;
    case FolderSettingsAction::AskLayer:
        ::acedAlert(WidenAnsi(kLayerNameEmptyAlert).c_str());
        m_LayerName.SetFocus();
        return;
    case FolderSettingsAction::LayerTooLong:
        ::acedAlert(WidenAnsi(LayerTooLongAlert(layer)).c_str());
        m_LayerName.SetFocus();
        return;
    case FolderSettingsAction::CommandTooLong:
        ::acedAlert(WidenAnsi(CommandTooLongAlert(command)).c_str());
        m_LispCommand.SetFocus();
        return;
    case FolderSettingsAction::Write:
        break;
    }
    if (!WriteFolderSettings(m_IniFile, m_szPath, layer, command, m_StaticColor.GetColorIndex())) {
        TellNotSaved(); // the store has said why on the command line
        return;
    }
    if (onChanged)
        onChanged();
    EndDialog(IDOK);
}
