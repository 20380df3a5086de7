#include <cstdio>
#include <string>

#include "cli/frame/command.h"
#include "core/shown_text.h"
#include "platform/lock_wait.h"
#include "platform/memory.h"
#include "platform/process.h"
#include "platform/work_apart.h"
#include "plugins/child_tasks.h"
#include "texts/texts.h"

int main(int count, char** arguments) {
  using namespace fotomill;
  if (const auto status = platform::ServeApart(count, arguments, ChildTasks())) return *status;
  platform::FillStandardStreams();
  platform::CatchTermination();
  platform::KeepFreedMemory();
  cli::Io io;
  io.inTerminal = platform::IsTerminal(0);
  io.outTerminal = platform::IsTerminal(1);
  io.outStored = platform::IsStored(1);
  static char buffer[64 * 1024];  // must live as long as the stream
  if (io.outStored) std::setvbuf(io.out, buffer, _IOFBF, sizeof buffer);
  io.errTerminal = platform::IsTerminal(2);
  platform::onLongLockWait = [](const std::string& path, const std::string& holder) {
    const std::string line =
        Tr("Waiting for \"%1\", locked by %2.", EscapeControls(path), EscapeControls(holder));
    std::fprintf(stderr, "fotomill: %s\n", line.c_str());
  };
  return cli::RunCommandLine(count, arguments, io);
}
