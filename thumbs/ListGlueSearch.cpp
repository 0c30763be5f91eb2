// The search edit's search over the drawing list, with its effects on the grid and the frame.
#include "thumbs/ThumbSearch.h"

#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"
#include "thumbs/Tessel3View.h"
#include "thumbs/ThumbsGlue.h"

#include <windows.h>

void RunSearch(const std::string& text) {
    if (text.empty() || DwgList.IsEmpty())
        return;
    // The grid takes the focus while it lays rows out; the search edit keeps it.
    HWND focus = ::GetFocus();
    if (g_pTessel3View)
        g_pTessel3View->DeselectAll();
    const DwgPrefixSearch found = FindByPrefix(text);
    if (!found.ran)
        return;
    if (found.match >= 0 && g_pTessel3View)
        g_pTessel3View->ShowIndex(found.match);
    if (focus && ::IsWindow(focus) && ::GetFocus() != focus)
        ::SetFocus(focus);

    const std::string& name = DwgList[found.nameIndex].m_strName;
    if (g_pTessel3Doc)
        g_pTessel3Doc->m_strName = name;
    char folder[MAX_PATH + 1] = {};
    DWORD n = ::GetCurrentDirectoryA(sizeof folder, folder);
    FrameSetTitle(std::string(folder, n < sizeof folder ? n : 0) + "\\" + name);
    FrameEnablePick(true);
}
