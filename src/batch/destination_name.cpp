#include "batch/destination_name.h"

#include <algorithm>

#include "core/choice_lists.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "texts/system_reason.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kNotPlain = TrLater("The name must not contain a folder.");
constexpr const char* kTooLong = TrLater("The path would be longer than 260 characters.");

bool FitsPath(const std::string& path) { return path.size() <= PathText::Capacity(); }

// Replaces the base name of `path`.
std::string WithBase(const std::string& path, std::string_view base) {
  const platform::PathParts parts = platform::SplitPath(path);
  return platform::JoinPath({parts.drive, parts.folder, base, parts.extension});
}

// Whether a path contains "..".
bool LeadsUp(std::string_view path) {
  while (!path.empty()) {
    const size_t end = std::min(path.find_first_of("/\\"), path.size());
    if (path.substr(0, end) == "..") return true;
    path.remove_prefix(std::min(end + 1, path.size()));
  }
  return false;
}

bool IsFileName(std::string_view name) { return !name.empty() && name != "." && IsPlainName(name); }

// Asks until the name is valid or the user cancels. The extension is that of the format, cased like
// the source's.
bool AskName(Destination& destination, const std::string& source, std::string_view title,
             BatchJob& job) {
  const std::string_view format = destination.extension.empty()
                                      ? ExtensionOfFormat(job)
                                      : std::string_view(destination.extension);
  const std::string extension =
      CasedExtension(format, platform::ExtensionOf(source), job.naming.extensionCase);
  NameQuestion question{std::string(title), source, destination.path, extension, {}};
  const platform::PathParts planned = platform::SplitPath(destination.path);
  const std::string folder = std::string(planned.drive).append(planned.folder);
  for (;;) {
    const NameAnswer answer = job.prompts->AskDestinationName(question);
    job.naming.skipNames = job.naming.skipNames || answer.skipRest;
    if (!answer.ok) return false;
    const platform::PathParts parts = platform::SplitPath(answer.name);
    const std::string dotted = "." + extension;
    const auto whole = CompletedDestination(
        platform::JoinPath({parts.drive, parts.folder, parts.base, dotted}), folder);
    const bool plain = IsFileName(parts.base) && !LeadsUp(parts.folder);
    if (plain && whole) {
      const platform::PathParts chosen = platform::SplitPath(*whole);
      destination.elsewhere = folder != std::string(chosen.drive).append(chosen.folder);
      destination.path = *whole;
      return true;
    }
    question.problem = Tr(plain ? kTooLong : kNotPlain);
  }
}

// Saves the check boxes that are settings.
void StoreChecks(const OverwriteChecks& old, const OverwriteChecks& now, BatchJob& job) {
  const struct {
    Remembered what;
    bool was, is;
  } flags[] = {
      {Remembered::PromptBeforeOverwrite, old.notify, now.notify},
      {Remembered::OverwriteKeepBoth, old.keepBoth, now.keepBoth},
      {Remembered::OverwriteRecycle, old.recycle, now.recycle},
      {Remembered::OverwritePreviews, old.previews, now.previews},
  };
  for (const auto& flag : flags) {
    if (flag.was != flag.is && job.remember) job.remember(flag.what, flag.is ? 1 : 0);
  }
  job.overwrite.prompt = now.notify;
  job.overwrite.keepBoth = now.keepBoth;
  job.overwrite.recycle = now.recycle;
  job.overwrite.previews = now.previews;
  job.applyToRest = job.applyToRest || now.applyToRest;
}

DestinationAnswer KeepBoth(Destination& destination, const VariantMaker& variant) {
  destination.search = variant(destination.path);
  return destination.search == VariantSearch::Found ? DestinationAnswer::Write
                                                    : DestinationAnswer::Skip;
}

// Whether the destination exists. If that cannot be determined, no name is chosen.
bool IsTaken(Destination& destination, const TakenTest& taken) {
  const platform::Existence existence = taken(destination.path);
  if (existence == platform::Existence::Unknown) destination.search = VariantSearch::Unknown;
  return existence != platform::Existence::No;
}

DestinationAnswer Replace(Destination& destination, const OverwritePolicy& policy) {
  destination.replace = true;
  destination.recycle = policy.recycle;
  return DestinationAnswer::Write;
}

