#include "settings/DialogSetLa.h"

#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"
#include "res/resource.h"

#include <cstring>

CDialogSetLa::CDialogSetLa(CWnd* parent) : CDialog(IDD_SETLA, parent) {}

bool CDialogSetLa::SetFolder(const std::string& folder) {
    if (!FolderSettingsPathFits(folder))
        return false;
    std::memcpy(m_szPath, folder.c_str(), folder.size() + 1);
    return true;
}

bool CDialogSetLa::OnInitDialog() {
    CDialog::OnInitDialog();
    m_LispCommand.SubclassDlgItem(IDC_SETLA_COMMAND, this);
    m_StaticColor.SubclassDlgItem(IDC_SETLA_COLOR, this);
    m_LayerName.SubclassDlgItem(IDC_SETLA_LAYER, this);

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
    return CDialog::OnCommand(wParam, lParam);
}

void CDialogSetLa::OnOK() {
    const std::string command = m_LispCommand.GetWindowText();
    const bool useCurrent = UseCurrentLayer();
    const std::string layer = useCurrent ? std::string() : m_LayerName.GetWindowText();
    switch (DecideFolderSettingsAccept(useCurrent, layer, command)) {
    case FolderSettingsAction::DeleteFile:
        ::DeleteFileA(m_szPath); // a folder without the file is what is asked for
        if (onChanged)
            onChanged();
        EndDialog(IDOK);
        return;
    case FolderSettingsAction::AskLayer:
        ::acedAlert(WidenAnsi(kLayerNameEmptyAlert).c_str());
        m_LayerName.SetFocus();
        return;
    case FolderSettingsAction::Write:
        break;
    }
    WriteFolderSettings(m_IniFile, m_szPath, layer, command, m_StaticColor.GetColorIndex());
    if (onChanged)
        onChanged();
    EndDialog(IDOK);
}
