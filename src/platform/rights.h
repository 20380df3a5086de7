#pragma once

#include <string>

namespace fotomill::platform {

// Whether the folder of a path exists and allows its files to be moved or deleted.
bool MayBeMoved(const std::string& path);

}  // namespace fotomill::platform