// Shows the overwrite prompt until the name is settled. If the entered name exists as well, numbers
// it if both files are to be kept; otherwise asks again.
DestinationAnswer AskAboutCollision(Destination& destination, const std::string& source,
                                    BatchJob& job, const TakenTest& taken,
                                    const VariantMaker& variant, const PictureRecord* picture) {
  OverwriteQuestion question{source, {}, {}, {}, picture, {}};
  for (;;) {
    const std::string base(platform::SplitPath(destination.path).base);
    question.path = destination.path;
    question.name = base;
    question.checks = {.notify = job.overwrite.prompt,
                       .keepBoth = job.overwrite.keepBoth,
                       .applyToRest = job.applyToRest,
                       .recycle = job.overwrite.recycle,
                       .previews = job.overwrite.previews};
    const OverwriteAnswer answer = job.prompts->AskOverwrite(question);
    if (!answer.ok) {
      job.overwrite.skip = job.overwrite.skip || answer.skipRest;
      return DestinationAnswer::Skip;
    }
    const bool renamed = answer.name != base;
    std::string path = renamed ? WithBase(destination.path, answer.name) : destination.path;
    if (renamed && (!IsFileName(answer.name) || !FitsPath(path))) {
      question.problem = Tr(IsFileName(answer.name) ? kTooLong : kNotPlain);
      continue;
    }
    StoreChecks(question.checks, answer.checks, job);
    destination.path = std::move(path);
    if (!renamed && answer.checks.keepBoth) return KeepBoth(destination, variant);
    if (!renamed) {
      destination.asked = true;
      return Replace(destination, job.overwrite);
    }
    if (!IsTaken(destination, taken)) return DestinationAnswer::Write;
    if (destination.search != VariantSearch::Found) return DestinationAnswer::Skip;
    if (answer.checks.keepBoth) return KeepBoth(destination, variant);
    if (!AsksAboutCollisions(job))
      return SettleUnasked(destination, job.overwrite, job.applyToRest, variant);
    question.problem.clear();
  }
}

}  // namespace

std::string CasedExtension(std::string_view formatExtension, std::string_view sourceExtension,
                           int32_t style) {
  std::string extension = LowerCase(formatExtension);
  for (size_t i = 0; i < extension.size() && i < sourceExtension.size(); ++i) {
    if (!IsLetter(extension[i]) || !IsLetter(sourceExtension[i])) continue;
    const bool upper =
        style == choice::kCaseUpper ||
        (style == choice::kCaseOfSource && sourceExtension[i] != LowerCase(sourceExtension[i]));
    if (upper) extension[i] = UpperCase(extension[i]);
  }
  return extension;
}

std::string_view ExtensionOfFormat(const BatchJob& job) {
  if (!job.extension.empty() || job.formatIndex == kNoFormat) return job.extension;
  return FormatRow(job.formatIndex).extension.view();
}

std::string PlannedDestination(const std::string& source, std::string_view below,
                               std::string_view prefix, const BatchJob& job) {
  const std::string base = std::string(prefix).append(platform::SplitPath(source).base);
  return PlannedDestination(
      source, {.extension = ExtensionOfFormat(job), .below = below, .subfolder = {}, .base = base},
      job);
}

std::string PlannedDestination(const std::string& source, const OutputPlace& place,
                               const BatchJob& job) {
  const platform::PathParts parts = platform::SplitPath(source);
  std::string name(place.base);
  name += '.';
  name += CasedExtension(place.extension, platform::ExtensionOf(source), job.naming.extensionCase);
  const bool beside = job.naming.beside || job.destinationFolder.empty();
  if (beside && place.subfolder.empty())
    return platform::JoinPath({parts.drive, parts.folder, name, {}});
  std::string folder =
      beside ? std::string(parts.drive).append(parts.folder) : job.destinationFolder;
  for (const std::string_view part : {beside ? std::string_view() : place.below, place.subfolder}) {
    const bool absolute =
        part.starts_with(platform::kSeparator) || !platform::SplitPath(part).drive.empty();
    if (!part.empty())
      folder = absolute         ? std::string(part)
               : folder.empty() ? std::string(part)
                                : platform::JoinFolder(folder, part);
  }
  return platform::JoinFolder(folder, name);
}

