#pragma once

#include <string>

namespace fotomill::platform {

// The holder of the lock on the open file `handle`: "fotomill (process 123)", or "another program"
// if unknown.
std::string LockHolder(int handle);

// The current path of an open file; empty if unknown.
std::string PathOfHandle(int handle);

}  // namespace fotomill::platform
