#pragma once

#include <sys/stat.h>

#include <string>

namespace fotomill::platform {

// Copies owner, group, permissions, access control list and extended attributes of the regular file
// `path`, whose stat is `old`, to an open file, as far as this user may. Returns what could not be
// copied, worded as for TakeLostAttributes.
std::string CopyAttributes(const std::string& path, const struct stat& old, int to);

}  // namespace fotomill::platform