bool IsDestinationWanted(const BatchJob& job, bool intoFolder) {
  if (job.prompts == nullptr) return true;
  if (job.naming.confirmFormat && !ExtensionOfFormat(job).empty()) {
    const std::string format = UpperCase(ExtensionOfFormat(job));
    if (!job.prompts->ConfirmFormat(Tr("Write files to the %1 format?", format))) return false;
  }
  const std::string& folder = job.destinationFolder;
  if (!intoFolder || folder.empty() || job.naming.beside) return true;
  return platform::FileExists(folder) || job.prompts->ConfirmNewFolder(folder);
}

std::optional<std::string> CompletedDestination(const std::string& destination,
                                                std::string_view folder) {
  const platform::PathParts parts = platform::SplitPath(destination);
  std::string whole = destination;
  if (parts.drive.empty() && parts.folder.empty())
    whole = platform::JoinFolder(folder, destination);
  if (!FitsPath(whole)) return std::nullopt;
  return whole;
}

void SayNoName(const Destination& destination, FileOutcome& outcome) {
  outcome.destination.clear();
  outcome.status = Status::ErrorCreatingFile;
  outcome.skipped = destination.search == VariantSearch::AllTaken;
  if (outcome.skipped) outcome.hint = Tr(kWriteAborted);
  if (destination.search == VariantSearch::Unknown) {
    outcome.hint = WithReason(Tr("\"%1\" cannot be created.", destination.path));
  }
  if (destination.search != VariantSearch::GivenUp) return;
  outcome.status = Status::InvalidDestination;
  outcome.hint = Tr("%1 numbered variants of \"%2\" exist already.", ThousandsText(kMostVariants),
                    destination.path);
}

RecordedText SharedNameNote(const std::string& path) {
  return TrRecorded("Numbered, as another file of this run is \"%1\".", platform::FileNameOf(path));
}

void NoteLostAttributes(FileOutcome& outcome) {
  const std::string lost = platform::TakeLostAttributes();
  if (outcome.replaced && !lost.empty())
    outcome.note.Append(TrRecorded("Not kept from the replaced file: %1.", lost));
}

bool AsksAboutCollisions(const BatchJob& job) {
  return job.overwrite.prompt && !job.overwrite.skip && !job.applyToRest && job.prompts != nullptr;
}

// A suppressed prompt counts as answered with OK; if prompting is not possible, no file may be
// lost.
DestinationAnswer SettleUnasked(Destination& destination, const OverwritePolicy& policy,
                                bool applyToRest, const VariantMaker& variant) {
  if (policy.skip) return DestinationAnswer::Skip;
  if (!policy.prompt) return Replace(destination, policy);
  return policy.keepBoth || !applyToRest ? KeepBoth(destination, variant)
                                         : Replace(destination, policy);
}

DestinationAnswer MakeDestinationName(Destination& destination, const std::string& source,
                                      std::string_view title, BatchJob& job, const TakenTest& taken,
                                      const VariantMaker& variant, const PictureRecord* picture) {
  const FormatEntry& row =
      FormatRow(destination.formatIndex == kNoFormat ? job.formatIndex : destination.formatIndex);
  if ((row.flags & FMT_CLIPBOARD) != 0) {
    destination.path = kClipboardName;
    return DestinationAnswer::Write;
  }
  const bool asked = job.naming.askName && job.prompts != nullptr;
  if (asked && job.naming.skipNames) return DestinationAnswer::Skip;
  if (asked && !AskName(destination, source, title, job)) return DestinationAnswer::Skip;
  DestinationAnswer answer = DestinationAnswer::Write;
  destination.taken = IsTaken(destination, taken);
  if (destination.search != VariantSearch::Found) return DestinationAnswer::Skip;
  if (destination.taken) {
    answer = AsksAboutCollisions(job)
                 ? AskAboutCollision(destination, source, job, taken, variant, picture)
                 : SettleUnasked(destination, job.overwrite, job.applyToRest, variant);
  }
  if (answer == DestinationAnswer::Skip || !job.naming.askPassword || !row.takesPassword)
    return answer;
  const auto password =
      job.prompts != nullptr ? job.prompts->AskPassword(destination.path) : std::nullopt;
  if (!password) return DestinationAnswer::Skip;
  destination.password = *password;
  return answer;
}

}  // namespace fotomill
