#include "desktop/windows/files/file_list_data.h"

#include "desktop/models/files/uri_list.h"

namespace fotomill::desktop {

// The format "text/uri-list". Newer toolkits do not recognize it by that name.
FileListData::FileListData(std::span<const std::string> paths)
    : wxCustomDataObject(wxDataFormat(wxDF_FILENAME)) {
  const std::string list = UriList(paths);
  if (!list.empty()) SetData(list.size(), list.data());
}

std::vector<std::string> FileListData::Paths() const {
  const auto* const bytes = static_cast<const char*>(GetData());
  return bytes == nullptr ? std::vector<std::string>()
                          : PathsOfUriList(std::string_view(bytes, GetSize()));
}

}  // namespace fotomill::desktop
