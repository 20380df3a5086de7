#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "core/status.h"
#include "texts/texts.h"

namespace fotomill {

// What a window does around an external program. Faces implement it; the calls come from the
// calling thread.
class ExternalProgramHost {
 public:
  virtual ~ExternalProgramHost() = default;
  // Shows a message box and returns when the user has closed it.
  virtual void ShowMessage(std::string_view text) = 0;
  virtual void LeaveClipboardChain() {}  // the window stops watching the clipboard
  virtual void JoinClipboardChain() {}  // and watches it again
  virtual void TakeFocus() {}  // redraws itself and takes the focus back
};

// Flag: does not wait for the program to end.
inline constexpr uint32_t kDoNotWait = 0x20000;

// The message when no program is registered for a file, or it cannot be started.
inline constexpr std::string_view kNoExternalProgram = TrLater(
    "The external player for the file type you selected cannot be found. Please consult the "
    "Fotomill Formats document "
    "for more information about the format in question.");

// Opens a file with the program that the system has registered for it, and waits until that has
// ended unless kDoNotWait is set. UnsupportedFunction, after a message, if there is none or it
// cannot be started.
Status OpenWithExternalProgram(ExternalProgramHost& host, const std::string& file, uint32_t flags);

}  // namespace fotomill
