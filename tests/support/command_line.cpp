#include "support/command_line.h"

#include <cstdio>

#include "cli/frame/command.h"
#include "support/scoped_settings.h"

namespace fotomill::test {

namespace {

std::string Contents(std::FILE* file) {
  std::string contents;
  std::rewind(file);
  char buffer[4096];
  while (const size_t count = std::fread(buffer, 1, sizeof buffer, file))
    contents.append(buffer, count);
  std::fclose(file);
  return contents;
}

}  // namespace

CommandResult RunCommand(const std::vector<std::string>& arguments, const Terminal& terminal) {
  const ScopedSettings keep;  // options may change some during the run
  cli::Io io{std::tmpfile(),       std::tmpfile(),  std::tmpfile(),
             terminal.interactive, terminal.output, terminal.interactive};
  std::fwrite(terminal.input.data(), 1, terminal.input.size(), io.in);
  std::rewind(io.in);
  std::vector<const char*> words{"fotomill"};
  for (const std::string& argument : arguments) words.push_back(argument.c_str());
  CommandResult result;
  result.status = cli::RunCommandLine(static_cast<int>(words.size()), words.data(), io);
  result.out = Contents(io.out);
  result.err = Contents(io.err);
  std::fclose(io.in);
  return result;
}

}  // namespace fotomill::test
