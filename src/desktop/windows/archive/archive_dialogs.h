#pragma once

#include <optional>
#include <string>
#include <vector>

class wxWindow;

namespace fotomill::desktop {

// The user's choices for extracting; the other ones are stored in the settings.
struct ExtractChoice {
  std::string folder;
  bool selected = false;  // only the selected entries
};
// Asks where to extract `count` files, or only `selected` ones, if any.
std::optional<ExtractChoice> AskForExtraction(wxWindow& parent, const std::string& archive,
                                              size_t count, size_t selected);

// The user's choices for a new archive.
struct CreateChoice {
  std::string path;
  std::string password;  // empty: none
  bool add = false;      // to the archive, which exists
};
// Asks for the archive for some files and folders.
std::optional<CreateChoice> AskForArchive(wxWindow& parent, const std::vector<std::string>& files);

}  // namespace fotomill::desktop
