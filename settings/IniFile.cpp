#include "settings/IniFile.h"

#include "hostapi/NarrowText.h"
#include "settings/IniFileIo.h"
#include "settings/SettingsReport.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <set>
#include <unordered_set>
#include <utility>

namespace {

// Line ends on disk.
constexpr char kLineEnd[] = "\r\n";

// The next line of text from pos, without its end; pos moves past the line end. "\r\n" and "\n" both
// end a line, so files written on any platform read alike; a carriage return anywhere else is an
// ordinary character.
std::string NextLine(const std::string& text, std::size_t& pos) {
    std::size_t end = text.find('\n', pos);
    std::size_t next = end == std::string::npos ? text.size() : end + 1;
    if (end == std::string::npos)
        end = text.size();
    else if (end > pos && text[end - 1] == '\r')
        --end;
    std::string line = text.substr(pos, end - pos);
    pos = next;
    return line;
}

// One explorer run reads a folder's datains.ini several times (the layer label, the result list);
// one line on the command line per file and size says it.
void ReportTooLargeOnce(const std::string& fileName, unsigned long long size) {
    static std::mutex mutex;
    static std::set<std::pair<std::string, unsigned long long>> reported;
    {
        std::lock_guard<std::mutex> lock(mutex);
        if (!reported.emplace(fileName, size).second)
            return;
    }
    ReportSettingsProblem("\nOrvex: " + fileName + " is larger than 1 MiB; it was not read\n");
}

// A line break for this format: the reader ends a line at a line feed (with or without a carriage
// return before it).
bool HoldsLineBreak(const std::string& text) {
    return text.find('\n') != std::string::npos;
}

// How a name or value is shown in a message: short, and with its control characters visible.
std::string Shown(const std::string& text) {
    std::string shown;
    for (std::size_t i = 0; i < text.size() && i < 40; ++i) {
        const unsigned char c = static_cast<unsigned char>(text[i]);
        if (c == '\n')
            shown += "\\n";
        else if (c == '\r')
            shown += "\\r";
        else if (c < 0x20)
            shown += "\\x" + std::string(1, "0123456789ABCDEF"[c >> 4]) + "0123456789ABCDEF"[c & 15];
        else
            shown += static_cast<char>(c);
    }
    if (text.size() > 40)
        shown += "...";
    return shown;
}

} // namespace

int MaxIniValueChars(const std::string& valuename) {
    return std::max(0, kMaxIniLineChars - static_cast<int>(valuename.size()) - 1);
}

std::string WhyIniSectionUnreadable(const std::string& keyname) {
    if (HoldsLineBreak(keyname))
        return "the section name \"" + Shown(keyname) + "\" holds a line break";
    // The reader takes every leading "[" and trailing "]" off a heading.
    if (!keyname.empty() && (keyname.front() == '[' || keyname.back() == ']'))
        return "the section name \"" + Shown(keyname) + "\" begins with [ or ends with ]";
    if (keyname.size() + 2 > static_cast<std::size_t>(kMaxIniLineChars))
        return "the section name \"" + Shown(keyname) + "\" is longer than " +
               std::to_string(kMaxIniLineChars - 2) + " " + ByteLimitUnit(keyname);
    return {};
}

std::string WhyIniValueUnreadable(const std::string& valuename, const std::string& value) {
    if (HoldsLineBreak(valuename))
        return "the name \"" + Shown(valuename) + "\" holds a line break";
    if (valuename.find('=') != std::string::npos)
        return "the name \"" + Shown(valuename) + "\" holds an =";
    if (HoldsLineBreak(value))
        return "the value of " + Shown(valuename) + " holds a line break";
    if (!valuename.empty() && valuename.front() == '[' && !value.empty() && value.back() == ']')
        return "the line of " + Shown(valuename) + " would read as a [section]";
    if (value.size() > static_cast<std::size_t>(MaxIniValueChars(valuename)))
        return "the value of " + Shown(valuename) + " is " + CharactersAndBytes(value) + " long, at most " +
               std::to_string(MaxIniValueChars(valuename)) +
               (CharacterCount(value) != value.size() ? " bytes" : "") + " can be read back";
    return {};
}

