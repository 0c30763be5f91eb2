#include "thumbs/FileCommandText.h"

std::string FileCommandFailureText(FileCommand command, const std::string& subject,
                                   const FileCommandFailure& why) {
    std::string text;
    switch (command) {
    case FileCommand::Rename:
        text = "Cannot rename \"" + subject + "\": ";
        break;
    case FileCommand::Delete:
        text = "Cannot delete " + subject + ": ";
        break;
    case FileCommand::Paste:
        text = "Cannot paste into \"" + subject + "\": ";
        break;
    }
    if (!why.missing.empty())
        text += why.missing + " no longer exists.";
    else if (why.readOnly)
        text += "the folder is read-only.";
    else
        text += "the system refused it (error " + std::to_string(why.error) + ").";
    return text + " The folder is shown as it is now.";
}
