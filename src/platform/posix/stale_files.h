#pragma once

#include <string>

namespace fotomill::platform {

// Deletes the working files in a folder that a killed run of this program left: its own temporary
// names, of a process of this user that is not there any more, which no one has locked. Once for
// each folder in a run.
void DeleteStaleFiles(const std::string& folder);

// The part of a temporary name that tells whose it is: the process, and the space in which its
// number counts.
std::string OwnerOfTemporary();

}  // namespace fotomill::platform
