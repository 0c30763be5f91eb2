#include "thumbs/RenameRules.h"

#include "hostapi/NarrowText.h"
#include "thumbs/DwgList.h"
#include "thumbs/NameFold.h"

namespace {

// The part before the first dot, trailing blanks dropped: what Windows compares with its device names.
bool IsDeviceName(const std::string& name) {
    std::string stem = name.substr(0, name.find('.'));
    while (!stem.empty() && stem.back() == ' ')
        stem.pop_back();
    std::string upper;
    for (const char c : stem)
        upper += (c >= 'a' && c <= 'z') ? static_cast<char>(c - ('a' - 'A')) : c;
    static const char* const kDevices[] = {"CON", "PRN", "AUX", "NUL"};
    for (const char* device : kDevices)
        if (upper == device)
            return true;
    return upper.size() == 4 && (upper.compare(0, 3, "COM") == 0 || upper.compare(0, 3, "LPT") == 0) &&
           upper[3] >= '1' && upper[3] <= '9';
}

const std::string kDrawingExtension = ".dwg";

bool EndsInDrawingExtension(const std::string& name) {
    if (name.size() < kDrawingExtension.size())
        return false;
    return CompareNamesNoCase(name.substr(name.size() - kDrawingExtension.size()), kDrawingExtension) == 0;
}

} // namespace

RenameVerdict CheckRename(const std::string& folder, const std::string& oldName, const std::string& newName,
                          const std::function<bool(const std::string&)>& exists) {
    // ".dwg" alone is a drawing without a name.
    if (newName.empty() || CompareNamesNoCase(newName, kDrawingExtension) == 0)
        return RenameVerdict::Empty;
    if (newName == oldName)
        return RenameVerdict::Unchanged;
    // The same name in other letters' case: the file itself answers to it, it is no other file.
    const bool caseOnly = CompareNamesNoCase(newName, oldName) == 0;
    if (ContainsForbiddenCharacter(newName))
        return RenameVerdict::BadCharacter;
    if (!EndsInDrawingExtension(newName))
        return RenameVerdict::NotDrawing;
    if (IsDeviceName(newName))
        return RenameVerdict::DeviceName;
    // A file system keeps at most 255 characters in one name.
    if (CharacterCount(newName) > 255 || !FullPathFits(folder, newName))
        return RenameVerdict::TooLong;
    if (!caseOnly && exists && exists(newName))
        return RenameVerdict::Exists;
    return RenameVerdict::Rename;
}

std::string RenameRefusalText(RenameVerdict verdict, const std::string& newName) {
    const std::string quoted = "\"" + newName + "\"";
    switch (verdict) {
    case RenameVerdict::Empty:
        if (newName.empty())
            return "A drawing needs a name.";
        return "Cannot rename to " + quoted + ": the name before .dwg is empty.";
    case RenameVerdict::BadCharacter:
        return "Cannot rename to " + quoted +
               ": a name cannot contain \\ / : * ? \" < > | or control characters.";
    case RenameVerdict::DeviceName:
        return "Cannot rename to " + quoted + ": the name is reserved for a device.";
    case RenameVerdict::NotDrawing:
        return "Cannot rename to " + quoted + ": a drawing's name ends in .dwg.";
    case RenameVerdict::TooLong:
        return "Cannot rename to " + quoted + ": the full path would be longer than " +
               std::to_string(kMaxPathChars) + " characters.";
    case RenameVerdict::Exists:
        return "Cannot rename to " + quoted + ": a file of that name already exists.";
    case RenameVerdict::Rename:
    case RenameVerdict::Unchanged:
        break;
    }
    return {};
}
