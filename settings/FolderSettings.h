// A drawing folder's insertion parameters: the file "datains.ini" in the folder, its section and keys,
// and the rules of the folder settings dialog kept apart from its windows (what the dialog shows when it
// opens, what Accept does). Portable: no <windows.h>.
#pragma once

#include <cstddef>
#include <string>

class CIniFile;

constexpr const char kFolderSettingsFile[] = "datains.ini";
constexpr const char kFolderSettingsSection[] = "Default Parameters";
constexpr const char kFolderSettingsLayer[] = "Layer";
constexpr const char kFolderSettingsCommand[] = "Lisp command";
constexpr const char kFolderSettingsColor[] = "Color";

// The dialog keeps the folder path in a buffer of this many characters, terminator included, and
// appends "\datains.ini" to it in place.
constexpr int kFolderPathBufferSize = 260;
// The swatch's colour index before one is read or chosen.
constexpr int kDefaultColorIndex = 7;

// The settings file of a folder: the folder, a separator (always added) and "datains.ini".
std::string FolderSettingsFilePath(const std::string& folder);

// Whether the folder's settings file path fits the dialog's buffer with its terminator.
bool FolderSettingsPathFits(const std::string& folder);
// What the user is told when it does not.
std::string FolderPathTooLongMessage(const std::string& folder);

// What the dialog shows when it opens.
struct FolderSettingsView {
    bool useCurrentLayer = true;   // the "&Use current layer" box
    bool layerEditEnabled = false; // the layer edit
    bool swatchEnabled = true;     // the colour swatch
    bool colorFromFile = false;    // colorIndex was read from the file (else the swatch keeps its own)
    int colorIndex = kDefaultColorIndex;
    std::string layer;
    std::string command;
};

// The opening state: from a store that read the folder's file (fileRead) or from nothing.
//  - no file: box checked, layer edit disabled, the swatch enabled with its defaults, empty texts;
//  - a file with an empty Layer: box checked, layer edit and swatch disabled, the command shown;
//  - a file with a layer: box clear, both enabled, the layer, the command and atoi(Color) shown
//    (a missing colour gives 0).
FolderSettingsView ReadFolderSettingsView(CIniFile& store, bool fileRead);

// The longest layer name and LISP command the file reads back: each is one line of the store, and a
// longer line would end its reading (the command and colour after it lost). The dialog's edits take no
// more than these.
int MaxFolderLayerChars();
int MaxFolderCommandChars();

// What Accept does with what the dialog holds.
enum class FolderSettingsAction {
    DeleteFile,     // box checked, command empty: the folder keeps no parameters
    AskLayer,       // box clear, layer empty: "Name of layer is empty", the dialog stays
    LayerTooLong,   // longer than MaxFolderLayerChars: said, the dialog stays
    CommandTooLong, // longer than MaxFolderCommandChars: said, the dialog stays
    Write,          // Layer, Lisp command and Color are written
};
FolderSettingsAction DecideFolderSettingsAccept(bool useCurrentLayer, const std::string& layer,
                                                const std::string& command);

constexpr const char kLayerNameEmptyAlert[] = "Name of layer is empty";

// What the user is told when a text is longer than the file reads back (Accept refused), and the note
// under the edits when typing or pasting reached the limit (the rest was not taken).
std::string CommandTooLongAlert(const std::string& command);
std::string LayerTooLongAlert(const std::string& layer);
std::string CommandLimitNote();
std::string LayerLimitNote();

// What the person in front of the dialog is told when Accept could not write, or remove, the folder's
// file (the command line has the reason): the dialog stays open with what they entered, and the file is
// as it was.
std::string FolderSettingsNotSavedAlert(const std::string& filePath);

// Writes the three values into the store, in the order Layer, Lisp command, Color (created when
// missing; every other section and key the store holds is kept), the colour formatted with "%i". An
// empty layer is written when the box is checked. Returns WriteFile's result.
bool WriteFolderSettings(CIniFile& store, const std::string& filePath, const std::string& layer,
                         const std::string& command, int colorIndex);
