#pragma once

#include <string>

namespace fotomill::platform {

// Keeps what errno says as this thread's reason; errno stays. What only says that there is no such
// file, or a file of another kind, is no reason.
void KeepErrno();

// What TakeLostAttributes gives.
void KeepLostAttributes(std::string names);

}  // namespace fotomill::platform
