// The search edit's search over the drawing list, with its effects on the grid and its owner.
#include "thumbs/ThumbSearch.h"

#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"
#include "thumbs/DwgThumbnail.h"
#include "thumbs/Tessel3View.h"

#include <windows.h>

std::string NoMatchMessage(const std::string& text) {
    return "No drawing starts with \"" + text + "\"";
}

// Brings record index into view selected, the focus staying where it was, and makes it current.
void CTessel3View::ShowChosen(int index) {
    // The grid takes the focus while it lays rows out; the search edit keeps it.
    HWND focus = ::GetFocus();
    ShowIndex(index);
    if (focus && ::IsWindow(focus) && ::GetFocus() != focus)
        ::SetFocus(focus);
    const std::string& name = DwgList[index].m_strName;
    if (CTessel3Doc* doc = Document())
        doc->m_strName = name;
    SetTitle(CurrentFolderWithSlash() + name);
    EnablePick(true);
    SetStatusText(std::string());
}

// Nothing is chosen: no selection, no current drawing, no pick; the title names the folder.
void CTessel3View::ShowNothingChosen(const std::string& text) {
    if (CTessel3Doc* doc = Document())
        doc->m_strName.clear();
    SetTitle(CurrentFolder());
    EnablePick(false);
    SetStatusText(NoMatchMessage(text));
}

void CTessel3View::RunSearch(const std::string& text) {
    if (text.empty() || DwgList.IsEmpty()) {
        SetStatusText(std::string());
        return;
    }
    DeselectAll();
    const DwgPrefixSearch found = FindByPrefix(text);
    if (!found.ran)
        return;
    if (found.match >= 0)
        ShowChosen(found.match);
    else
        ShowNothingChosen(text);
}

bool CTessel3View::ChooseDrawing(const std::string& name) {
    const int count = DwgList.GetSize();
    for (int i = 0; i < count; ++i) {
        if (CompareNamesNoCase(DwgList[i].m_strName, name) != 0)
            continue;
        DeselectAll();
        DeselectAllFlags();
        DwgList[i].Select();
        ShowChosen(i);
        return true;
    }
    return false;
}
