#include <memory>
#include <string>
#include <vector>

#include "archive/zip_writer.h"
#include "batch/archive/archive_members.h"
#include "cli/commands/archive/archive.h"
#include "cli/commands/archive/archive_options.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_prompts.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct CreateOptions {
  PasswordOptions password;
  std::string overwrite;
  bool json = false;
  bool dryRun = false;
};

// Decides about an existing archive; false, after printing a note, to keep it.
bool SettleArchive(const std::string& overwrite, const CommandContext& context,
                   ResultOutput& output, std::string& path, platform::Existing& existing) {
  existing = platform::Existing::Refuse;
  if (platform::ExistenceOf(path) == platform::Existence::No) return true;
  std::string how = overwrite;
  if (how == "ask") {
    TerminalPrompts prompts(context, output);
    OverwriteQuestion question;
    question.source = question.path = path;
    question.name = platform::SplitPath(path).base;
    const OverwriteAnswer answer = prompts.AskOverwrite(question);
    const bool sameName = answer.name == question.name;
    how = !answer.ok ? "skip" : answer.checks.keepBoth || !sameName ? "keep-both" : "replace";
    if (answer.ok && !sameName && answer.name.find('/') == std::string::npos) {
      path = platform::JoinFolder(platform::FolderOf(path), answer.name + ".zip");
      if (platform::ExistenceOf(path) == platform::Existence::No) return true;
    }
  }
  if (how == "replace") existing = platform::Existing::Replace;
  if (how == "replace" || (how == "keep-both" && KeepBoth(path, platform::ExistenceOf)))
    return true;
  output.Note(output.ShownMessage(path) + ": " + Tr("exists; skipped."));
  return false;
}

// Adds files, and reports those that cannot be added. Anything but Ok cancels the archive.
Status AddMembers(const std::vector<ArchiveMember>& members, ZipWriter& zip, ResultOutput& output,
                  std::vector<const ArchiveMember*>& added) {
  for (const ArchiveMember& member : members) {
    output.ShowProgress(added.size(), members.size());
    Status status = member.status;
    if (status == Status::Ok) status = zip.Add(member.path, member.name, {});
    if (status == Status::Ok) {
      added.push_back(&member);
    } else if (member.status != Status::Ok || status == Status::FileOpenError) {
      output.FileFailed(member.path, status, member.hint.empty() ? WithReason("") : member.hint);
    } else {
      return status;
    }
  }
  return Status::Ok;
}

Status WriteArchive(const std::string& path, platform::Existing existing,
                    const std::string& password, const std::vector<ArchiveMember>& members,
                    ResultOutput& output) {
  ZipWriter zip;
  RETURN_IF_BAD(zip.Create(path, password));
  std::vector<const ArchiveMember*> added;
  RETURN_IF_BAD(AddMembers(members, zip, output, added));
  if (added.empty()) return Status::Ok;  // each one was reported
  if (zip.Finish(existing) != platform::CommitResult::Done) return Status::ErrorWritingFile;
  for (const ArchiveMember* member : added) output.FileDone(member->path, member->name);
  return Status::Ok;
}

int RunCreate(CreateOptions options, const CommandContext& context) {
  std::string path = context.names.values[0], password;
  std::string wrong = ReadPassword(options.password, password);
  if (wrong.empty()) wrong = SettleOverwrite(context, options.overwrite);
  if (wrong.empty() && !EqualIgnoringCase(platform::ExtensionOf(path), "zip"))
    wrong = Tr("The name of the archive must end in \".zip\"; no other kind can be written.");
  if (wrong.empty() && options.password.ask && !context.MayAsk())
    wrong = Tr("--ask-password needs a terminal.");
  if (!wrong.empty()) return UsageError(context, wrong);
  ResultOutput output(context, options.json);
  output.KeepGoing();
  platform::Existing existing = platform::Existing::Refuse;
  if (options.dryRun && options.overwrite == "ask") options.overwrite = "keep-both";
  if (!SettleArchive(options.overwrite, context, output, path, existing)) return output.Finish();
  ArchiveMembers members(path, {.keepPaths = settings.ArchivePreservePaths != 0,
                                .addThumbnails = settings.ArchiveAddThumbnails != 0});
  for (size_t i = 1; i < context.names.values.size(); ++i)
    members.Add(context.names.values[i]);
  if (options.dryRun) {
    for (const ArchiveMember& member : members.All()) {
      if (member.status == Status::Ok) {
        output.FileDone(member.path, member.name);
      } else {
        output.FileFailed(member.path, member.status, member.hint);
      }
    }
    return output.Finish();
  }
  if (options.password.ask && password.empty()) {
    TerminalPrompts prompts(context, output);
    const auto typed = prompts.AskPassword(path);
    if (!typed) return output.Finish();
    password = *typed;
  }
  const Status status = WriteArchive(path, existing, password, members.All(), output);
  if (status != Status::Ok) output.FileFailed(path, status, WithReason(""));
  return output.Finish();
}

}  // namespace

void SetUpArchiveCreate(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<CreateOptions>();
  context.names.Declare("ARCHIVE FILE...",
                        "The ZIP archive to create, and files and folders for it", 2);
  AddName(app, "--password-file", options->password.file, "FILE",
          "Encrypt with the password in the first line of a file (AES-256)");
  AddFlag(app, "--ask-password", options->password.ask,
          "Encrypt with a password that is asked for");
  AddOverwrite(app, options->overwrite);
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be archived");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "Folders are archived with everything below them. Files of compressed formats are "
            "stored, others deflated.\n"
            "Names stay readable in an encrypted archive. ArchivePreservePaths says whether paths "
            "are kept,\n"
            "ArchiveAddThumbnails whether thumbnail files are added to their pictures.",
            "fotomill archive create holiday.zip holiday");
  context.run = [options, &context] { return RunCreate(*options, context); };
}

}  // namespace fotomill::cli
