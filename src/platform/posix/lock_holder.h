#pragma once

#include <string>

namespace fotomill::platform {

// Who holds the lock on the file that is open as `handle`: "fotomill (process 123)", "another
// program" where the system does not tell.
std::string LockHolder(int handle);

// The path that an open file has now; empty where the system does not tell.
std::string PathOfHandle(int handle);

}  // namespace fotomill::platform
