// The script that drives windows with real input while a LISP call runs (devhost --script FILE).
// Reading the script is portable; devhost/ScriptRunner.cpp carries it out. The format is described in
// devhost/README.md.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace devhost {

// One step of a window path: the windows of the process (first step) or the descendants of the windows
// the previous step found, that match every condition given.
struct WindowStep {
    std::wstring className; // class=NAME (exact, case-insensitive as window classes are)
    bool hasId = false;     // id=N: the control id
    int id = 0;
    bool hasText = false; // text=TEXT: the window text, exact
    std::wstring text;
    std::wstring contains;      // contains=TEXT: part of the window text
    int nth = -1;               // nth=N: only the N-th match (from 0), in the system's enumeration order
    bool anyVisibility = false; // visible=any: hidden windows count too
};

enum Modifier : unsigned { kCtrl = 1, kShift = 2, kAlt = 4 };

struct KeyChord {
    unsigned modifiers = 0;
    unsigned short virtualKey = 0; // Windows virtual-key code
};

struct ScriptCommand {
    enum class Kind {
        Wait,
        Gone,
        Sleep,
        Move,
        Click,
        DoubleClick,
        RightClick,
        Key,
        Type,
        Screenshot,
        Count,
        Rects,
        Text,
        Rect,
        Enabled,
        Exists,
        Tooltip,
        Focus,
        Returned,
        Typed,
        DoubleClickTime,
        Echo,
        TreeSelect,
        TreeExpand,
        TreeCollapse,
        TreeRightClick,
        TreeItems,
        TreeCount,
        ClipboardPut,
        ClipboardFiles,
        Remove,
        ClipboardText,
        Post,
        Call,
        Drag,
        ScrollBar,
        Redraw,
        Windows
    };
    int line = 0;
    Kind kind = Kind::Echo;
    std::vector<WindowStep> window;
    int timeoutMs = 5000;     // timeout=MS (wait, gone, and the commands that need their window)
    bool hasPoint = false;    // at=X,Y: a point of the window's client area
    bool windowPoint = false; // window-at=X,Y: a point of the whole window (negative: from right/bottom)
    int x = 0, y = 0;
    // drag: to=X,Y, where the button is let go, in the same kind of point as at= / window-at=; a value
    // ending in % is that share of the window's (or client area's) width or height.
    bool hasTo = false;
    int toX = 0, toY = 0;
    bool toXPercent = false, toYPercent = false;
    int steps = 8;                   // drag: steps=N, pointer moves between press and release
    unsigned modifiers = 0;          // with=ctrl+shift+alt
    std::vector<KeyChord> keys;      // key
    std::wstring text;               // type, echo, clipboard-text
    std::wstring file;               // screenshot, remove
    int ms = 0;                      // sleep
    std::wstring treePath;           // path=: a tree item's label path, labels joined by backslashes
    int atLeast = 0;                 // tree-count: at-least=N
    bool wide = false;               // clipboard-put wide: the names as UTF-16
    std::vector<std::wstring> files; // clipboard-put: the names of the list
    unsigned message = 0;            // post: the message number and its two parameters
    int wParam = 0, lParam = 0;
};

// Reads a whole script. False with "line N: message" in `error` at the first bad line.
bool ReadScript(std::wstring_view text, std::vector<ScriptCommand>& commands, std::wstring& error);

// A window path written back the way it is read (for messages).
std::wstring DescribeWindow(const std::vector<WindowStep>& window);

// The virtual-key code of a key name (a, 7, enter, f5, ...); 0 when unknown.
unsigned short VirtualKeyOf(std::wstring_view name);

} // namespace devhost
