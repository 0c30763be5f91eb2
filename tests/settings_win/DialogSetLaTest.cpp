// The folder settings dialog run modally, as the folder tree's menu runs it, on folders with and without
// a datains.ini. Each test's steps run inside the dialog's modal loop and end it through its buttons.
#include "settings/DialogSetLa.h"

#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"
#include "settings/FolderSettings.h"
#include "settings/IniFile.h"
#include "settings/IniFileIo.h"
#include "tests/settings/ReportedMessages.h"
#include "tests/support/TempFolder.h"

#include "res/resource.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

using namespace testsupport;

namespace {

// ---- the host: alerts and the colour dialog, recorded --------------------------------------------------

struct ColorDialogCall {
    int index;
    bool allowMeta;
    int layerColor;
};

std::vector<std::wstring> g_alerts;
std::vector<ColorDialogCall> g_colorCalls;
int g_colorAnswer = -1; // the index the "user" confirms; -1 cancels

int FakeAlert(const wchar_t* text) {
    g_alerts.push_back(text ? text : L"");
    return RTNORM;
}
bool FakeColorDialog(int* index, bool allowMeta, int layerColor) {
    g_colorCalls.push_back({*index, allowMeta, layerColor});
    if (g_colorAnswer < 0)
        return false;
    *index = g_colorAnswer;
    return true;
}
// A palette easy to tell apart: each index its own colour.
std::uint32_t FakeRgb(int index) {
    return static_cast<std::uint32_t>(RGB(index, 255 - index, (index * 7) & 0xFF));
}

constexpr UINT WM_TEST_STEPS = WM_APP + 11;
constexpr UINT_PTR kWatchdog = 41;

// The dialog with the test's steps, run once it is shown.
class TestDialog : public CDialogSetLa {
public:
    std::function<void(TestDialog&)> steps;
    int changes = 0;
    bool timedOut = false;

    TestDialog() {
        onChanged = [this] { ++changes; };
    }

    bool OnInitDialog() override {
        const bool result = CDialogSetLa::OnInitDialog();
        PostMessage(WM_TEST_STEPS);
        SetTimer(kWatchdog, 10000);
        return result;
    }

    HWND Item(int id) const { return GetDlgItem(id); }
    bool Enabled(int id) const { return ::IsWindowEnabled(Item(id)) != FALSE; }
    bool Checked() const { return IsDlgButtonChecked(IDC_SETLA_USE_CURRENT) == BST_CHECKED; }
    std::string Text(int id) const { return GetDlgItemText(id); }
    void SetText(int id, const std::string& text) { ::SetWindowTextA(Item(id), text.c_str()); }
    // A button pressed as the mouse does it (BM_CLICK sends the button its mouse messages).
    void Press(int id) { ::SendMessageA(Item(id), BM_CLICK, 0, 0); }
    // A click on the swatch: the static notifies its parent of the click.
    void ClickSwatch() {
        const LPARAM at = MAKELPARAM(4, 4);
        ::SendMessageA(Item(IDC_SETLA_COLOR), WM_LBUTTONDOWN, MK_LBUTTON, at);
        ::SendMessageA(Item(IDC_SETLA_COLOR), WM_LBUTTONUP, 0, at);
    }
    CStaticColor& Swatch() { return *static_cast<CStaticColor*>(CWnd::FromHandle(Item(IDC_SETLA_COLOR))); }
    // The colour on screen in the middle of the swatch.
    COLORREF SwatchPixel() {
        HWND swatch = Item(IDC_SETLA_COLOR);
        ::UpdateWindow(swatch);
        RECT rc;
        ::GetClientRect(swatch, &rc);
        HDC dc = ::GetDC(swatch);
        const COLORREF pixel = ::GetPixel(dc, rc.right / 2, rc.bottom / 2);
        ::ReleaseDC(swatch, dc);
        return pixel;
    }

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override {
        if (message == WM_TEST_STEPS) {
            if (steps)
                steps(*this);
            return 0;
        }
        if (message == WM_TIMER && wParam == kWatchdog) {
            KillTimer(kWatchdog);
            timedOut = true;
            EndDialog(-77);
            return 0;
        }
        return CDialogSetLa::WindowProc(message, wParam, lParam);
    }
};

class FolderSettingsDialog : public ::testing::Test {
protected:
    void SetUp() override {
        HostApi api;
        api.acedAlert = FakeAlert;
        api.acedSetColorDialog = FakeColorDialog;
        api.acedGetRGB = FakeRgb;
        SetHostApi(api);
        g_alerts.clear();
        g_colorCalls.clear();
        g_colorAnswer = -1;
    }
    void TearDown() override { SetHostApi(HostApi{}); }

