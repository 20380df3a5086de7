#pragma once

#include <string>

namespace fotomill::platform {

// Why this thread's last system operation failed, for error messages:
// "Permission denied". Set when opening, creating, writing, renaming or
// locking a file fails, and cleared when one begins. Empty if nothing
// failed, or if the file just does not exist, which callers word better.
const std::string& SystemReason();
void KeepReason(std::string reason);
void ForgetReason();

// Attributes of the file last replaced by this thread that could not be copied to the new one: "its
// owner and its tags". Empty if none. Reading clears it.
std::string TakeLostAttributes();

}  // namespace fotomill::platform
