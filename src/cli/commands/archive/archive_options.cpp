#include "cli/commands/archive/archive_options.h"

#include "archive/archive_limits.h"
#include "cli/frame/options.h"
#include "platform/input.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

std::string ReadPassword(const PasswordOptions& options, std::string& password) {
  if (options.file.empty()) return {};
  std::string contents;
  // the password and a line end
  const auto read = platform::ReadListFile(options.file, kLongestPassword + 2, contents);
  if (read != platform::ReadResult::Done && read != platform::ReadResult::TooLarge)
    return WithReason(Tr("\"%1\" cannot be read.", options.file));
  password = contents.substr(0, contents.find('\n'));
  if (password.ends_with('\r')) password.pop_back();
  if (read == platform::ReadResult::TooLarge || password.size() > kLongestPassword)
    return Tr("The password in \"%1\" is too long.", options.file);
  return password.empty() ? Tr("There is no password in \"%1\".", options.file) : std::string();
}

void AddOverwrite(CLI::App& app, std::string& overwrite) {
  AddChoice(app, "--overwrite", overwrite, "HOW",
            "What to do if the file exists: ask, replace, keep-both (adds a number), skip "
            "(default: ask on a terminal, else keep-both)",
            {"ask", "replace", "keep-both", "skip"});
}

std::string SettleOverwrite(const CommandContext& context, std::string& overwrite) {
  if (overwrite.empty())
    overwrite = context.MayAsk() && settings.ArchivePromptOverwrite != 0 ? "ask" : "keep-both";
  if (overwrite == "ask" && !context.MayAsk()) return Tr("--overwrite ask needs a terminal.");
  return {};
}

bool KeepBoth(std::string& path, const TakenTest& taken) {
  return MakeNumberedVariant(path, settings.NumberedVariantMin, settings.NumberedVariantMax,
                             taken) == VariantSearch::Found;
}

}  // namespace fotomill::cli
