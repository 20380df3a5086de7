#pragma once

#include <string>

namespace fotomill::platform {

// Records errno as this thread's reason, without changing errno. Ignored if it only means that the
// file does not exist or is of another kind.
void KeepErrno();

// Sets what TakeLostAttributes returns.
void KeepLostAttributes(std::string names);

}  // namespace fotomill::platform
