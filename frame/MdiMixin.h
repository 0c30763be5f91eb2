// The application object's part that opens the explorer: set up once with the frame's resource id,
// then asked by the run dialog to create and show the explorer for one call of the LISP function.
#pragma once

#include "framework/afxwin.h"

class CMdiMixin : public CWinApp {
public:
    CMdiMixin() = default;

    // Keeps the frame's resource id for later; no window is made here.
    bool SetUp(UINT frameResourceId);

    // Creates the explorer document and the frame for `dialog`, the run dialog whose modal loop hosts
    // them. Returns true when the explorer stands.
    bool CreateAndShow(CDialog* dialog);

    UINT FrameResourceId() const { return m_nIDFrameResource; }

private:
    UINT m_nIDFrameResource = 0;
};
