#include "settings/previous_version.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/text.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint64_t kPiece = uint64_t{1} << 20;  // the thumbnail database may exceed the memory

bool MatchesOne(std::string_view name, std::string_view pattern) {
  if (!pattern.starts_with('*')) return EqualIgnoringCase(name, pattern);
  pattern.remove_prefix(1);
  return name.size() >= pattern.size() &&
         EqualIgnoringCase(name.substr(name.size() - pattern.size()), pattern);
}

bool IsCarried(std::string_view name) {
  std::string_view patterns = kCarriedFiles;
  while (!patterns.empty()) {
    const size_t end = std::min(patterns.find(';'), patterns.size());
    if (MatchesOne(name, patterns.substr(0, end))) return true;
    patterns.remove_prefix(std::min(end + 1, patterns.size()));
  }
  return false;
}

platform::CommitResult CopyFile(const std::string& from, const std::string& to) {
  platform::FileView view;
  platform::OutputFile output;
  if (!view.Open(from) || !output.Create(to)) return platform::CommitResult::Failed;
  const std::span<const uint8_t> bytes = view.Bytes();
  for (uint64_t done = 0; done < bytes.size(); done += kPiece) {
    if (!output.Write(bytes.subspan(done, std::min<uint64_t>(kPiece, bytes.size() - done)))) break;
    view.DropBefore(done);
  }
  if (!view.Intact()) return platform::CommitResult::Failed;
  return output.Commit(platform::Existing::Refuse, true);
}

void Carry(const std::string& from, const std::string& to, CarryOver& result) {
  const std::string name(platform::FileNameOf(from));
  if (platform::FileExists(to)) {
    result.kept.push_back(name);
    return;
  }
  switch (CopyFile(from, to)) {
    case platform::CommitResult::Done:
      (void)platform::CopyTimes(from, to);
      (void)platform::SetHidden(to, platform::IsHidden(from));
      result.copied.push_back(name);
      break;
    case platform::CommitResult::Taken: result.kept.push_back(name); break;
    case platform::CommitResult::Failed: result.failed.push_back(name); break;
  }
}

}  // namespace

CarryOver CarryOverDataFolder(const std::string& previous, const std::string& current) {
  CarryOver result;
  const auto entries = platform::ListFolder(previous);
  if (!entries) return result;
  bool made = false;
  for (const platform::FolderEntry& entry : *entries) {
    const bool configuration = entry.name == kPreviousConfigurationFile;
    if (entry.kind != platform::FileKind::Regular || (!configuration && !IsCarried(entry.name)))
      continue;
    made = made || platform::MakeFolders(current);
    Carry(platform::JoinFolder(previous, entry.name),
          platform::JoinFolder(current,
                               configuration ? kConfigurationFile : std::string_view(entry.name)),
          result);
  }
  return result;
}

std::optional<CarryOver> CarryOverAtFirstStart() {
  const std::string current = ConfigurationPath();
  if (current.empty() || platform::FileExists(current) ||
      !platform::IsRegularFile(platform::JoinFolder(DataFolder(), kPreviousConfigurationFile)))
    return std::nullopt;
  CarryOver carried = CarryOverDataFolder(DataFolder(), DataFolder());
  const auto lists = [](const std::vector<std::string>& names) {
    return std::ranges::find(names, kPreviousConfigurationFile) != names.end();
  };
  if (lists(carried.kept)) return std::nullopt;  // another process was faster
  // where the folder could not be listed
  if (!lists(carried.copied) && !lists(carried.failed))
    carried.failed.emplace_back(kPreviousConfigurationFile);
  return carried;
}

std::string CarryOverText(const CarryOver& carried) {
  if (std::ranges::find(carried.failed, kPreviousConfigurationFile) != carried.failed.end()) {
    return Tr("The settings could not be copied from \"%1\", so the defaults apply.",
              kPreviousConfigurationFile);
  }
  return Tr("First start of this version: the settings were copied from \"%1\".",
            kPreviousConfigurationFile);
}

}  // namespace fotomill
