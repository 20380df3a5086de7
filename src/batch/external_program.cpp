#include "batch/external_program.h"

#include "platform/process.h"

namespace fotomill {

Status OpenWithExternalProgram(ExternalProgramHost& host, const std::string& file, uint32_t flags) {
  const std::vector<std::string> program = platform::ProgramFor(file);
  bool started = false;
  if (!program.empty()) {
    host.LeaveClipboardChain();
    started = platform::RunProgram(program, (flags & kDoNotWait) == 0);
    host.JoinClipboardChain();
  }
  if (!started) {
    host.ShowMessage(kNoExternalProgram);
    return Status::UnsupportedFunction;
  }
  host.TakeFocus();
  return Status::Ok;
}

}  // namespace fotomill
