// Resource and command ids of the explorer. Numbers are fixed: menus, toolbars, accelerators and the
// string table all refer to them.
#pragma once

// Dialogs, menus, toolbars
#define IDD_ABOUTBOX 100
#define IDR_MAINFRAME 128 // menu, accelerators, main toolbar, icon, title string
#define IDD_SETLA 136
#define IDC_HOURGLASS 131   // animated cursor of the waiting tree
#define IDC_DRAG_CURSOR 132
#define IDD_DIALOG_RUN 200
#define IDR_TOOLBAR2 204  // bottom toolbar: accept and cancel
#define IDR_THUMB_MENU 208 // context menu of a thumbnail
#define IDC_ABOUT_TEXT 1000
#define IDC_ABOUT_VERSION 1002 // the about box's version and commit line
// Folder settings dialog (IDD_SETLA)
#define IDC_SETLA_COLOR 200        // the colour swatch
#define IDC_SETLA_COMMAND 201      // the LISP command edit
#define IDC_SETLA_LIMIT_NOTE 202   // says when an edit reached the longest text the file reads back
#define IDC_SETLA_LAYER 1017       // the layer name edit
#define IDC_SETLA_USE_CURRENT 1081 // "&Use current layer"

// Standard commands
#define ID_FILE_NEW 57600
#define ID_FILE_OPEN 57601
#define ID_FILE_SAVE 57603
#define ID_FILE_PRINT 57607
#define ID_EDIT_COPY 57634
#define ID_EDIT_CUT 57635
#define ID_EDIT_PASTE 57637
#define ID_EDIT_UNDO 57643
#define ID_APP_ABOUT 57664
#define ID_HELP_INDEX 57670
#define ID_NEXT_PANE 57680
#define ID_PREV_PANE 57681
// The framework defines these ids itself (afxbars.h) as constants; the resource compiler gets them here.
#ifdef RC_INVOKED
#define ID_APP_EXIT 57665
#define ID_VIEW_TOOLBAR 59392
#define ID_VIEW_STATUS_BAR 59393
#define ID_INDICATOR_CAPS 59137
#define ID_INDICATOR_NUM 59138
#define ID_INDICATOR_SCRL 59139
#define ID_SEPARATOR 0
#endif
#define IDS_IDLE_MESSAGE 57345 // status-bar text when no prompt is shown

// Explorer commands
#define ID_VIEW_BEGIN 32771
#define ID_VIEW_INCREASE 32774
#define ID_VIEW_DECREASE 32775
#define ID_VIEW_ALIGNE 32782
#define ID_SORT_DATE 32788
#define ID_SORT_SIZE 32789
#define ID_SEARCH_EDIT 32790   // toolbar placeholder that becomes the search edit
#define ID_REDRAW 32792
#define ID_SELECT_ALL 32793
#define ID_CLEAR 32794
#define ID_ACCEPT 32795        // bottom toolbar: the pick
#define ID_CANCEL_PICK 32796   // bottom toolbar: cancel
#define ID_THUMB_COPY 32797
#define ID_SORT_NAME 32799
#define ID_THUMB_DELETE 32800
#define ID_THUMB_PASTE 32801
#define ID_THUMB_RENAME 32802
#define ID_THUMB_PROPERTY 32803
#define ID_SEARCH_LABEL 32804  // toolbar placeholder that becomes the "Search:" label
#define ID_LAYER_LABEL 32805   // toolbar placeholder that becomes the layer label
#define ID_VIEW_REFRESH 32806  // F5: read the folder shown again
