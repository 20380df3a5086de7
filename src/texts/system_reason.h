#pragma once

#include <string>

namespace fotomill {

// Why the system refused what this thread asked of it last (platform/reason.h), as a sentence to
// follow a message: "Permission denied." Empty without a reason.
std::string ReasonSentence();
// A sentence with the reason behind it.
std::string WithReason(std::string sentence);

}  // namespace fotomill
