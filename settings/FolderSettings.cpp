#include "settings/FolderSettings.h"

#include "hostapi/NarrowText.h"
#include "settings/IniFile.h"

#include <cstdio>

std::string FolderSettingsFilePath(const std::string& folder) {
    return folder + "\\" + kFolderSettingsFile;
}

bool FolderSettingsPathFits(const std::string& folder) {
    return FolderSettingsFilePath(folder).size() < static_cast<std::size_t>(kFolderPathBufferSize);
}

std::string FolderPathTooLongMessage(const std::string& folder) {
    // The dialog's buffer holds bytes: a double-byte character takes two.
    const std::string path = FolderSettingsFilePath(folder);
    const bool multiByte = CharacterCount(path) != path.size();
    return "The folder's path is too long for its settings (" + CharactersAndBytes(path) + " with \\" +
           kFolderSettingsFile + ", at most " + std::to_string(kFolderPathBufferSize - 1) +
           (multiByte ? " bytes" : "") + "); they cannot be edited here:\n" + folder;
}

std::string FolderSettingsNotSavedAlert(const std::string& filePath) {
    return "The folder settings were not saved; the command line says why. The file is left as it was:\n" +
           filePath;
}

FolderSettingsView ReadFolderSettingsView(CIniFile& store, bool fileRead) {
    FolderSettingsView view;
    if (!fileRead)
        return view; // the defaults: box checked, layer edit disabled, swatch enabled and untouched
    view.layer = store.GetValue(kFolderSettingsSection, kFolderSettingsLayer);
    view.command = store.GetValue(kFolderSettingsSection, kFolderSettingsCommand);
    if (view.layer.empty()) {
        view.useCurrentLayer = true;
        view.layerEditEnabled = false;
        view.swatchEnabled = false;
    } else {
        view.useCurrentLayer = false;
        view.layerEditEnabled = true;
        view.swatchEnabled = true;
        view.colorFromFile = true;
        view.colorIndex = store.GetValueI(kFolderSettingsSection, kFolderSettingsColor);
        // A hand-edited number outside the palette would reach the host's colour table as an index:
        // it reads as a missing colour does.
        if (view.colorIndex < 0 || view.colorIndex > 255)
            view.colorIndex = 0;
    }
    return view;
}

int MaxFolderLayerChars() {
    return MaxIniValueChars(kFolderSettingsLayer);
}

int MaxFolderCommandChars() {
    return MaxIniValueChars(kFolderSettingsCommand);
}

// The settings file's lines are bounded in bytes: text with double-byte characters is told both lengths
// and the bound in bytes.
std::string CommandTooLongAlert(const std::string& command) {
    const bool bytes = CharacterCount(command) != command.size();
    return "The LISP command is " + CharactersAndBytes(command) +
           " long; the folder's settings hold at most " + std::to_string(MaxFolderCommandChars()) +
           (bytes ? " bytes" : "") + ". Shorten it, then Accept again.";
}

std::string LayerTooLongAlert(const std::string& layer) {
    const bool bytes = CharacterCount(layer) != layer.size();
    return "The layer name is " + CharactersAndBytes(layer) + " long; the folder's settings hold at most " +
           std::to_string(MaxFolderLayerChars()) + (bytes ? " bytes" : "") +
           ". Shorten it, then Accept again.";
}

std::string CommandLimitNote() {
    return "The command holds at most " + std::to_string(MaxFolderCommandChars()) +
           " characters; the rest was not taken.";
}

std::string LayerLimitNote() {
    return "The layer name holds at most " + std::to_string(MaxFolderLayerChars()) +
           " characters; the rest was not taken.";
}

FolderSettingsAction DecideFolderSettingsAccept(bool useCurrentLayer, const std::string& layer,
                                                const std::string& command) {
    if (useCurrentLayer && command.empty())
        return FolderSettingsAction::DeleteFile;
    if (!useCurrentLayer && layer.empty())
        return FolderSettingsAction::AskLayer;
    // A longer line would end the file's reading: the command and colour after it would be lost and the
    // file, read only in part, never saved over again.
    if (layer.size() > static_cast<std::size_t>(MaxFolderLayerChars()))
        return FolderSettingsAction::LayerTooLong;
    if (command.size() > static_cast<std::size_t>(MaxFolderCommandChars()))
        return FolderSettingsAction::CommandTooLong;
    return FolderSettingsAction::Write;
}

bool WriteFolderSettings(CIniFile& store, const std::string& filePath, const std::string& layer,
                         const std::string& command, int colorIndex) {
    char color[16];
    std::snprintf(color, sizeof color, "%i", colorIndex);
    store.SetPath(filePath);
    store.SetValue(kFolderSettingsSection, kFolderSettingsLayer, layer, true);
    store.SetValue(kFolderSettingsSection, kFolderSettingsCommand, command, true);
    store.SetValue(kFolderSettingsSection, kFolderSettingsColor, color, true);
    return store.WriteFile();
}