    std::string IniPath() const { return m_folder.File("datains.ini"); }
    void WriteIni(const std::string& text) const { m_folder.Write("datains.ini", text); }
    std::string Ini() const { return ReadBytes(IniPath()); }

    // Runs the dialog on the test's folder; the steps must end it.
    INT_PTR Run(TestDialog& dialog, std::function<void(TestDialog&)> steps) {
        EXPECT_TRUE(dialog.SetFolder(m_folder.Dir()));
        dialog.steps = std::move(steps);
        const INT_PTR result = dialog.DoModal();
        EXPECT_FALSE(dialog.timedOut) << "the steps did not end the dialog";
        return result;
    }

    TempFolder m_folder{"orvex-setla"};
};

} // namespace

TEST_F(FolderSettingsDialog, TheTemplateAsDesigned) {
    TestDialog dialog;
    std::string caption, layerLabel, boxText, accept, cancel;
    DWORD swatchStyle = 0, boxStyle = 0, layerStyle = 0, layerExStyle = 0;
    CRect dialogClient, layerRect, swatchRect;
    Run(dialog, [&](TestDialog& d) {
        caption = d.GetWindowText();
        boxText = d.Text(IDC_SETLA_USE_CURRENT);
        accept = d.Text(IDOK);
        cancel = d.Text(IDCANCEL);
        swatchStyle = static_cast<DWORD>(::GetWindowLongPtrA(d.Item(IDC_SETLA_COLOR), GWL_STYLE));
        boxStyle = static_cast<DWORD>(::GetWindowLongPtrA(d.Item(IDC_SETLA_USE_CURRENT), GWL_STYLE));
        layerStyle = static_cast<DWORD>(::GetWindowLongPtrA(d.Item(IDC_SETLA_LAYER), GWL_STYLE));
        layerExStyle = static_cast<DWORD>(::GetWindowLongPtrA(d.Item(IDC_SETLA_LAYER), GWL_EXSTYLE));
        // Dialog units to pixels, to compare the positions with the template's.
        RECT units{58, 7, 58 + 119, 7 + 14};
        ::MapDialogRect(d.m_hWnd, &units);
        layerRect = units;
        RECT swatchUnits{183, 7, 183 + 20, 7 + 14};
        ::MapDialogRect(d.m_hWnd, &swatchUnits);
        swatchRect = swatchUnits;
        CRect got;
        ::GetWindowRect(d.Item(IDC_SETLA_LAYER), &got);
        ::MapWindowPoints(nullptr, d.m_hWnd, reinterpret_cast<POINT*>(&got), 2);
        EXPECT_EQ(got, layerRect);
        ::GetWindowRect(d.Item(IDC_SETLA_COLOR), &got);
        ::MapWindowPoints(nullptr, d.m_hWnd, reinterpret_cast<POINT*>(&got), 2);
        EXPECT_EQ(got, swatchRect);
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(caption, "Folder settings - " + FolderCaptionName(m_folder.Dir()))
        << "the caption names the folder it edits";
    EXPECT_NE(FolderCaptionName(m_folder.Dir()), "");
    EXPECT_EQ(boxText, "&Use current layer");
    EXPECT_EQ(accept, "&Accept");
    EXPECT_EQ(cancel, "&Cancel");
    EXPECT_EQ(swatchStyle & SS_TYPEMASK, static_cast<DWORD>(SS_BLACKFRAME));
    EXPECT_TRUE(swatchStyle & SS_NOTIFY);
    EXPECT_EQ(boxStyle & BS_TYPEMASK, static_cast<DWORD>(BS_AUTOCHECKBOX));
    EXPECT_TRUE(layerStyle & ES_AUTOHSCROLL);
    // The dialog manager draws a bordered edit of a template like this one with the sunken edge instead.
    EXPECT_TRUE((layerStyle & WS_BORDER) || (layerExStyle & WS_EX_CLIENTEDGE));
}

TEST_F(FolderSettingsDialog, NoFileOpensCheckedWithTheSwatchEnabledAndWhite) {
    TestDialog dialog;
    bool checked = false, layerEnabled = true, swatchEnabled = false;
    int index = 0;
    std::uint32_t fill = 0;
    COLORREF pixel = 0;
    std::string command = "x";
    const INT_PTR result = Run(dialog, [&](TestDialog& d) {
        checked = d.Checked();
        layerEnabled = d.Enabled(IDC_SETLA_LAYER);
        swatchEnabled = d.Enabled(IDC_SETLA_COLOR);
        index = d.Swatch().GetColorIndex();
        fill = d.Swatch().GetFillColor();
        pixel = d.SwatchPixel();
        command = d.Text(IDC_SETLA_COMMAND);
        d.Press(IDOK); // box checked, no command: nothing to keep, nothing written
    });
    EXPECT_EQ(result, IDOK);
    EXPECT_TRUE(checked);
    EXPECT_FALSE(layerEnabled);
    EXPECT_TRUE(swatchEnabled);
    EXPECT_EQ(index, 7);
    EXPECT_EQ(fill, 0xFFFFFFu);
    EXPECT_EQ(pixel, RGB(255, 255, 255));
    EXPECT_EQ(command, "");
    EXPECT_FALSE(FileExists(IniPath()));
    EXPECT_TRUE(g_alerts.empty());
    EXPECT_STREQ(dialog.GetPathBuffer(), IniPath().c_str()) << "the buffer holds the file's path";
}

TEST_F(FolderSettingsDialog, NoFileAndACommandWritesAnEmptyLayerAndColour7) {
    TestDialog dialog;
    const INT_PTR result = Run(dialog, [](TestDialog& d) {
        d.SetText(IDC_SETLA_COMMAND, "(c:fixdoor)");
        d.Press(IDOK);
    });
    EXPECT_EQ(result, IDOK);
    EXPECT_EQ(Ini(), "[Default Parameters]\r\nLayer=\r\nLisp command=(c:fixdoor)\r\nColor=7\r\n\r\n");
    EXPECT_EQ(dialog.changes, 1);
}

TEST_F(FolderSettingsDialog, AFileWithALayerOpensWithLayerColourAndCommand) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=30\r\n");
    TestDialog dialog;
    bool checked = true, layerEnabled = false, swatchEnabled = false;
    std::string layer, command;
    int index = 0;
    COLORREF pixel = 0;
    Run(dialog, [&](TestDialog& d) {
        checked = d.Checked();
        layerEnabled = d.Enabled(IDC_SETLA_LAYER);
        swatchEnabled = d.Enabled(IDC_SETLA_COLOR);
        layer = d.Text(IDC_SETLA_LAYER);
        command = d.Text(IDC_SETLA_COMMAND);
        index = d.Swatch().GetColorIndex();
        pixel = d.SwatchPixel();
        d.Press(IDCANCEL);
    });
    EXPECT_FALSE(checked);
    EXPECT_TRUE(layerEnabled);
    EXPECT_TRUE(swatchEnabled);
    EXPECT_EQ(layer, "DOORS");
    EXPECT_EQ(command, "(c:go)");
    EXPECT_EQ(index, 30);
    EXPECT_EQ(pixel, static_cast<COLORREF>(FakeRgb(30)))
        << "the swatch paints the host's colour of the index";
    EXPECT_EQ(dialog.changes, 0) << "Cancel touches nothing";
}

TEST_F(FolderSettingsDialog, AFileWithAnEmptyLayerDisablesLayerAndSwatch) {
    WriteIni("[Default Parameters]\r\nLayer=\r\nLisp command=(c:go)\r\nColor=3\r\n");
    TestDialog dialog;
    bool checked = false, layerEnabled = true, swatchEnabled = true;
    std::string command;
    Run(dialog, [&](TestDialog& d) {
        checked = d.Checked();
        layerEnabled = d.Enabled(IDC_SETLA_LAYER);
        swatchEnabled = d.Enabled(IDC_SETLA_COLOR);
        command = d.Text(IDC_SETLA_COMMAND);
        d.Press(IDCANCEL);
    });
    EXPECT_TRUE(checked);
    EXPECT_FALSE(layerEnabled);
    EXPECT_FALSE(swatchEnabled);
    EXPECT_EQ(command, "(c:go)");
}

TEST_F(FolderSettingsDialog, TheBoxEnablesLayerAndSwatchExactlyWhenClear) {
    TestDialog dialog;
    std::vector<std::string> states;
    auto note = [&](TestDialog& d) {
        states.push_back(std::string(d.Checked() ? "checked" : "clear") +
                         (d.Enabled(IDC_SETLA_LAYER) ? " layer" : "") +
                         (d.Enabled(IDC_SETLA_COLOR) ? " swatch" : ""));
    };
    Run(dialog, [&](TestDialog& d) {
        note(d);
        d.Press(IDC_SETLA_USE_CURRENT);
        note(d);
        d.Press(IDC_SETLA_USE_CURRENT);
        note(d);
        d.Press(IDCANCEL);
    });
    // No file: the swatch starts enabled on purpose; the first click of the box sets the rule.
    EXPECT_EQ(states, (std::vector<std::string>{"checked swatch", "clear layer swatch", "checked"}));
}

TEST_F(FolderSettingsDialog, AnEmptyLayerIsRefusedWithAnAlertAndTheDialogStays) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=\r\nColor=5\r\n");
    const std::string before = Ini();
    TestDialog dialog;
    bool stillRunning = false;
    const INT_PTR result = Run(dialog, [&](TestDialog& d) {
        d.SetText(IDC_SETLA_LAYER, "");
        d.SetText(IDC_SETLA_COMMAND, "(c:go)");
        d.Press(IDOK);
        stillRunning = d.IsModalRunning() && d.IsWindowVisible();
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(result, IDCANCEL);
    EXPECT_EQ(g_alerts, std::vector<std::wstring>{L"Name of layer is empty"});
    EXPECT_TRUE(stillRunning);
    EXPECT_EQ(Ini(), before) << "nothing written";
    EXPECT_EQ(dialog.changes, 0);
}

TEST_F(FolderSettingsDialog, TheRefusedLayerGetsTheFocus) {
    TestDialog dialog;
    int focusId = 0;
    Run(dialog, [&](TestDialog& d) {
        d.Press(IDC_SETLA_USE_CURRENT); // clear: the layer edit is enabled and empty
        d.Press(IDOK);
        focusId = ::GetDlgCtrlID(::GetFocus());
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(focusId, IDC_SETLA_LAYER);
    EXPECT_EQ(g_alerts.size(), 1u);
    EXPECT_FALSE(FileExists(IniPath()));
}

TEST_F(FolderSettingsDialog, CheckedAndNoCommandDeletesTheFile) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n[Mine]\r\nA=1\r\n");
    TestDialog dialog;
    const INT_PTR result = Run(dialog, [](TestDialog& d) {
        d.Press(IDC_SETLA_USE_CURRENT);
        d.SetText(IDC_SETLA_COMMAND, "");
        d.Press(IDOK);
    });
    EXPECT_EQ(result, IDOK);
    EXPECT_FALSE(FileExists(IniPath()));
    EXPECT_EQ(dialog.changes, 1) << "the owner shows the layer again after a delete too";
    EXPECT_TRUE(g_alerts.empty());
}

// ---- files the dialog cannot write: the user is told, nothing is lost -----------------------------------

// Accept with a command on a folder whose file cannot be written: the file stays byte for byte, the
// command line says why, the alert tells the person at the dialog, and the dialog stays open with what
// was entered (then Cancel).
struct NotSaved {
    INT_PTR result = 0;
    bool stillOpen = false;
    std::string commandAfter;
    std::vector<std::string> reported;
};

class FolderSettingsNotSaved : public FolderSettingsDialog {
protected:
    NotSaved AcceptACommand(bool clearLayer = false) {
        ReportedMessages messages;
        NotSaved seen;
        TestDialog dialog;
        seen.result = Run(dialog, [&](TestDialog& d) {
            if (clearLayer) {
                if (!d.Checked())
                    d.Press(IDC_SETLA_USE_CURRENT);
                d.SetText(IDC_SETLA_COMMAND, "");
            } else {
                d.SetText(IDC_SETLA_COMMAND, "(c:mine)");
            }
            d.Press(IDOK);
            seen.stillOpen = d.IsModalRunning() && d.IsWindowVisible();
            seen.commandAfter = d.Text(IDC_SETLA_COMMAND);
            d.Press(IDCANCEL);
        });
        seen.reported = messages.Texts();
        EXPECT_EQ(dialog.changes, 0) << "the owner is not told of a change that did not happen";
        return seen;
    }
    void ExpectTold(const NotSaved& seen, const std::string& reason) {
        EXPECT_EQ(seen.result, IDCANCEL);
        EXPECT_TRUE(seen.stillOpen) << "the dialog stays open";
        EXPECT_EQ(g_alerts, std::vector<std::wstring>{WidenAnsi(FolderSettingsNotSavedAlert(IniPath()))});
        ASSERT_EQ(seen.reported.size(), 1u);
        EXPECT_NE(seen.reported[0].find("\nOrvex: " + IniPath() + " was not "), std::string::npos)
            << seen.reported[0];
        EXPECT_NE(seen.reported[0].find(reason), std::string::npos) << seen.reported[0];
        EXPECT_NE(seen.reported[0].find("; the file is left as it was\n"), std::string::npos)
            << seen.reported[0];
    }
};

TEST_F(FolderSettingsNotSaved, AReadOnlyFileIsLeftAndTheUserIsTold) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string before = Ini();
    ASSERT_TRUE(::SetFileAttributesA(IniPath().c_str(), FILE_ATTRIBUTE_READONLY));
    const NotSaved seen = AcceptACommand();
    ::SetFileAttributesA(IniPath().c_str(), FILE_ATTRIBUTE_NORMAL);
    ExpectTold(seen, "it is read-only");
    EXPECT_EQ(seen.commandAfter, "(c:mine)") << "what was typed is still there";
    EXPECT_EQ(Ini(), before);
}

TEST_F(FolderSettingsNotSaved, AReadOnlyFileIsNotRemovedEitherAndTheUserIsTold) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string before = Ini();
    ASSERT_TRUE(::SetFileAttributesA(IniPath().c_str(), FILE_ATTRIBUTE_READONLY));
    const NotSaved seen = AcceptACommand(true);
    ::SetFileAttributesA(IniPath().c_str(), FILE_ATTRIBUTE_NORMAL);
    ExpectTold(seen, "was not removed: it is read-only");
    EXPECT_EQ(Ini(), before);
}

TEST_F(FolderSettingsNotSaved, AFileHeldOpenWithoutSharingIsLeftAndTheUserIsTold) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string before = Ini();
    // Another program holds it open and shares nothing.
    HANDLE held = ::CreateFileA(IniPath().c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr, OPEN_EXISTING,
                                FILE_ATTRIBUTE_NORMAL, nullptr);
    ASSERT_NE(held, INVALID_HANDLE_VALUE);
    std::string commandShown = "?";
    {
        TestDialog dialog;
        Run(dialog, [&](TestDialog& d) {
            commandShown = d.Text(IDC_SETLA_COMMAND);
            d.Press(IDCANCEL);
        });
    }
    const NotSaved seen = AcceptACommand();
    ::CloseHandle(held);
    EXPECT_EQ(commandShown, "") << "an unreadable file opens the dialog on its defaults";
    ExpectTold(seen, "it could not be read");
    EXPECT_EQ(Ini(), before);
}

