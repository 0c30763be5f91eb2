// The search edit's search over the drawing list, with its effects on the grid and the frame.
#include "thumbs/ThumbSearch.h"

#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"
#include "thumbs/DwgThumbnail.h"
#include "thumbs/Tessel3View.h"
#include "thumbs/ThumbsGlue.h"

#include <windows.h>

namespace {

// Brings record index into view selected, the focus staying where it was, and makes it current.
void ShowChosen(int index) {
    // The grid takes the focus while it lays rows out; the search edit keeps it.
    HWND focus = ::GetFocus();
    if (g_pTessel3View)
        g_pTessel3View->ShowIndex(index);
    if (focus && ::IsWindow(focus) && ::GetFocus() != focus)
        ::SetFocus(focus);
    const std::string& name = DwgList[index].m_strName;
    if (g_pTessel3Doc)
        g_pTessel3Doc->m_strName = name;
    FrameSetTitle(CurrentFolderWithSlash() + name);
    FrameEnablePick(true);
    FrameSetStatusText(std::string());
}

// Nothing is chosen: no selection, no current drawing, no pick; the title names the folder.
void ShowNothingChosen(const std::string& text) {
    if (g_pTessel3Doc)
        g_pTessel3Doc->m_strName.clear();
    FrameSetTitle(CurrentFolder());
    FrameEnablePick(false);
    FrameSetStatusText(NoMatchMessage(text));
}

} // namespace

std::string NoMatchMessage(const std::string& text) {
    return "No drawing starts with \"" + text + "\"";
}

void RunSearch(const std::string& text) {
    if (text.empty() || DwgList.IsEmpty()) {
        FrameSetStatusText(std::string());
        return;
    }
    if (g_pTessel3View)
        g_pTessel3View->DeselectAll();
    const DwgPrefixSearch found = FindByPrefix(text);
    if (!found.ran)
        return;
    if (found.match >= 0)
        ShowChosen(found.match);
    else
        ShowNothingChosen(text);
}

bool ChooseDrawing(const std::string& name) {
    const int count = DwgList.GetSize();
    for (int i = 0; i < count; ++i) {
        if (CompareNamesNoCase(DwgList[i].m_strName, name) != 0)
            continue;
        if (g_pTessel3View)
            g_pTessel3View->DeselectAll();
        DeselectAllFlags();
        DwgList[i].Select();
        ShowChosen(i);
        return true;
    }
    return false;
}
