#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Folders in a text field, separated by "; ".
std::string FolderListText(const std::vector<std::string>& folders);
// The reverse: absolute paths. `before` is the list that the field was filled with; it is returned
// if the text is still its own, so that names may contain the separator.
std::vector<std::string> ParseFolderList(std::string_view text,
                                         const std::vector<std::string>& before);

}  // namespace fotomill::desktop
