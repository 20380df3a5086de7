#include <algorithm>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "archive/archive_reader.h"
#include "archive/extract.h"
#include "cli/commands/archive/archive.h"
#include "cli/commands/archive/archive_options.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_prompts.h"
#include "core/natural_order.h"
#include "files/file_time_change.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct ReadingOptions {
  PasswordOptions password;
  std::string dest, overwrite;
  bool json = false;
  bool dryRun = false;
};

// An archive to read, and the requested entries.
struct OpenArchive {
  ArchiveSource source;
  std::vector<ArchiveEntry> entries;
  std::vector<bool> wanted;
};

std::string TroubleHint(const ArchiveEnd& end) {
  const std::string_view text = TroubleText(end.trouble);
  return text.empty() ? WithReason("") : Tr(text);
}

Status StatusOf(EntryRefusal refusal) {
  return refusal == EntryRefusal::Link || refusal == EntryRefusal::Special
             ? Status::UnsupportedFormat
             : Status::InvalidDestination;
}

bool IsBelow(std::string_view name, std::string_view folder) {
  return name.size() > folder.size() && name.starts_with(folder) && name[folder.size()] == '/';
}

bool Matches(std::string_view name, std::string_view asked) {
  while (asked.ends_with('/')) asked.remove_suffix(1);
  const bool pattern = asked.find_first_of("*?") != std::string_view::npos;
  return name == asked || IsBelow(name, asked) || (pattern && MatchesFilter(name, asked));
}

// Marks the entries given on the command line; all if there are none. A name without match is
// reported as a failed file.
void MarkWanted(const CommandContext& context, OpenArchive& archive, ResultOutput& output) {
  const auto& names = context.names.values;
  archive.wanted.assign(archive.entries.size(), names.size() == 1);
  for (size_t n = 1; n < names.size(); ++n) {
    bool any = false;
    for (size_t i = 0; i < archive.entries.size(); ++i) {
      if (!Matches(archive.entries[i].name, names[n])) continue;
      archive.wanted[i] = any = true;
    }
    if (!any) output.FileFailed(names[n], Status::FileOpenError, Tr("It is not in the archive."));
  }
}

// Lists the archive. If it is damaged, reports that and uses the readable entries.
void Open(const CommandContext& context, ResultOutput& output, OpenArchive& archive) {
  archive.source.path = context.names.values[0];
  const ArchiveEnd end = ListArchive(archive.source, archive.entries);
  if (end.status != Status::Ok)
    output.FileFailed(archive.source.path, end.status, TroubleHint(end));
  if (end.status == Status::Ok || !archive.entries.empty()) MarkWanted(context, archive, output);
}

// Asks for the password if an entry needs it, none was given, and prompting is possible.
void AskPasswordIfNeeded(const CommandContext& context, ResultOutput& output,
                         OpenArchive& archive) {
  bool needed = false;
  for (size_t i = 0; i < archive.entries.size(); ++i)
    needed = needed || (archive.wanted[i] && archive.entries[i].facts.encrypted);
  if (!needed || !archive.source.password.empty() || !context.MayAsk()) return;
  TerminalPrompts prompts(context, output);
  archive.source.password = prompts.AskPassword(archive.source.path).value_or("");
}

void PutEntry(const ArchiveEntry& entry, ResultOutput& output) {
  const bool folder = entry.facts.kind == RawEntry::Folder;
  if (!output.IsJson()) {
    output.Line((entry.facts.modified == 0 ? "-" : LocalTimeText(entry.facts.modified)) + "\t" +
                (entry.facts.sizeKnown ? std::to_string(entry.facts.size) : "-") + "\t" +
                output.Shown(entry.name) + (folder ? "/" : ""));
    return;
  }
  Json element;
  PutName(element, "name", entry.name);
  element["folder"] = folder;
  element["size"] = entry.facts.sizeKnown ? Json(entry.facts.size) : Json(nullptr);
  element["modified"] = entry.facts.modified;
  element["encrypted"] = entry.facts.encrypted;
  element["refused"] = std::string(RefusalText(entry.refusal));
  output.Element(element);
}

int RunList(const ReadingOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  OpenArchive archive;
  Open(context, output, archive);
  for (size_t i = 0; i < archive.wanted.size() && output.GoesOn(); ++i) {
    if (archive.wanted[i]) PutEntry(archive.entries[i], output);
  }
  output.EndArray();
  return output.Failed() ? kExitFailed : kExitOk;
}

// Reports the requested entries that cannot be extracted.
void ReportRefused(const OpenArchive& archive, ResultOutput& output) {
  for (size_t i = 0; i < archive.wanted.size(); ++i) {
    const ArchiveEntry& entry = archive.entries[i];
    if (archive.wanted[i] && entry.refusal != EntryRefusal::None)
      output.FileFailed(entry.name, StatusOf(entry.refusal), Tr(RefusalText(entry.refusal)));
  }
}

