#include "devhost/Script.h"

#include <gtest/gtest.h>

namespace {

using devhost::ScriptCommand;

std::vector<ScriptCommand> Read(const std::wstring& text) {
    std::vector<ScriptCommand> commands;
    std::wstring error;
    EXPECT_TRUE(devhost::ReadScript(text, commands, error)) << std::string(error.begin(), error.end());
    return commands;
}

std::wstring Error(const std::wstring& text) {
    std::vector<ScriptCommand> commands;
    std::wstring error;
    EXPECT_FALSE(devhost::ReadScript(text, commands, error));
    return error;
}

TEST(Script, CommentsAndBlankLinesAreSkipped) {
    const auto commands = Read(L"# a comment\n\n   \n  # another\nsleep 10\r\n");
    ASSERT_EQ(commands.size(), 1u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::Sleep);
    EXPECT_EQ(commands[0].ms, 10);
    EXPECT_EQ(commands[0].line, 5);
}

TEST(Script, ReturnedWaitsForTheCallAndTypedTakesNoWindow) {
    const auto commands = Read(L"returned timeout=30000\ntyped\nreturned\ndouble-click-time\n");
    ASSERT_EQ(commands.size(), 4u);
    EXPECT_EQ(commands[3].kind, ScriptCommand::Kind::DoubleClickTime);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::Returned);
    EXPECT_EQ(commands[0].timeoutMs, 30000);
    EXPECT_TRUE(commands[0].window.empty());
    EXPECT_EQ(commands[1].kind, ScriptCommand::Kind::Typed);
    EXPECT_EQ(commands[2].timeoutMs, 5000);
    EXPECT_NE(Error(L"typed class=Edit\n").find(L"line 1"), std::wstring::npos);
}

TEST(Script, WindowPaths) {
    const auto commands =
        Read(L"click class=#32770 text=\"Pick one\" > id=1001 at=5,-6 with=ctrl+shift timeout=200\n");
    ASSERT_EQ(commands.size(), 1u);
    const ScriptCommand& click = commands[0];
    EXPECT_EQ(click.kind, ScriptCommand::Kind::Click);
    ASSERT_EQ(click.window.size(), 2u);
    EXPECT_EQ(click.window[0].className, L"#32770");
    EXPECT_TRUE(click.window[0].hasText);
    EXPECT_EQ(click.window[0].text, L"Pick one");
    EXPECT_TRUE(click.window[1].hasId);
    EXPECT_EQ(click.window[1].id, 1001);
    EXPECT_TRUE(click.hasPoint);
    EXPECT_EQ(click.x, 5);
    EXPECT_EQ(click.y, -6);
    EXPECT_EQ(click.modifiers, devhost::kCtrl | devhost::kShift);
    EXPECT_EQ(click.timeoutMs, 200);
    EXPECT_EQ(devhost::DescribeWindow(click.window), L"class=#32770 text=\"Pick one\" > id=1001");
}

TEST(Script, EveryCommand) {
    const auto commands = Read(L"wait class=A\n"
                               L"gone class=A timeout=10\n"
                               L"move id=3\n"
                               L"double-click contains=dwg nth=2\n"
                               L"right-click class=B visible=any\n"
                               L"key ctrl+c enter F5 shift+tab ctrl++\n"
                               L"type \"hello \\\"you\\\"\"\n"
                               L"screenshot class=A shot.bmp\n"
                               L"count class=tooltips_class32\n"
                               L"text id=1\n"
                               L"rect id=1\n"
                               L"enabled id=1\n"
                               L"exists id=1\n"
                               L"tooltip\n"
                               L"focus\n"
                               L"echo two words\n");
    ASSERT_EQ(commands.size(), 16u);
    EXPECT_EQ(commands[1].timeoutMs, 10);
    EXPECT_EQ(commands[3].window[0].contains, L"dwg");
    EXPECT_EQ(commands[3].window[0].nth, 2);
    EXPECT_TRUE(commands[4].window[0].anyVisibility);
    ASSERT_EQ(commands[5].keys.size(), 5u);
    EXPECT_EQ(commands[5].keys[0].modifiers, devhost::kCtrl);
    EXPECT_EQ(commands[5].keys[0].virtualKey, 'C');
    EXPECT_EQ(commands[5].keys[1].virtualKey, 0x0D);
    EXPECT_EQ(commands[5].keys[2].virtualKey, 0x74);
    EXPECT_EQ(commands[5].keys[3].modifiers, devhost::kShift);
    EXPECT_EQ(commands[5].keys[3].virtualKey, 0x09);
    EXPECT_EQ(commands[5].keys[4].virtualKey, 0xBB);
    EXPECT_EQ(commands[6].text, L"hello \"you\"");
    EXPECT_EQ(commands[7].file, L"shot.bmp");
    EXPECT_EQ(commands[13].kind, ScriptCommand::Kind::Tooltip);
    EXPECT_EQ(commands[15].text, L"two words");
}

