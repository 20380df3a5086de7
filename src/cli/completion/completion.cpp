#include "cli/completion/completion.h"

#include <cstdio>
#include <string>

#include "cli/completion/words.h"
#include "cli/frame/options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct Shell {
  std::string_view name;
  std::string (*script)();
};
constexpr Shell kShells[] = {{"bash", BashCompletion},
                             {"zsh", ZshCompletion},
                             {"fish", FishCompletion},
                             {"powershell", PowerShellCompletion}};

int RunCompletion(const CommandContext& context) {
  const std::string& name = context.names.values[0];
  for (const Shell& shell : kShells) {
    if (shell.name != name) continue;
    const std::string script = shell.script();
    std::fwrite(script.data(), 1, script.size(), context.io.out);
    return kExitOk;
  }
  return UsageError(
      context,
      Tr("There is no completion for \"%1\"; choose bash, zsh, fish or powershell.", name));
}

}  // namespace

void SetUpCompletion(CLI::App& app, CommandContext& context) {
  context.names.Declare("SHELL", "bash, zsh, fish or powershell", 1, 1);
  SetFooter(app, nullptr,
            "fotomill completion bash > ~/.local/share/bash-completion/completions/fotomill");
  context.run = [&context] { return RunCompletion(context); };
}

}  // namespace fotomill::cli
