#include "cli/command.h"
#include "platform/process.h"

int main(int count, char** arguments) {
  using namespace fotomill;
  platform::CatchTermination();
  cli::Io io;
  io.inTerminal = platform::IsTerminal(0);
  io.outTerminal = platform::IsTerminal(1);
  io.errTerminal = platform::IsTerminal(2);
  return cli::RunCommandLine(count, arguments, io);
}