TEST(Script, Errors) {
    EXPECT_EQ(Error(L"sleep 1\nfly away\n"), L"line 2: unknown command fly");
    EXPECT_EQ(Error(L"click\n"), L"line 1: click needs a window, such as class=NAME or id=N");
    EXPECT_EQ(Error(L"click id=x\n"), L"line 1: id= takes a number: id=x");
    EXPECT_EQ(Error(L"click id=1 >\n"), L"line 1: > needs a window step on each side");
    EXPECT_EQ(Error(L"click > id=1\n"), L"line 1: > needs a window step on each side");
    EXPECT_EQ(Error(L"click id=1 at=3\n"), L"line 1: at= takes X,Y: at=3");
    EXPECT_EQ(Error(L"click id=1 with=meta\n"),
              L"line 1: with= takes ctrl, shift and alt joined by +: with=meta");
    EXPECT_EQ(Error(L"sleep\n"), L"line 1: sleep takes milliseconds");
    EXPECT_EQ(Error(L"key\n"), L"line 1: key needs at least one key, such as enter or ctrl+c");
    EXPECT_EQ(Error(L"key hyper+q\n"), L"line 1: unknown key hyper+q");
    EXPECT_EQ(Error(L"type a b\n"), L"line 1: type takes one text (quote it when it has blanks)");
    EXPECT_EQ(Error(L"type \"open\n"), L"line 1: unterminated quoted text");
    EXPECT_EQ(Error(L"screenshot id=1\n"), L"line 1: screenshot takes a window and one file name");
    EXPECT_EQ(Error(L"count id=1 extra\n"), L"line 1: unexpected extra");
    EXPECT_EQ(Error(L"wait id=1 timeout=soon\n"), L"line 1: timeout= takes milliseconds: timeout=soon");
    EXPECT_EQ(Error(L"wait id=1 visible=no\n"), L"line 1: visible= takes yes or any: visible=no");
    // An empty class or fragment would match every window.
    EXPECT_EQ(Error(L"click class=\n"), L"line 1: class= takes a text: class=");
    EXPECT_EQ(Error(L"click id=1 > contains=\"\"\n"), L"line 1: contains= takes a text: contains=");
}

TEST(Script, TreeCommandsNameAnItemByItsLabelPath) {
    const auto commands =
        Read(L"tree-select class=#32770 > id=1003 path=\"Desktop\\My Computer\" timeout=90\n"
             L"tree-expand id=7 path=Desktop\n"
             L"tree-collapse id=7 path=a\\b\n"
             L"tree-right-click id=7 path=a\n"
             L"tree-items class=SysTreeView32\n");
    ASSERT_EQ(commands.size(), 5u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::TreeSelect);
    EXPECT_EQ(commands[0].treePath, L"Desktop\\My Computer");
    EXPECT_EQ(commands[0].timeoutMs, 90);
    ASSERT_EQ(commands[0].window.size(), 2u);
    EXPECT_EQ(commands[1].kind, ScriptCommand::Kind::TreeExpand);
    EXPECT_EQ(commands[2].kind, ScriptCommand::Kind::TreeCollapse);
    EXPECT_EQ(commands[2].treePath, L"a\\b");
    EXPECT_EQ(commands[3].kind, ScriptCommand::Kind::TreeRightClick);
    EXPECT_EQ(commands[4].kind, ScriptCommand::Kind::TreeItems);
    EXPECT_EQ(commands[4].treePath, L"");
    EXPECT_EQ(Error(L"tree-select id=7\n"), L"line 1: tree-select needs path=\"LABEL\\\\LABEL...\"");
    EXPECT_EQ(Error(L"tree-items id=7 path=a\n"), L"line 1: unexpected path=a");
    EXPECT_EQ(Error(L"tree-expand path=a\n"),
              L"line 1: tree-expand needs a window, such as class=NAME or id=N");
    EXPECT_EQ(Error(L"tree-expand id=7 path=\n"),
              L"line 1: path= takes a tree item's labels joined by backslashes: path=");
}

