#include "desktop/models/similar/folder_list_text.h"

#include <algorithm>

#include "platform/folders.h"

namespace fotomill::desktop {

namespace {

constexpr std::string_view kBetween = "; ";

}  // namespace

std::string FolderListText(const std::vector<std::string>& folders) {
  std::string text;
  for (const std::string& folder : folders) {
    if (!text.empty()) text += kBetween;
    text += folder;
  }
  return text;
}

std::vector<std::string> ParseFolderList(std::string_view text,
                                         const std::vector<std::string>& before) {
  if (text == FolderListText(before)) return before;
  std::vector<std::string> folders;
  while (!text.empty()) {
    const std::string_view one = text.substr(0, text.find(kBetween));
    text.remove_prefix(std::min(one.size() + kBetween.size(), text.size()));
    if (!one.empty()) folders.push_back(platform::AbsolutePath(std::string(one)));
  }
  return folders;
}

}  // namespace fotomill::desktop
