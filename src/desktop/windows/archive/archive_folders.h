#pragma once

#include <string>
#include <vector>

class wxString;
class wxWindow;

namespace fotomill::desktop {

class Shell;

// Shows an archive like a folder: unpacks it to a temporary folder in the background and opens that
// in a tab. It is deleted when the program ends. With EscalatePicturelessZips, an archive without
// pictures opens in the archive manager.
void OpenArchiveFolder(Shell& shell, const std::string& archive);

// The archive from which a folder, or one above it, was unpacked; empty if there is none.
std::string ArchiveOfFolder(const std::string& folder);

// Changes to unpacked files would be lost with their folder, so they are refused. Tells the user if
// one of these files or folders is an unpacked one, and returns true then.
bool RefusesChange(wxWindow* parent, const std::vector<std::string>& paths);
// Why, a sentence in English, for translation.
extern const char* const kUnpackedFilesStay;

// Asks before another program opens a temporary copy of a file in an archive, unless this is turned
// off by ArchivePromptExternal. True to go on.
bool MayOpenCopy(wxWindow* parent, const wxString& question);

// The folder for results of functions on a folder: that of the archive, if the folder belongs to an
// unpacked one, else the folder itself.
std::string FolderForResults(const std::string& folder);

}  // namespace fotomill::desktop