TEST(Script, KeyNames) {
    EXPECT_EQ(devhost::VirtualKeyOf(L"A"), 'A');
    EXPECT_EQ(devhost::VirtualKeyOf(L"z"), 'Z');
    EXPECT_EQ(devhost::VirtualKeyOf(L"7"), '7');
    EXPECT_EQ(devhost::VirtualKeyOf(L"Escape"), 0x1B);
    EXPECT_EQ(devhost::VirtualKeyOf(L"f12"), 0x7B);
    EXPECT_EQ(devhost::VirtualKeyOf(L"f25"), 0);
    EXPECT_EQ(devhost::VirtualKeyOf(L"nothing"), 0);
}

} // namespace

TEST(Script, ClipboardCommands) {
    const auto commands =
        Read(L"clipboard-put ansi \"Z:\\\\a b\\\\x.dwg\" Z:\\y.txt\nclipboard-put wide Z:\\w.dwg\n"
             L"clipboard-put ansi\nclipboard-files\n");
    ASSERT_EQ(commands.size(), 4u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::ClipboardPut);
    EXPECT_FALSE(commands[0].wide);
    EXPECT_EQ(commands[0].files, (std::vector<std::wstring>{L"Z:\\a b\\x.dwg", L"Z:\\y.txt"}));
    EXPECT_TRUE(commands[1].wide);
    EXPECT_EQ(commands[1].files, std::vector<std::wstring>{L"Z:\\w.dwg"});
    EXPECT_TRUE(commands[2].files.empty()); // an empty list
    EXPECT_EQ(commands[3].kind, ScriptCommand::Kind::ClipboardFiles);
    EXPECT_NE(Error(L"clipboard-put Z:\\a.dwg\n").find(L"ansi or wide"), std::wstring::npos);
    EXPECT_NE(Error(L"clipboard-put\n").find(L"ansi or wide"), std::wstring::npos);
}

TEST(Script, ClipboardTextTakesOneText) {
    const auto commands = Read(L"clipboard-text \"\u8868\u793A b\"\nclipboard-text abc\n");
    ASSERT_EQ(commands.size(), 2u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::ClipboardText);
    EXPECT_EQ(commands[0].text, L"\u8868\u793A b");
    EXPECT_EQ(commands[1].text, L"abc");
    EXPECT_NE(Error(L"clipboard-text\n").find(L"one text"), std::wstring::npos);
    EXPECT_NE(Error(L"clipboard-text a b\n").find(L"one text"), std::wstring::npos);
}

TEST(Script, PostNamesAWindowAMessageAndItsParameters) {
    const auto commands = Read(L"post class=#32770 visible=any 32768 1 -7\npost class=X 32769\n");
    ASSERT_EQ(commands.size(), 2u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::Post);
    ASSERT_EQ(commands[0].window.size(), 1u);
    EXPECT_TRUE(commands[0].window[0].anyVisibility);
    EXPECT_EQ(commands[0].message, 32768u);
    EXPECT_EQ(commands[0].wParam, 1);
    EXPECT_EQ(commands[0].lParam, -7);
    EXPECT_EQ(commands[1].message, 32769u);
    EXPECT_EQ(commands[1].wParam, 0);
    EXPECT_EQ(commands[1].lParam, 0);
    const std::wstring usage =
        L"line 1: post takes a window, a message number and up to two parameters, in decimal";
    EXPECT_EQ(Error(L"post class=X\n"), usage);
    EXPECT_EQ(Error(L"post class=X 0x8000\n"), usage);
    EXPECT_EQ(Error(L"post class=X 1 2 3 4\n"), usage);
    EXPECT_EQ(Error(L"post 32768 1\n"), L"line 1: post needs a window, such as class=NAME or id=N");
}

