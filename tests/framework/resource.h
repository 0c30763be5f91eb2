// Resource ids of the framework tests.
#pragma once

#define IDD_TEST_DIALOG 100
#define IDC_TEST_EDIT 1001
#define IDC_TEST_EDIT2 1002

#define IDR_TEST_MENU 128
#define ID_TEST_GREY 32771
#define ID_TEST_CHECK 32772
#define ID_TEST_PLAIN 32773

#define IDS_TEST_STRING 200