TEST_F(FolderSettingsNotSaved, AFullDiskLeavesTheFileAndTheUserIsTold) {
    WriteIni(
        "[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n[Mine]\r\nA=1\r\n");
    const std::string before = Ini();
    SetDiskRoomForTesting(20);
    const NotSaved seen = AcceptACommand();
    SetDiskRoomForTesting(-1);
    ExpectTold(seen, "was not saved: the disk is full");
    EXPECT_EQ(Ini(), before);
    EXPECT_EQ(FilesIn(m_folder.Dir()), std::vector<std::string>{"datains.ini"})
        << "no temporary file is left";
}

TEST_F(FolderSettingsNotSaved, AFileWithALineOf3000CharactersIsLeftAndTheUserIsTold) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=" + std::string(3000, 'c') +
             "\r\nColor=5\r\n\r\n[Mine]\r\nA=1\r\n");
    const std::string before = Ini();
    const NotSaved seen = AcceptACommand();
    ExpectTold(seen, "line 3 is longer than 2047 characters");
    EXPECT_EQ(Ini(), before);
}

TEST_F(FolderSettingsNotSaved, BinaryGarbageIsLeftAndTheUserIsTold) {
    std::string garbage = "[Default Parameters]\r\nLayer=DOORS\r\n";
    for (int i = 0; i < 20000; ++i)
        garbage += static_cast<char>((i * 7919 + i / 13) & 0xFF);
    WriteIni(garbage);
    const NotSaved seen = AcceptACommand();
    ExpectTold(seen, "was not saved: line ");
    EXPECT_EQ(Ini(), garbage);
}

