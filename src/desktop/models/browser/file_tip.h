#pragma once

#include <string>
#include <vector>

#include "core/status.h"
#include "desktop/models/browser/folder_listing.h"

namespace fotomill::desktop {

// The tooltip of a browser line: name, type, size and date,
// dimensions and depth, comment. Reads the file's header; any thread.
// `known`: why the picture could not be shown, Ok if unknown.
std::vector<std::string> FileTipLines(const std::string& folder, const FolderItem& item,
                                      Status known);

}  // namespace fotomill::desktop
