// The ini store behind both settings files: the explorer's own file beside the library and the
// "datains.ini" of every drawing folder. Portable: no <windows.h>.
//
// The format is exactly what ReadFile and WriteFile do: "[name]" headings, "name=value" lines, no
// comments, no trimming, no quoting. Look-ups are byte-wise and case-sensitive. Files are read whole,
// changed in memory and written whole; on disk every line ends with carriage return + line feed.
//
// Settings files lie in folders other people and programs can write to, so the store guards the host:
// a file over kMaxIniFileBytes is not read, look-ups are hashed (reading is linear in the file's size),
// a file the store could not take whole is never written over, and a save replaces the file in one
// step. What went wrong is said through the settings reporter (settings/SettingsReport.h).
#pragma once

#include "framework/CArray.h"

#include <cstddef>
#include <string>
#include <unordered_map>
#include <vector>

// Larger settings files are refused unread: a few hundred bytes is what the explorer writes.
constexpr std::size_t kMaxIniFileBytes = 1024 * 1024;
// The longest line the reader takes (its line buffer holds 2048 characters with the terminator).
constexpr int kMaxIniLineChars = 2047;

// The longest value that reads back whole under that value name: its line is the name, "=" and the value.
// Callers limit what a user types with it (the folder settings dialog's command edit).
int MaxIniValueChars(const std::string& valuename);

// Why a line made of these would not read back as the same section, name and value, or empty when it
// would: a line break in a name or value (a line feed ends a line; a carriage return alone is kept), an
// "=" in a value name, a name that reads as a heading, or a line longer than kMaxIniLineChars.
std::string WhyIniSectionUnreadable(const std::string& keyname);
std::string WhyIniValueUnreadable(const std::string& valuename, const std::string& value);

class CIniFile {
public:
    // One section. After the first value is added, values holds one element more than names: the last
    // value is an empty string nothing reads. Counts and loops go by names.
    struct key {
        key() = default;
        key(const key& other) { *this = other; }
        key& operator=(const key& other);

        CArray<std::string> values;
        CArray<std::string> names;
    };

    CIniFile() = default;
    explicit CIniFile(std::string path);
    virtual ~CIniFile() = default;

    void SetPath(std::string newPath);

    // Merges the file into the store. False when the file is missing (error untouched), cannot be
    // opened or is larger than kMaxIniFileBytes (error says which; the size is also reported). A line
    // longer than kMaxIniLineChars ends the reading but still succeeds.
    // A file the store does not hold whole is left alone by WriteFile: one that could not be read, is
    // too large or was cut at a long line, and one that saving would change in more than its layout
    // (a line with no "=" loses its first character, a name given twice its first value).
    bool ReadFile();
    // Writes every section that has values: into a temporary file beside path, then moved over it, so
    // the file on disk is always a whole one. False when nothing was written, because the store holds
    // only part of the file at path, holds a section or value that would not read back (see
    // WhyIniValueUnreadable), or because the file could not be replaced; the file is then as it was and
    // the reporter has said why, once.
    bool WriteFile();
    // Empties the store; a file read only in part may then be written over.
    void Reset();

    int GetNumKeys() const;
    int GetNumValues(std::string keyname) const;
    int FindKey(std::string keyname) const;
    int FindValue(int keynum, std::string valuename) const;

    std::string GetValue(std::string keyname, std::string valuename);
    // atoi's reading (blanks, sign, digits up to the first other character); beyond the int range it
    // gives INT_MAX or INT_MIN instead of undefined behaviour.
    int GetValueI(std::string keyname, std::string valuename);
    double GetValueF(std::string keyname, std::string valuename);

    bool SetValue(std::string keyname, std::string valuename, std::string value, bool create = true);
    bool SetValueI(std::string keyname, std::string valuename, int value, bool create = true);
    bool SetValueF(std::string keyname, std::string valuename, double value, bool create = true);

    bool DeleteValue(std::string keyname, std::string valuename);
    bool DeleteKey(std::string keyname);

    // Read them freely; change them through the member functions, which keep the look-up index.
    std::string path;
    CArray<key> keys;
    CArray<std::string> names; // names[i] is the name of keys[i]
    std::string error;         // text of the last failure; set, never cleared

private:
    using PositionIndex = std::unordered_map<std::string, int>;

    struct Position {
        int key = -1;
        int value = -1;
    };
    // The position of a value, the section and the value made when missing and create is true; both
    // -1 when missing and not made (a section made first stays, empty).
    Position Place(std::string keyname, std::string valuename, bool create);
    // Position of name in names through index; the index is rebuilt first when it no longer matches
    // the array (changed around the member functions).
    static int Find(const CArray<std::string>& names, PositionIndex& index, const std::string& name);
    static void IndexNames(const CArray<std::string>& names, PositionIndex& index);
    // Resizes an array that grows by one at a time, its allocation growing geometrically so that a
    // long run of appends stays linear.
    template <class T> static void GrowTo(CArray<T>& array, int size);

    mutable PositionIndex m_keyIndex;                // section name -> position in keys
    mutable std::vector<PositionIndex> m_valueIndex; // per section: value name -> position

    // Marks the file at path as one WriteFile must not replace: the store does not hold all of it.
    void LeaveFileAlone(const std::string& why);

    std::string m_strLeaveAlone;    // the file this store does not hold whole; WriteFile leaves it alone
    std::string m_strLeaveAloneWhy; // why, as the message says it
};

// atoi's reading of a number, kept inside the int range (see CIniFile::GetValueI).
int LenientInt(const std::string& text);
