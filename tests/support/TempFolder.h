// A scratch folder for one test (or one test program), removed with everything in it at the end, and
// whole-file helpers that work on bytes. Portable: the same helper serves native and Windows tests.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace testsupport {

class TempFolder {
public:
    // A new, empty folder under the system's temporary folder, named `prefix` and a random suffix, so that
    // test programs running side by side never share one.
    explicit TempFolder(const std::string& prefix = "orvex-test");
    ~TempFolder(); // leaves the folder first when it is the current directory, or it could not go
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;

    const std::filesystem::path& Path() const { return m_path; }
    // The folder in narrow form, without a trailing separator.
    const std::string& Dir() const { return m_dir; }
    // The path of an entry of the folder (the entry is not created).
    std::string File(const std::string& name) const;
    // Creates (or replaces) a file of the folder holding `bytes`; returns its path.
    std::string Write(const std::string& name, const std::string& bytes) const;
    // Creates a folder inside this one (nothing happens when it is there already); returns its path.
    std::string MakeDir(const std::string& name) const;
    bool Exists(const std::string& name) const;

private:
    std::filesystem::path m_path;
    std::string m_dir;
};

// Writes a whole file; a failure is a test failure.
void WriteBytes(const std::string& fileName, const std::string& bytes);
// Reads a whole file, or "<missing>" when it cannot be opened.
std::string ReadBytes(const std::string& fileName);
bool FileExists(const std::string& fileName);
// The names of a folder's entries, sorted.
std::vector<std::string> FilesIn(const std::string& dir);

} // namespace testsupport