TEST(Script, DragPressesAtOnePointAndLetsGoAtAnother) {
    const auto commands = Read(L"drag id=59649 window-at=-8,22 to=-8,50% steps=20\n"
                               L"drag class=X at=3,4 to=30%,-5\n");
    ASSERT_EQ(commands.size(), 2u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::Drag);
    EXPECT_TRUE(commands[0].windowPoint);
    EXPECT_EQ(commands[0].x, -8);
    EXPECT_EQ(commands[0].y, 22);
    EXPECT_TRUE(commands[0].hasTo);
    EXPECT_EQ(commands[0].toX, -8);
    EXPECT_FALSE(commands[0].toXPercent);
    EXPECT_EQ(commands[0].toY, 50);
    EXPECT_TRUE(commands[0].toYPercent);
    EXPECT_EQ(commands[0].steps, 20);
    EXPECT_FALSE(commands[1].windowPoint);
    EXPECT_EQ(commands[1].toX, 30);
    EXPECT_TRUE(commands[1].toXPercent);
    EXPECT_EQ(commands[1].toY, -5);
    EXPECT_EQ(commands[1].steps, 8);
    EXPECT_EQ(Error(L"drag class=X at=1,1\n"), L"line 1: drag needs to=X,Y, where the button is let go");
    EXPECT_NE(Error(L"drag class=X to=1\n").find(L"to= takes X,Y"), std::wstring::npos);
    EXPECT_NE(Error(L"drag class=X to=1,150%\n").find(L"to= takes X,Y"), std::wstring::npos);
    EXPECT_NE(Error(L"drag class=X to=1,-5%\n").find(L"to= takes X,Y"), std::wstring::npos);
    EXPECT_NE(Error(L"drag class=X to=1,1 steps=0\n").find(L"steps= takes"), std::wstring::npos);
    EXPECT_NE(Error(L"click class=X to=1,1\n").find(L"unexpected to=1,1"), std::wstring::npos);
}

TEST(Script, ScrollBarRedrawAndWindowsNameAWindow) {
    const auto commands =
        Read(L"scrollbar id=59649\nredraw class=SysTreeView32\nwindows id=1 > class=Edit\n");
    ASSERT_EQ(commands.size(), 3u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::ScrollBar);
    EXPECT_EQ(commands[1].kind, ScriptCommand::Kind::Redraw);
    EXPECT_EQ(commands[2].kind, ScriptCommand::Kind::Windows);
    EXPECT_EQ(commands[2].window.size(), 2u);
    EXPECT_EQ(Error(L"scrollbar\n"), L"line 1: scrollbar needs a window, such as class=NAME or id=N");
    EXPECT_EQ(Error(L"redraw\n"), L"line 1: redraw needs a window, such as class=NAME or id=N");
}

TEST(Script, CallTakesOneLispCall) {
    const auto commands = Read(L"call \"(Orvex 1 2 \\\"\\\" \\\"\\\" \\\"\\\")\"\n");
    ASSERT_EQ(commands.size(), 1u);
    EXPECT_EQ(commands[0].kind, ScriptCommand::Kind::Call);
    EXPECT_EQ(commands[0].text, L"(Orvex 1 2 \"\" \"\" \"\")");
    EXPECT_NE(Error(L"call\n").find(L"call takes one LISP call"), std::wstring::npos);
    EXPECT_NE(Error(L"call (a) (b)\n").find(L"call takes one LISP call"), std::wstring::npos);
}
