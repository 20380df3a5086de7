#include "desktop/windows/files/file_list_data.h"

#include "desktop/models/files/uri_list.h"

namespace fotomill::desktop {

FileListData::FileListData(std::span<const std::string> paths)
    : wxCustomDataObject(wxDataFormat("text/uri-list")) {
  const std::string list = UriList(paths);
  if (!list.empty()) SetData(list.size(), list.data());
}

std::vector<std::string> FileListData::Paths() const {
  const auto* const bytes = static_cast<const char*>(GetData());
  return bytes == nullptr ? std::vector<std::string>()
                          : PathsOfUriList(std::string_view(bytes, GetSize()));
}

}  // namespace fotomill::desktop
