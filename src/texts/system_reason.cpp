#include "texts/system_reason.h"

#include "platform/reason.h"
#include "texts/texts.h"

namespace fotomill {

std::string ReasonSentence() {
  // The common reasons, for translation; others are shown as the system words them.
  [[maybe_unused]] constexpr const char* kKnown[] = {
      TrLater("Permission denied"),       TrLater("Read-only file system"),
      TrLater("No space left on device"), TrLater("Operation not permitted"),
      TrLater("File too large"),          TrLater("Input/output error"),
      TrLater("Too many open files"),     TrLater("File name too long"),
      TrLater("Disk quota exceeded"),     TrLater("The file was changed by another program")};
  const std::string& reason = platform::SystemReason();
  return reason.empty() ? std::string() : Tr(reason) + ".";
}

std::string WithReason(std::string sentence) {
  const std::string reason = ReasonSentence();
  return reason.empty() ? sentence : sentence + " " + reason;
}

}  // namespace fotomill
