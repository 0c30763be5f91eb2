// devhost's colour dialog, the host's acedSetColorDialog: the 255 colours of the indexed palette as
// swatches to click, the chosen index shown beside a sample, ByLayer and ByBlock (disabled unless the
// caller allows logical colours), OK and Cancel. Modal on the user-interface thread.
#pragma once

#include <windows.h>

namespace devhost {

extern const wchar_t* const kColorDialogClass; // "DevhostColorDialog"
extern const wchar_t* const kSwatchClass;      // "DevhostSwatch"
constexpr int kFirstSwatchId = 1000;           // a swatch's control id: 1000 + its colour index
constexpr int kByBlockId = 1300;               // colour index 0
constexpr int kByLayerId = 1301;               // colour index 256
constexpr int kChosenTextId = 1302;            // "Color N" (or ByLayer, ByBlock)
constexpr int kChosenSampleId = 1303;          // a larger swatch of the chosen colour

// Runs the dialog, owned by the active window (or the host's frame). *colorIndex is the colour chosen
// first and receives the confirmed one; false when the user cancelled (it is then unchanged).
bool RunColorDialog(int* colorIndex, bool allowMetaColor, int currentLayerColor);

// Cancels an open colour dialog (any thread): devhost ends a call that waits in it.
void CancelColorDialog();

} // namespace devhost
