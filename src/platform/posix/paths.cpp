#include "platform/paths.h"

namespace fotomill::platform {

const char kSeparator = '/';
const std::string_view kLineEnd = "\n";

PathParts SplitPath(std::string_view path) {
  const size_t nameStart = path.rfind('/') + 1;  // npos + 1 is 0
  const std::string_view name = path.substr(nameStart);
  const size_t dot = std::min(name.rfind('.'), name.size());
  return {path.substr(0, 0), path.substr(0, nameStart), name.substr(0, dot), name.substr(dot)};
}

}  // namespace fotomill::platform