TEST_F(FolderSettingsNotSaved, AFileOf10MiBIsNotReadNorWrittenOverAndTheUserIsTold) {
    std::string big =
        "[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n[Big]\r\n";
    while (big.size() < 10u * 1024 * 1024)
        big += "key" + std::to_string(big.size()) + "=" + std::string(40, 'v') + "\r\n";
    WriteIni(big);
    std::string commandShown = "?";
    {
        TestDialog dialog;
        Run(dialog, [&](TestDialog& d) {
            commandShown = d.Text(IDC_SETLA_COMMAND);
            d.Press(IDCANCEL);
        });
    }
    g_alerts.clear();
    const NotSaved seen = AcceptACommand();
    EXPECT_EQ(commandShown, "") << "a file over 1 MiB is not read: the dialog opens on its defaults";
    ExpectTold(seen, "was not saved");
    EXPECT_TRUE(Ini() == big) << "the file is left as it was";
}

// ---- the stored LISP command: what the caller will run, shown as it is ----------------------------------

TEST_F(FolderSettingsDialog, TheStoredCommandIsShownWhole) {
    // Whoever can write into a shared folder chooses this text; the user sees it whole before accepting.
    const std::string command = "(progn (command \"_.ERASE\" \"_ALL\" \"\") (vl-file-delete \"C:\\\\x\") " +
                                std::string(1800, ' ') + "(princ \"tail\"))";
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=" + command + "\r\nColor=5\r\n");
    std::string shown;
    TestDialog dialog;
    Run(dialog, [&](TestDialog& d) {
        shown = d.Text(IDC_SETLA_COMMAND);
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(shown, command);
}

TEST_F(FolderSettingsDialog, TheSwatchOpensTheHostsColourDialogAndPaintsTheChoice) {
    TestDialog dialog;
    g_colorAnswer = 30;
    int index = 0;
    std::uint32_t fill = 0;
    COLORREF pixel = 0;
    const INT_PTR result = Run(dialog, [&](TestDialog& d) {
        d.Press(IDC_SETLA_USE_CURRENT);
        d.SetText(IDC_SETLA_LAYER, "WALLS");
        d.ClickSwatch();
        index = d.Swatch().GetColorIndex();
        fill = d.Swatch().GetFillColor();
        pixel = d.SwatchPixel();
        d.SetText(IDC_SETLA_COMMAND, "(c:walls)");
        d.Press(IDOK);
    });
    EXPECT_EQ(result, IDOK);
    ASSERT_EQ(g_colorCalls.size(), 1u);
    EXPECT_EQ(g_colorCalls[0].index, 7) << "opened on the swatch's index";
    EXPECT_FALSE(g_colorCalls[0].allowMeta) << "ByLayer and ByBlock not offered";
    EXPECT_EQ(g_colorCalls[0].layerColor, 0);
    EXPECT_EQ(index, 30);
    EXPECT_EQ(fill, FakeRgb(30));
    EXPECT_EQ(pixel, static_cast<COLORREF>(FakeRgb(30)));
    EXPECT_EQ(Ini(), "[Default Parameters]\r\nLayer=WALLS\r\nLisp command=(c:walls)\r\nColor=30\r\n\r\n");
}

TEST_F(FolderSettingsDialog, ACancelledColourLeavesTheSwatch) {
    WriteIni("[Default Parameters]\r\nLayer=DOORS\r\nLisp command=\r\nColor=5\r\n");
    TestDialog dialog;
    g_colorAnswer = -1;
    int index = 0;
    Run(dialog, [&](TestDialog& d) {
        d.ClickSwatch();
        index = d.Swatch().GetColorIndex();
        d.Press(IDOK);
    });
    ASSERT_EQ(g_colorCalls.size(), 1u);
    EXPECT_EQ(g_colorCalls[0].index, 5);
    EXPECT_EQ(index, 5);
    EXPECT_EQ(Ini(), "[Default Parameters]\r\nLayer=DOORS\r\nLisp command=\r\nColor=5\r\n\r\n");
}

TEST_F(FolderSettingsDialog, OtherKeysAndSectionsSurviveTheWrite) {
    WriteIni("[Mine]\r\nA=1\r\n[Default Parameters]\r\nColor=2\r\nLayer=OLD\r\nNote=kept\r\n");
    TestDialog dialog;
    Run(dialog, [](TestDialog& d) {
        d.SetText(IDC_SETLA_LAYER, "NEW");
        d.Press(IDOK);
    });
    EXPECT_EQ(Ini(), "[Mine]\r\nA=1\r\n\r\n[Default Parameters]\r\nColor=2\r\nLayer=NEW\r\nNote=kept\r\n"
                     "Lisp command=\r\n\r\n");
}

TEST_F(FolderSettingsDialog, WhatItWroteReopensTheSame) {
    g_colorAnswer = 140;
    TestDialog first;
    Run(first, [](TestDialog& d) {
        d.Press(IDC_SETLA_USE_CURRENT);
        d.SetText(IDC_SETLA_LAYER, "PIPES");
        d.ClickSwatch();
        d.SetText(IDC_SETLA_COMMAND, "(c:pipe 1)");
        d.Press(IDOK);
    });
    TestDialog second;
    bool checked = true;
    std::string layer, command;
    int index = 0;
    Run(second, [&](TestDialog& d) {
        checked = d.Checked();
        layer = d.Text(IDC_SETLA_LAYER);
        command = d.Text(IDC_SETLA_COMMAND);
        index = d.Swatch().GetColorIndex();
        d.Press(IDCANCEL);
    });
    EXPECT_FALSE(checked);
    EXPECT_EQ(layer, "PIPES");
    EXPECT_EQ(command, "(c:pipe 1)");
    EXPECT_EQ(index, 140);
}

// ---- the longest texts the file reads back ---------------------------------------------------------------

TEST_F(FolderSettingsDialog, ACommandLongerThanTheFileReadsBackIsRefusedAndTheFileKept) {
    // Before, 2,158 characters were written: the next read stopped at that line (command and colour
    // lost) and the file, read only in part, was never saved over again.
    WriteIni("[Default Parameters]\r\nLayer=LONG\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string before = Ini();
    bool stillOpen = false;
    std::string focused;
    std::size_t keptLength = 0;
    TestDialog dialog;
    const INT_PTR result = Run(dialog, [&](TestDialog& d) {
        d.SetText(IDC_SETLA_COMMAND, std::string(2158, 'c')); // as a program sets it: past the edit's limit
        d.Press(IDOK);
        stillOpen = d.IsModalRunning() && d.IsWindowVisible();
        focused = ::GetFocus() == d.Item(IDC_SETLA_COMMAND) ? "command" : "elsewhere";
        keptLength = d.Text(IDC_SETLA_COMMAND).size();
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(result, IDCANCEL);
    EXPECT_TRUE(stillOpen) << "the dialog stays open";
    EXPECT_EQ(g_alerts, std::vector<std::wstring>{WidenAnsi(CommandTooLongAlert(std::string(2158, 'c')))});
    EXPECT_EQ(focused, "command");
    EXPECT_EQ(keptLength, 2158u) << "what was entered stays to be shortened";
    EXPECT_EQ(Ini(), before);
    EXPECT_EQ(dialog.changes, 0);
}

TEST_F(FolderSettingsDialog, APasteIsCutAtTheLimitWithANoteAndReadsBackWhole) {
    WriteIni("[Default Parameters]\r\nLayer=LONG\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string pasted = "(progn " + std::string(2143, 'x') + " (c:go))"; // 2,158 characters
    ASSERT_EQ(pasted.size(), 2158u);
    std::string kept, noteBefore = "?", note;
    TestDialog first;
    Run(first, [&](TestDialog& d) {
        noteBefore = d.Text(IDC_SETLA_LIMIT_NOTE);
        ::SendMessageA(d.Item(IDC_SETLA_COMMAND), EM_SETSEL, 0, -1);
        ::SendMessageA(d.Item(IDC_SETLA_COMMAND), EM_REPLACESEL, TRUE,
                       reinterpret_cast<LPARAM>(pasted.c_str()));
        kept = d.Text(IDC_SETLA_COMMAND);
        note = d.Text(IDC_SETLA_LIMIT_NOTE);
        d.Press(IDOK);
    });
    EXPECT_EQ(noteBefore, "");
    EXPECT_EQ(kept, pasted.substr(0, static_cast<std::size_t>(MaxFolderCommandChars())));
    EXPECT_EQ(note, CommandLimitNote());
    EXPECT_TRUE(g_alerts.empty());

    // The file holds it whole, and the colour after it.
    CIniFile file(IniPath());
    ASSERT_TRUE(file.ReadFile());
    EXPECT_EQ(file.GetValue("Default Parameters", "Lisp command"), kept);
    EXPECT_EQ(file.GetValue("Default Parameters", "Color"), "5");
    // It reopens with the command, and a later Accept is saved.
    std::string shown;
    TestDialog second;
    Run(second, [&](TestDialog& d) {
        shown = d.Text(IDC_SETLA_COMMAND);
        d.SetText(IDC_SETLA_LAYER, "OTHER");
        d.Press(IDOK);
    });
    EXPECT_EQ(shown, kept);
    EXPECT_NE(Ini().find("Layer=OTHER\r\n"), std::string::npos);
    EXPECT_TRUE(g_alerts.empty());
}

TEST_F(FolderSettingsDialog, ALayerNameLongerThanTheFileReadsBackIsRefused) {
    WriteIni("[Default Parameters]\r\nLayer=LONG\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n");
    const std::string before = Ini();
    const std::string layer(static_cast<std::size_t>(MaxFolderLayerChars()) + 1, 'L');
    TestDialog dialog;
    Run(dialog, [&](TestDialog& d) {
        d.SetText(IDC_SETLA_LAYER, layer);
        d.Press(IDOK);
        d.Press(IDCANCEL);
    });
    EXPECT_EQ(g_alerts, std::vector<std::wstring>{WidenAnsi(LayerTooLongAlert(layer))});
    EXPECT_EQ(Ini(), before);
}

TEST(FolderSettingsDialogPath, ATooLongFolderIsRefusedBeforeAnythingIsCopied) {
    CDialogSetLa dialog;
    EXPECT_FALSE(dialog.SetFolder("C:\\" + std::string(245, 'd'))); // 248 + 12 = 260: one too many
    EXPECT_STREQ(dialog.GetPathBuffer(), "");
    EXPECT_TRUE(dialog.SetFolder("C:\\" + std::string(244, 'd')));
    EXPECT_EQ(std::string(dialog.GetPathBuffer()), "C:\\" + std::string(244, 'd'));
    EXPECT_FALSE(dialog.SetFolder(std::string(4000, 'x')));
    EXPECT_EQ(std::string(dialog.GetPathBuffer()), "C:\\" + std::string(244, 'd')) << "left as it was";
}

namespace {
bool FakeLayerColor(const wchar_t* name, int* index) {
    if (std::wstring(name) != L"WALLS")
        return false;
    *index = 12;
    return true;
}
} // namespace

TEST(StaticColorLayers, TakesTheColourOfALayerOfTheDrawingOrStaysAsItWas) {
    HostApi api;
    api.acdbGetLayerColor = FakeLayerColor;
    api.acedGetRGB = FakeRgb;
    SetHostApi(api);
    CStaticColor swatch;
    EXPECT_EQ(swatch.GetColorIndex(), 7);
    EXPECT_EQ(swatch.GetFillColor(), 0xFFFFFFu);
    int index = 0;
    EXPECT_TRUE(CStaticColor::GetLayerColor("WALLS", index));
    EXPECT_EQ(index, 12);
    EXPECT_FALSE(CStaticColor::GetLayerColor("NONE", index));
    EXPECT_EQ(index, 12);
    EXPECT_FALSE(swatch.SetColorFromLayer("NONE"));
    EXPECT_EQ(swatch.GetColorIndex(), 7);
    EXPECT_EQ(swatch.GetFillColor(), 0xFFFFFFu);
    EXPECT_TRUE(swatch.SetColorFromLayer("WALLS"));
    EXPECT_EQ(swatch.GetColorIndex(), 12);
    EXPECT_EQ(swatch.GetFillColor(), FakeRgb(12));
    SetHostApi(HostApi{});
}

TEST(FolderSettingsCaption, NamesTheFolderByItsLastPart) {
    EXPECT_EQ(FolderCaptionName("C:\\Drawings\\Doors"), "Doors");
    EXPECT_EQ(FolderCaptionName("C:\\Drawings\\Doors\\"), "Doors");
    EXPECT_EQ(FolderCaptionName("C:\\"), "C:\\");
    EXPECT_EQ(FolderCaptionName("C:"), "C:");
    EXPECT_EQ(FolderCaptionName("\\\\server\\share\\plans"), "plans");
}
