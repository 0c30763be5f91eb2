#include "settings/IniFile.h"

#include <cstdio>
#include <cstdlib>
#include <sys/stat.h>
#include <utility>

#ifdef _WIN32
#include <share.h>
#endif

namespace {

// The line buffer holds 2048 characters with its terminator, so a line may carry at most 2047.
constexpr int kLineBufferSize = 2048;

// Opens shared for reading and writing by others, without locking.
std::FILE* OpenShared(const std::string& fileName, const char* mode) {
#ifdef _WIN32
    return _fsopen(fileName.c_str(), mode, _SH_DENYNO);
#else
    return std::fopen(fileName.c_str(), mode);
#endif
}

bool FileExists(const std::string& fileName, bool& isDirectory) {
#ifdef _WIN32
    struct _stat64 st;
    if (_stat64(fileName.c_str(), &st) != 0)
        return false;
    isDirectory = (st.st_mode & _S_IFDIR) != 0;
#else
    struct stat st;
    if (::stat(fileName.c_str(), &st) != 0)
        return false;
    isDirectory = S_ISDIR(st.st_mode);
#endif
    return true;
}

enum class LineResult { Line, End, TooLong };

// Reads one line without its end. "\r\n" and "\n" both end a line, so files written on any platform
// read alike; a carriage return anywhere else is an ordinary character. End means nothing was read.
LineResult ReadLine(std::FILE* file, std::string& line) {
    line.clear();
    bool readAnything = false;
    for (;;) {
        int c = std::getc(file);
        if (c == EOF)
            return readAnything ? LineResult::Line : LineResult::End;
        readAnything = true;
        if (c == '\n')
            return LineResult::Line;
        if (c == '\r') {
            int next = std::getc(file);
            if (next == '\n')
                return LineResult::Line;
            if (next != EOF)
                std::ungetc(next, file);
        }
        if (static_cast<int>(line.size()) == kLineBufferSize - 1)
            return LineResult::TooLong; // the buffer is full and the line goes on
        line.push_back(static_cast<char>(c));
    }
}

void WriteLineEnd(std::FILE* file) {
    std::fputs("\r\n", file);
    std::fflush(file);
}

void WriteText(std::FILE* file, const std::string& text) {
    if (!text.empty())
        std::fwrite(text.data(), 1, text.size(), file);
}

} // namespace

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
    bool isDirectory = false;
    if (!FileExists(path, isDirectory))
        return false;

    // A directory cannot be opened as a file on Windows; other systems would open it, so refuse it here.
    std::FILE* file = isDirectory ? nullptr : OpenShared(path, "rb");
    if (!file) {
        error = "Unable to open ini file.";
        return false;
    }

    std::string keyname;
    std::string line;
    LineResult result;
    while ((result = ReadLine(file, line)) == LineResult::Line) {
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
        // use rely on this reading, so it stays.
        std::string::size_type eq = line.find('=');
        std::string valuename = eq == std::string::npos ? std::string() : line.substr(0, eq);
        std::string value = line.substr(valuename.size() + 1);
        SetValue(keyname, std::move(valuename), std::move(value), true);
    }

    std::fclose(file);
    return true;
}

void CIniFile::WriteFile() {
    std::FILE* file = OpenShared(path, "wb");
    if (!file)
        return;

    for (int k = 0; k < keys.GetSize(); ++k) {
        const key& section = keys[k];
        if (section.names.GetSize() == 0)
            continue;
        WriteText(file, "[" + names[k] + "]");
        WriteLineEnd(file);
        for (int j = 0; j < section.names.GetSize(); ++j) {
            WriteText(file, section.names[j] + "=" + section.values[j]);
            WriteLineEnd(file);
        }
        WriteLineEnd(file);
    }
    std::fclose(file);
}

void CIniFile::Reset() {
    keys.RemoveAll();
    names.RemoveAll();
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

int CIniFile::FindKey(std::string keyname) const {
    for (int k = 0; k < names.GetSize(); ++k) {
        if (names[k] == keyname)
            return k;
    }
    return -1;
}

int CIniFile::FindValue(int keynum, std::string valuename) const {
    if (keynum == -1)
        return -1;
    const key& section = keys[keynum];
    for (int j = 0; j < section.names.GetSize(); ++j) {
        if (section.names[j] == valuename)
            return j;
    }
    return -1;
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
    return std::atoi(GetValue(std::move(keyname), std::move(valuename)).c_str());
}

double CIniFile::GetValueF(std::string keyname, std::string valuename) {
    return std::atof(GetValue(std::move(keyname), std::move(valuename)).c_str());
}

bool CIniFile::SetValue(std::string keyname, std::string valuename, std::string value, bool create) {
    int keynum = FindKey(keyname);
    if (keynum == -1) {
        if (!create)
            return false;
        keys.SetSize(keys.GetSize() + 1);
        names.SetSize(names.GetSize() + 1);
        keynum = names.GetSize() - 1;
        names[keynum] = std::move(keyname);
    }

    int valuenum = FindValue(keynum, valuename);
    if (valuenum == -1) {
        if (!create)
            return false;
        key& section = keys[keynum];
        section.names.SetSize(section.names.GetSize() + 1);
        section.values.SetSize(section.names.GetSize() + 1);
        valuenum = section.names.GetSize() - 1;
        section.names[valuenum] = std::move(valuename);
    }

    keys[keynum].values[valuenum] = std::move(value);
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
    return true;
}

bool CIniFile::DeleteKey(std::string keyname) {
    int keynum = FindKey(keyname);
    if (keynum == -1)
        return false;
    keys.RemoveAt(keynum);
    names.RemoveAt(keynum);
    return true;
}