// Reports the status of the whole archive, unless an entry's message said the same.
void ReportEnd(const OpenArchive& archive, const ArchiveEnd& end, uint64_t failuresBefore,
               ResultOutput& output) {
  if (end.status != Status::Ok && output.Failures() == failuresBefore)
    output.FileFailed(archive.source.path, end.status, TroubleHint(end));
}

class Tester final : public EntryReceiver {
 public:
  Tester(const OpenArchive& archive, ResultOutput& output) : archive_(archive), output_(output) {}
  Status Begin(size_t) override { return Status::Ok; }
  Status Data(std::span<const uint8_t>) override {
    output_.Tick();
    return Status::Ok;
  }
  void End(size_t index, const ArchiveEnd& end) override {
    const std::string& name = archive_.entries[index].name;
    if (end.status == Status::Ok) {
      output_.FileDone(name);
    } else {
      output_.FileFailed(name, end.status, TroubleHint(end));
    }
  }

 private:
  const OpenArchive& archive_;
  ResultOutput& output_;
};

int RunTest(const ReadingOptions& options, const CommandContext& context) {
  OpenArchive archive;
  if (const std::string wrong = ReadPassword(options.password, archive.source.password);
      !wrong.empty())
    return UsageError(context, wrong);
  ResultOutput output(context, options.json);
  Open(context, output, archive);
  AskPasswordIfNeeded(context, output, archive);
  ReportRefused(archive, output);
  for (size_t i = 0; i < archive.wanted.size(); ++i) {
    const ArchiveEntry& entry = archive.entries[i];
    if (!entry.IsFile() || entry.refusal != EntryRefusal::None) archive.wanted[i] = false;
  }
  const uint64_t failures = output.Failures();
  Tester tester(archive, output);
  if (std::ranges::find(archive.wanted, true) != archive.wanted.end())
    ReportEnd(archive, ReadArchive(archive.source, archive.entries, archive.wanted, tester),
              failures, output);
  return output.Finish();
}

// Chooses the destinations of entries, according to the options.
class Places {
 public:
  Places(const ReadingOptions& options, const CommandContext& context, const OpenArchive& archive,
         ResultOutput& output)
      : overwrite_(options.overwrite),
        dryRun_(options.dryRun),
        output_(output),
        prompts_(context, output),
        folder_(!options.dest.empty() ? options.dest
                : !settings.ArchiveExtractPath.view().empty()
                    ? std::string(settings.ArchiveExtractPath.view())
                    : platform::FolderOf(archive.source.path)) {}

  // nullopt after a message, or if the file is skipped.
  std::optional<ExtractPlace> Of(const ArchiveEntry& entry) {
    const std::string name = settings.ArchivePreservePaths != 0
                                 ? entry.name
                                 : std::string(platform::FileNameOf(entry.name));
    ExtractPlace place = {platform::JoinFolder(folder_, name)};
    const bool own = written_.contains(place.path);  // by an earlier entry
    const platform::Existence taken =
        own ? platform::Existence::Yes : platform::ExistenceOf(place.path);
    bool settled = taken == platform::Existence::No;
    if (taken == platform::Existence::Yes) settled = SettleTaken(entry, own, place);
    if (taken == platform::Existence::Unknown)
      output_.FileFailed(entry.name, Status::ErrorCreatingFile, WithReason(""));
    if (!settled) return std::nullopt;
    written_.insert(place.path);
    return place;
  }

 private:
  bool SettleTaken(const ArchiveEntry& entry, bool own, ExtractPlace& place) {
    std::string how = own || (dryRun_ && overwrite_ == "ask") ? "keep-both" : overwrite_;
    bool recycle = false;
    if (how == "ask") how = Ask(entry, place, recycle);
    if (how == "replace") {
      place.existing = platform::Existing::Replace;
      if (recycle) place.makeWay = [path = place.path] { return platform::MoveToTrash(path); };
      return true;
    }
    if (how == "named") return true;
    if (how == "keep-both") {
      const auto taken = [&](const std::string& path) {
        return written_.contains(path) ? platform::Existence::Yes : platform::ExistenceOf(path);
      };
      if (KeepBoth(place.path, taken)) return true;
      output_.FileFailed(entry.name, Status::ErrorCreatingFile);
      return false;
    }
    output_.Note(output_.ShownMessage(place.path) + ": " + Tr("exists; skipped."));
    return false;
  }