int LenientInt(const std::string& text) {
    std::size_t i = 0;
    while (i < text.size() && (text[i] == ' ' || (text[i] >= '\t' && text[i] <= '\r')))
        ++i;
    bool negative = false;
    if (i < text.size() && (text[i] == '+' || text[i] == '-'))
        negative = text[i++] == '-';
    long long magnitude = 0;
    const long long limit = negative ? -static_cast<long long>(INT_MIN) : INT_MAX;
    for (; i < text.size() && text[i] >= '0' && text[i] <= '9'; ++i)
        magnitude = std::min(limit, magnitude * 10 + (text[i] - '0'));
    return static_cast<int>(negative ? -magnitude : magnitude);
}

CIniFile::key& CIniFile::key::operator=(const key& other) {
    if (this == &other)
        return *this;
    values.SetSize(other.values.GetSize());
    for (int i = 0; i < other.values.GetSize(); ++i)
        values[i] = other.values[i];
    names.SetSize(other.names.GetSize());
    for (int i = 0; i < other.names.GetSize(); ++i)
        names[i] = other.names[i];
    return *this;
}

CIniFile::CIniFile(std::string iniPath) : path(std::move(iniPath)) {}

void CIniFile::SetPath(std::string newPath) {
    path = std::move(newPath);
}

bool CIniFile::ReadFile() {
    std::string text;
    unsigned long long size = 0;
    switch (ReadWholeFile(path, kMaxIniFileBytes, text, &size)) {
    case WholeFileRead::Read:
        break;
    case WholeFileRead::Missing:
        return false;
    case WholeFileRead::TooLarge:
        error = "Ini file is larger than 1 MiB.";
        LeaveFileAlone("it is larger than 1 MiB");
        ReportTooLargeOnce(path, size);
        return false;
    case WholeFileRead::CannotOpen:
    case WholeFileRead::Failed:
        error = "Unable to open ini file.";
        LeaveFileAlone("it could not be read");
        return false;
    }

    // Positions given a value by this file: a second line for one of them replaces the first, which a
    // save would then lose.
    std::unordered_set<std::uint64_t> fromThisFile;
    std::string keepWhy;
    std::string keyname;
    std::size_t pos = 0;
    for (int lineNumber = 1; pos < text.size(); ++lineNumber) {
        std::string line = NextLine(text, pos);
        if (line.size() > static_cast<std::size_t>(kMaxIniLineChars)) {
            // The line and the rest of the file are not taken.
            if (keepWhy.empty())
                keepWhy = "line " + std::to_string(lineNumber) + " is longer than " +
                          std::to_string(kMaxIniLineChars) + " " + ByteLimitUnit(line);
            break;
        }
        if (line.empty())
            continue;
        if (line.front() == '[' && line.back() == ']') {
            std::string::size_type first = line.find_first_not_of('[');
            if (first == std::string::npos) {
                keyname.clear();
            } else {
                std::string::size_type last = line.find_last_not_of(']');
                keyname = last >= first ? line.substr(first, last - first + 1) : std::string();
            }
            continue;
        }
        // Without "=" the name is empty and the value is the line less its first character; files in
        // use rely on this reading, so it stays. Saving would write the line otherwise.
        std::string::size_type eq = line.find('=');
        if (eq == std::string::npos && keepWhy.empty())
            keepWhy = "line " + std::to_string(lineNumber) + " is neither a [section] nor a name=value line";
        std::string valuename = eq == std::string::npos ? std::string() : line.substr(0, eq);
        std::string value = line.substr(valuename.size() + 1);
        const Position at = Place(keyname, std::move(valuename), true);
        keys[at.key].values[at.value] = std::move(value);
        const std::uint64_t atBits =
            (static_cast<std::uint64_t>(at.key) << 32) | static_cast<std::uint32_t>(at.value);
        if (!fromThisFile.insert(atBits).second && keepWhy.empty())
            keepWhy = "line " + std::to_string(lineNumber) + " repeats a name of its section";
    }

    if (!keepWhy.empty())
        LeaveFileAlone(keepWhy);
    else if (m_strLeaveAlone == path)
        m_strLeaveAlone.clear(); // read whole this time
    return true;
}

