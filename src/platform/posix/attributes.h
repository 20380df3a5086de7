#pragma once

#include <sys/stat.h>

#include <string>

namespace fotomill::platform {

// Gives an open file the owner, group, permissions, access control list and extended attributes of
// the regular file `path`, whose facts `old` holds, as far as the system lets this user. Returns
// what could not be given, as TakeLostAttributes says it.
std::string CopyAttributes(const std::string& path, const struct stat& old, int to);

}  // namespace fotomill::platform
