#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "texts/texts.h"

namespace fotomill {

// Callbacks of a window while an external
// program runs, on the calling thread.
class ExternalProgramHost {
 public:
  virtual ~ExternalProgramHost() = default;
  // The command that opens a file, as an argument vector; empty if no program is registered for it.
  virtual std::vector<std::string> CommandFor(const std::string& file);
  // Shows a message box.
  virtual void ShowMessage(std::string_view text) = 0;
  virtual void LeaveClipboardChain() {}  // stop watching the clipboard
  virtual void JoinClipboardChain() {}   // resume watching it
  virtual void TakeFocus() {}            // redraw and take the focus back
};

// Flag: do not wait for the program to exit.
inline constexpr uint32_t kDoNotWait = 0x20000;

// Shown if no program is registered for a file, or it cannot be started.
inline constexpr std::string_view kNoExternalProgram = TrLater(
    "The external player for the file type you selected cannot be found. Please consult the "
    "Fotomill Formats document "
    "for more information about the format in question.");

// Opens a file with the host's program, by default the registered one, and waits for it to exit
// unless kDoNotWait is set. UnsupportedFunction, after showing a message, if there is none or it
// cannot be started.
Status OpenWithExternalProgram(ExternalProgramHost& host, const std::string& file, uint32_t flags);

// Whether to open a file with an external program: its name is that of a sound, a video or similar,
// and this build cannot read it.
bool NeedsExternalProgram(std::string_view fileName);

}  // namespace fotomill