void CIniFile::LeaveFileAlone(const std::string& why) {
    m_strLeaveAlone = path;
    m_strLeaveAloneWhy = why;
}

bool CIniFile::WriteFile() {
    if (!m_strLeaveAlone.empty() && m_strLeaveAlone == path) {
        ReportSettingsProblem("\nOrvex: " + path + " was not saved: " + m_strLeaveAloneWhy +
                              "; the file is left as it was\n");
        return false;
    }

    if (path.empty()) {
        ReportSettingsProblem("\nOrvex: settings were not saved: the file has no name\n");
        return false;
    }

    std::string text;
    for (int k = 0; k < keys.GetSize(); ++k) {
        const key& section = keys[k];
        if (section.names.GetSize() == 0)
            continue;
        // A file the reader would take otherwise than it was meant is never written: the next run would
        // read other settings, or refuse to save over a file it reads only in part.
        std::string unreadable = WhyIniSectionUnreadable(names[k]);
        for (int j = 0; j < section.names.GetSize() && unreadable.empty(); ++j) {
            unreadable = WhyIniValueUnreadable(section.names[j], section.values[j]);
            if (!unreadable.empty())
                unreadable += " in [" + Shown(names[k]) + "]";
        }
        if (!unreadable.empty()) {
            ReportSettingsProblem("\nOrvex: " + path + " was not saved: " + unreadable +
                                  "; the file is left as it was\n");
            return false;
        }
        text += "[" + names[k] + "]" + kLineEnd;
        for (int j = 0; j < section.names.GetSize(); ++j) {
            text += section.names[j];
            text += '=';
            text += section.values[j];
            text += kLineEnd;
        }
        text += kLineEnd;
    }

    std::string reason;
    if (!ReplaceWholeFile(path, text, reason)) {
        ReportSettingsProblem("\nOrvex: " + path + " was not saved: " + reason +
                              "; the file is left as it was\n");
        return false;
    }
    return true;
}

void CIniFile::Reset() {
    keys.RemoveAll();
    names.RemoveAll();
    m_keyIndex.clear();
    m_valueIndex.clear();
    m_strLeaveAlone.clear();
    m_strLeaveAloneWhy.clear();
}

int CIniFile::GetNumKeys() const {
    return keys.GetSize();
}

int CIniFile::GetNumValues(std::string keyname) const {
    int keynum = FindKey(keyname);
    if (keynum == -1)
        return -1;
    return keys[keynum].names.GetSize();
}

void CIniFile::IndexNames(const CArray<std::string>& arrayNames, PositionIndex& index) {
    index.clear();
    index.reserve(static_cast<std::size_t>(arrayNames.GetSize()));
    for (int i = 0; i < arrayNames.GetSize(); ++i)
        index.emplace(arrayNames[i], i); // a repeated name keeps its first position, as a search would
}

int CIniFile::Find(const CArray<std::string>& arrayNames, PositionIndex& index, const std::string& name) {
    // The member functions keep every name unique and indexed, so the sizes agree; if they do not, or
    // a hit points elsewhere, the arrays were changed directly and the index is built again.
    if (index.size() != static_cast<std::size_t>(arrayNames.GetSize()))
        IndexNames(arrayNames, index);
    auto found = index.find(name);
    if (found != index.end() &&
        (found->second >= arrayNames.GetSize() || arrayNames[found->second] != name)) {
        IndexNames(arrayNames, index);
        found = index.find(name);
    }
    return found == index.end() ? -1 : found->second;
}

int CIniFile::FindKey(std::string keyname) const {
    if (m_valueIndex.size() != static_cast<std::size_t>(keys.GetSize()))
        m_valueIndex.assign(static_cast<std::size_t>(keys.GetSize()), PositionIndex());
    return Find(names, m_keyIndex, keyname);
}

int CIniFile::FindValue(int keynum, std::string valuename) const {
    if (keynum == -1)
        return -1;
    const key& section = keys[keynum]; // throws for a position outside the array
    if (m_valueIndex.size() != static_cast<std::size_t>(keys.GetSize()))
        m_valueIndex.assign(static_cast<std::size_t>(keys.GetSize()), PositionIndex());
    return Find(section.names, m_valueIndex[static_cast<std::size_t>(keynum)], valuename);
}

