#pragma once

#include <string>

namespace fotomill::platform {

// Deletes temporary files in a folder left by a killed instance
// of this program: by name, of this user, with a process that
// no longer exists, and not locked. Once per folder and run.
void DeleteStaleFiles(const std::string& folder);

// The part of a temporary name that identifies its
// process: the process id and its PID namespace.
std::string OwnerOfTemporary();

}  // namespace fotomill::platform
