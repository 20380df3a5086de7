#include "desktop/models/batch/destination_choice.h"

#include "batch/destination_name.h"
#include "batch/new_job.h"
#include "core/text.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/history_list.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

int32_t RowOf(const std::string& extension) {
  for (const int32_t row : DestinationRows()) {
    if (EqualIgnoringCase(FormatRow(row).extension, extension)) return row;
  }
  return FindPluginFormat("x." + extension);
}

}  // namespace

std::vector<DestinationFormat> DestinationFormats() {
  std::vector<DestinationFormat> formats;
  for (const int32_t row : DestinationRows()) {
    const FormatEntry& entry = FormatRow(row);
    if (CanWrite(entry))
      formats.push_back({LowerCase(entry.extension), std::string(entry.description), row});
  }
  for (const PluginFormatFacts& format : PluginFormats()) {
    if (format.canWrite)
      formats.push_back({LowerCase(format.extension), PluginDescription(format), kSpareRow});
  }
  return formats;
}

std::vector<std::string> RecentDestinations() {
  std::vector<std::string> folders;
  for (const std::string& entry : LoadHistoryList(HistoryList::Destination)) {
    if (entry != kDefaultEntry) folders.push_back(entry);
  }
  return folders;
}

std::string DestinationProblem(const DestinationChoice& choice) {
  const int32_t row = RowOf(choice.extension);
  if (row == kNoFormat || !CanWrite(FormatRow(row))) return Tr("The format cannot be written.");
  if (choice.folder.empty()) return {};
  if (choice.folder.size() > PathText::Capacity())
    return Tr("The path of the folder is longer than 260 characters.");
  if (platform::ExistenceOf(choice.folder) == platform::Existence::Yes &&
      !platform::IsFolder(choice.folder))
    return Tr("\"%1\" is not a folder.", choice.folder);
  return {};
}

std::string FirstDestination(const DestinationChoice& choice, const std::string& source) {
  if (!DestinationProblem(choice).empty()) return {};
  return PlannedDestination(source, {}, {}, JobFor(choice));
}

BatchJob JobFor(const DestinationChoice& choice) {
  BatchJob job = NewBatchJob();
  job.formatIndex = RowOf(choice.extension);
  job.extension = UpperCase(choice.extension);
  job.destinationFolder = choice.folder;
  return job;
}

}  // namespace fotomill::desktop
