#pragma once

#include <string>

namespace fotomill::platform {

// Why the system refused what this thread asked of it last, for the message that a person reads:
// "Permission denied". Opening, creating, writing, renaming and locking files keep it here when
// they fail and forget it when they begin. Empty when nothing was refused, or when the file just is
// not there, which callers say better.
const std::string& SystemReason();
void KeepReason(std::string reason);
void ForgetReason();

// What the file that this thread replaced last had and the new one could not be given: "its owner
// and its tags". Empty when nothing is missing. Asking takes it away.
std::string TakeLostAttributes();

}  // namespace fotomill::platform
