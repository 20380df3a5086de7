#include "batch/external_program.h"

#include "platform/process.h"
#include "registry/registry.h"

namespace fotomill {

std::vector<std::string> ExternalProgramHost::CommandFor(const std::string& file) {
  return platform::ProgramFor(file);
}

Status OpenWithExternalProgram(ExternalProgramHost& host, const std::string& file, uint32_t flags) {
  const std::vector<std::string> command = host.CommandFor(file);
  bool started = false;
  if (!command.empty()) {
    host.LeaveClipboardChain();
    started = platform::RunProgram(command, (flags & kDoNotWait) == 0);
    host.JoinClipboardChain();
  }
  if (!started) {
    host.ShowMessage(kNoExternalProgram);
    return Status::UnsupportedFunction;
  }
  host.TakeFocus();
  return Status::Ok;
}

bool NeedsExternalProgram(std::string_view fileName) {
  const int32_t index = FindReaderByName(fileName);  // AVIF is not AVI, if there is a plug-in
  if (index == kNoFormat) return false;
  const FormatEntry& row = FormatRow(index);
  return (row.flags & (FMT_MEDIA | FMT_TIMED)) != 0 && !CanRead(row);
}

}  // namespace fotomill
