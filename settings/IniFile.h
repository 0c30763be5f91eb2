// The ini store behind both settings files: the explorer's own file beside the library and the
// "datains.ini" of every drawing folder. Portable: no <windows.h>.
//
// The format is exactly what ReadFile and WriteFile do: "[name]" headings, "name=value" lines, no
// comments, no trimming, no quoting. Look-ups are byte-wise and case-sensitive. Files are read whole,
// changed in memory and written whole; on disk every line ends with carriage return + line feed.
#pragma once

#include "framework/CArray.h"

#include <string>

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

    // Merges the file into the store. False when the file is missing (error untouched) or cannot be
    // opened; a line too long for the 2048-character line buffer ends the reading but still succeeds.
    bool ReadFile();
    // Writes every section that has values. A file that cannot be created is passed over silently.
    void WriteFile();
    void Reset();

    int GetNumKeys() const;
    int GetNumValues(std::string keyname) const;
    int FindKey(std::string keyname) const;
    int FindValue(int keynum, std::string valuename) const;

    std::string GetValue(std::string keyname, std::string valuename);
    int GetValueI(std::string keyname, std::string valuename);
    double GetValueF(std::string keyname, std::string valuename);

    bool SetValue(std::string keyname, std::string valuename, std::string value, bool create = true);
    bool SetValueI(std::string keyname, std::string valuename, int value, bool create = true);
    bool SetValueF(std::string keyname, std::string valuename, double value, bool create = true);

    bool DeleteValue(std::string keyname, std::string valuename);
    bool DeleteKey(std::string keyname);

    std::string path;
    CArray<key> keys;
    CArray<std::string> names; // names[i] is the name of keys[i]
    std::string error;         // text of the last failure; set, never cleared
};
