#pragma once

#include <string>

#include "platform/files.h"

namespace fotomill::platform {

// Whether a file is the one whose facts were asked for `then`, and nobody has written to it since.
inline bool IsUnchanged(const std::string& path, const FileFacts& then) {
  const FileFacts now = FactsOf(path);
  return now.identity == then.identity && now.device == then.device && now.size == then.size && now.modified == then.modified &&
         now.link == then.link;
}

}  // namespace fotomill::platform
