// The search edit's search over the drawing list, with its effects on the grid and its owner.
#include "thumbs/ThumbSearch.h"

#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgThumbnail.h"
#include "thumbs/Tessel3View.h"

#include <windows.h>

std::string NoMatchMessage(const std::string& text) {
    return "No drawing starts with \"" + text + "\"";
}

// Brings record index into view selected, the focus staying where it was, and makes it the chosen one.
void CTessel3View::ShowChosen(int index) {
    // The grid takes the focus while it lays rows out; the search edit keeps it.
    HWND focus = ::GetFocus();
    ShowIndex(index);
    if (focus && ::IsWindow(focus) && ::GetFocus() != focus)
        ::SetFocus(focus);
    m_pFolder->Choose(index);
    SetStatusText(std::string());
}

// Nothing is chosen: no selection, no chosen drawing, no pick; the status bar says why.
void CTessel3View::ShowNothingChosen(const std::string& text) {
    m_pFolder->ChooseNone();
    SetStatusText(NoMatchMessage(text));
}

void CTessel3View::RunSearch(const std::string& text) {
    if (text.empty() || DrawingCount() == 0) {
        SetStatusText(std::string());
        return;
    }
    DeselectAll();
    const DwgPrefixSearch found = m_pFolder->SelectFirstStartingWith(text);
    if (!found.ran)
        return;
    if (found.match >= 0)
        ShowChosen(found.match);
    else
        ShowNothingChosen(text);
}

bool CTessel3View::ChooseDrawing(const std::string& name) {
    const int index = m_pFolder ? m_pFolder->Find(name) : -1;
    if (index < 0)
        return false;
    DeselectAll();
    m_pFolder->Select(index);
    ShowChosen(index);
    return true;
}
