#include "frame/MdiMixin.h"

#include "settings/Tessel3Doc.h"

bool CMdiMixin::SetUp(UINT frameResourceId) {
    m_nIDFrameResource = frameResourceId;
    return true;
}

bool CMdiMixin::CreateAndShow(CDialog* dialog) {
    // The document reads the explorer's settings; it lives until the LISP function ends the run.
    new CTessel3Doc();
    // The dialog receives the accept and cancel messages the explorer posts.
    m_pMainWnd = dialog;
    return true;
}