  // "replace", "keep-both", "skip", or "named" with a new free name in `place`.
  std::string Ask(const ArchiveEntry& entry, ExtractPlace& place, bool& recycle) {
    OverwriteQuestion question;
    question.source = entry.name;
    question.path = place.path;
    for (;;) {
      const platform::PathParts parts = platform::SplitPath(question.path);
      question.name = parts.base;
      const OverwriteAnswer answer = prompts_.AskOverwrite(question);
      const std::string how = !answer.ok               ? "skip"
                              : answer.checks.keepBoth ? "keep-both"
                                                       : "replace";
      if (answer.skipRest || answer.checks.applyToRest) overwrite_ = how;
      recycle = answer.checks.recycle;
      if (how != "replace" || answer.name == question.name) {
        place.path = question.path;
        return how;
      }
      std::string name = answer.name;
      name.append(parts.extension);
      if (name.find('/') != std::string::npos) {
        question.problem = Tr("A name has no \"/\".");
        continue;
      }
      place.path = platform::JoinFolder(platform::FolderOf(question.path), name);
      if (platform::ExistenceOf(place.path) == platform::Existence::No) return "named";
      question.path = place.path;
    }
  }

  std::string overwrite_;
  const bool dryRun_;
  ResultOutput& output_;
  TerminalPrompts prompts_;
  const std::string folder_;
  std::set<std::string> written_;
};

void ReportExtracted(const ArchiveEntry& entry, const std::string& path, const ArchiveEnd& end,
                     ResultOutput& output) {
  if (end.status == Status::Ok) {
    output.FileDone(entry.name, path);
  } else {
    output.FileFailed(entry.name, end.status, TroubleHint(end));
  }
}

int RunExtract(ReadingOptions options, const CommandContext& context) {
  OpenArchive archive;
  std::string wrong = ReadPassword(options.password, archive.source.password);
  if (wrong.empty()) wrong = SettleOverwrite(context, options.overwrite);
  if (!wrong.empty()) return UsageError(context, wrong);
  ResultOutput output(context, options.json);
  output.KeepGoing();
  Open(context, output, archive);
  if (!options.dryRun) AskPasswordIfNeeded(context, output, archive);
  ReportRefused(archive, output);
  Places places(options, context, archive, output);
  const ExtractJob job = {
      .place = [&](const ArchiveEntry& entry) { return places.Of(entry); },
      .done = [&](const ArchiveEntry& entry, const std::string& path,
                  const ArchiveEnd& end) { ReportExtracted(entry, path, end, output); },
      .keepTimes = settings.ArchivePreserveTimestamps != 0,
  };
  const uint64_t failures = output.Failures();
  if (!options.dryRun) {
    ReportEnd(archive, ExtractArchive(archive.source, archive.entries, archive.wanted, job),
              failures, output);
    return output.Finish();
  }
  for (size_t i = 0; i < archive.wanted.size() && output.GoesOn(); ++i) {
    const ArchiveEntry& entry = archive.entries[i];
    if (!archive.wanted[i] || !entry.IsFile() || entry.refusal != EntryRefusal::None) continue;
    const auto place = places.Of(entry);
    if (place)
      ReportExtracted(entry, place->path,
                      {platform::MayCreate(place->path) ? Status::Ok : Status::ErrorCreatingFile},
                      output);
  }
  return output.Finish();
}

using Run = int (*)(ReadingOptions options, const CommandContext& context);

std::shared_ptr<ReadingOptions> SetUp(CLI::App& app, CommandContext& context, Run run,
                                      bool password, const char* notes, const char* example) {
  auto options = std::make_shared<ReadingOptions>();
  context.names.Declare("ARCHIVE [NAME...]",
                        "A ZIP or RAR archive, and entries or folders in it, \"*\" and \"?\" for "
                        "any characters (default: all)",
                        1);
  if (password)
    AddName(app, "--password-file", options->password.file, "FILE",
            "Take the password from the first line of a file (default: ask on a terminal)");
  SetFooter(app, notes, example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpArchiveList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(
      app, context, [](ReadingOptions o, const CommandContext& c) { return RunList(o, c); }, false,
      TrLater("A line has time, size and name, separated by tabs; \"-\" is unknown."),
      "fotomill archive list holiday.zip");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {name, folder, size, modified, encrypted, refused}");
}

void SetUpArchiveTest(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(
      app, context, [](ReadingOptions o, const CommandContext& c) { return RunTest(o, c); }, true,
      TrLater("Unpacks everything and compares the checksums; nothing is written."),
      "fotomill archive test holiday.zip");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
}

void SetUpArchiveExtract(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunExtract, true,
                             TrLater("Without --dest, files go to ArchiveExtractPath, else beside "
                                     "the archive. ArchivePreservePaths and\n"
                                     "ArchivePreserveTimestamps say whether folders and times are "
                                     "kept. Names that lead out of the folder,\n"
                                     "links and special files are not extracted."),
                             "fotomill archive extract holiday.zip '*.jpg' --dest pictures");
  AddName(app, "-d,--dest", options->dest, "DIR",
          "Extract into this folder, which is created if missing");
  AddOverwrite(app, options->overwrite);
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be extracted");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
}

}  // namespace fotomill::cli
