#pragma once

#include <wx/dataobj.h>

#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// Files for clipboard and drag and drop. Unlike
// in the toolkit's class, names may be any bytes.
class FileListData : public wxCustomDataObject {
 public:
  explicit FileListData(std::span<const std::string> paths = {});
  std::vector<std::string> Paths() const;  // absolute
};

}  // namespace fotomill::desktop