std::string CIniFile::GetValue(std::string keyname, std::string valuename) {
    int keynum = FindKey(keyname);
    if (keynum == -1) {
        error = "Unable to locate specified key.";
        return "";
    }
    int valuenum = FindValue(keynum, valuename);
    if (valuenum == -1) {
        error = "Unable to locate specified value.";
        return "";
    }
    return keys[keynum].values[valuenum];
}

int CIniFile::GetValueI(std::string keyname, std::string valuename) {
    return LenientInt(GetValue(std::move(keyname), std::move(valuename)));
}

double CIniFile::GetValueF(std::string keyname, std::string valuename) {
    return std::atof(GetValue(std::move(keyname), std::move(valuename)).c_str());
}

template <class T> void CIniFile::GrowTo(CArray<T>& array, int size) {
    array.SetSize(size, std::max(array.GetSize(), 4));
}

CIniFile::Position CIniFile::Place(std::string keyname, std::string valuename, bool create) {
    Position at;
    at.key = FindKey(keyname);
    if (at.key == -1) {
        if (!create)
            return Position();
        at.key = names.GetSize();
        GrowTo(keys, at.key + 1);
        GrowTo(names, at.key + 1);
        names[at.key] = keyname;
        m_keyIndex.emplace(std::move(keyname), at.key);
        m_valueIndex.emplace_back();
    }

    at.value = FindValue(at.key, valuename);
    if (at.value == -1) {
        if (!create)
            return Position();
        key& section = keys[at.key];
        at.value = section.names.GetSize();
        GrowTo(section.names, at.value + 1);
        GrowTo(section.values, at.value + 2);
        section.names[at.value] = valuename;
        m_valueIndex[static_cast<std::size_t>(at.key)].emplace(std::move(valuename), at.value);
    }
    return at;
}

bool CIniFile::SetValue(std::string keyname, std::string valuename, std::string value, bool create) {
    const Position at = Place(std::move(keyname), std::move(valuename), create);
    if (at.value == -1)
        return false;
    keys[at.key].values[at.value] = std::move(value);
    return true;
}

bool CIniFile::SetValueI(std::string keyname, std::string valuename, int value, bool create) {
    char text[32];
    std::snprintf(text, sizeof text, "%d", value);
    return SetValue(std::move(keyname), std::move(valuename), text, create);
}

bool CIniFile::SetValueF(std::string keyname, std::string valuename, double value, bool create) {
    char text[64]; // "%e" is at most "-1.797693e+308"
    std::snprintf(text, sizeof text, "%e", value);
    return SetValue(std::move(keyname), std::move(valuename), text, create);
}

bool CIniFile::DeleteValue(std::string keyname, std::string valuename) {
    int keynum = FindKey(keyname);
    if (keynum == -1)
        return false;
    int valuenum = FindValue(keynum, valuename);
    if (valuenum == -1)
        return false;
    key& section = keys[keynum];
    section.names.RemoveAt(valuenum);
    section.values.RemoveAt(valuenum);
    PositionIndex& index = m_valueIndex[static_cast<std::size_t>(keynum)];
    index.erase(valuename);
    for (auto& entry : index) {
        if (entry.second > valuenum)
            --entry.second;
    }
    return true;
}

bool CIniFile::DeleteKey(std::string keyname) {
    int keynum = FindKey(keyname);
    if (keynum == -1)
        return false;
    keys.RemoveAt(keynum);
    names.RemoveAt(keynum);
    m_valueIndex.erase(m_valueIndex.begin() + keynum);
    m_keyIndex.erase(keyname);
    for (auto& entry : m_keyIndex) {
        if (entry.second > keynum)
            --entry.second;
    }
    return true;
}

// The same on every system: the process and a count of the calls keep two writers apart.
std::string TemporaryFileBeside(const std::string& fileName, unsigned long processId,
                                unsigned long callNumber) {
    return fileName + "." + std::to_string(processId) + "-" + std::to_string(callNumber) + ".tmp";
}
