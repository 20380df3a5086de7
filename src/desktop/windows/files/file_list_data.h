#pragma once

#include <wx/dataobj.h>

#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// Files on the clipboard or in a drag. In contrast to the toolkit's own class, names may be any
// bytes.
class FileListData : public wxCustomDataObject {
 public:
  explicit FileListData(std::span<const std::string> paths = {});
  std::vector<std::string> Paths() const;  // absolute
};

}  // namespace fotomill::desktop
