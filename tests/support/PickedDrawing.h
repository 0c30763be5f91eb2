// What the explorer leaves behind when the user picks a drawing: a folder model that shows one folder
// holding that one drawing, chosen. For tests that play the explorer around the LISP function.
#pragma once

#include "thumbs/DrawingFolder.h"

#include <string>
#include <vector>

namespace testsupport {

class PickedDrawing : private FolderReader {
public:
    // Shows folder with the drawing name in it and chooses it; an empty name chooses nothing.
    const DrawingFolder& Pick(const std::string& folder, const std::string& name) {
        m_name = name;
        m_folder.Show(folder);
        m_folder.Choose(name.empty() ? -1 : 0);
        return m_folder;
    }
    const DrawingFolder& Folder() const { return m_folder; }

private:
    bool Read(const std::string&, std::vector<DwgData>& drawings, std::string&, ScanProgress&) override {
        drawings.clear();
        if (!m_name.empty()) {
            DwgFindEntry entry;
            entry.name = m_name;
            drawings.emplace_back(entry);
        }
        return true;
    }
    void MakeCurrentDirectory(const std::string&) override {}

    std::string m_name;
    DrawingFolder m_folder{*this, nullptr};
};

} // namespace testsupport
