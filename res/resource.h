// Resource ids of the explorer.
#pragma once

#define IDD_ABOUTBOX 100
#define IDR_MAINFRAME 128
#define IDD_DIALOG_RUN 200
#define IDC_ABOUT_TEXT 1000
