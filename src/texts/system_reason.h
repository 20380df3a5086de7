#pragma once

#include <string>

namespace fotomill {

// The reason for this thread's last system error (platform/reason.h), as a sentence to append to a
// message: "Permission denied." Empty without a reason.
std::string ReasonSentence();
// A sentence followed by the reason.
std::string WithReason(std::string sentence);

}  // namespace fotomill
