#include "desktop/models/batch/destination_choice.h"

#include <algorithm>
#include <memory>

#include "batch/destination_name.h"
#include "batch/new_job.h"
#include "batch/recipe_function.h"
#include "core/text.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "registry/registry.h"
#include "settings/history_list.h"
#include "settings/key_texts.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

int32_t RowOf(const std::string& extension) {
  for (const int32_t row : DestinationRows()) {
    if (EqualIgnoringCase(FormatRow(row).extension, extension)) return row;
  }
  return FindPluginFormat("x." + extension);
}

// The folder, or its nearest existing parent.
std::string ExistingFolder(std::string folder) {
  while (folder.size() > 1 && !platform::FileExists(folder)) {
    if (folder.back() == platform::kSeparator) folder.pop_back();
    folder = platform::FolderOf(folder);
  }
  return folder;
}

// A format's number in LastFormatSelected: its row; for plug-in formats, a number after all rows.
int32_t NumberOf(const std::vector<DestinationFormat>& formats, size_t place) {
  if (formats[place].row != kSpareRow) return formats[place].row;
  return formatCount + static_cast<int32_t>(place);
}

// The formats of the outputs: those of the recipe, if each output has one, else the choice's own.
std::vector<std::string> ExtensionsOf(const DestinationChoice& choice) {
  if (!RecipeNamesFormats(choice.step)) return {choice.extension};
  Recipe recipe;
  (void)ReadRecipe(choice.step, KeyTextInForce, recipe);
  std::vector<std::string> extensions;
  for (const RecipeOutput& output : recipe.outputs) extensions.push_back(output.save.to);
  return extensions;
}

// Sets the comment of all outputs, in addition to other changes.
void AddComment(const std::string& comment, BatchFunction& function) {
  if (comment.empty()) return;
  function.transform = [comment, change = function.transform](PictureRecord& picture) {
    picture.comment.assign(comment.begin(), comment.end());
    return change ? change(picture) : Status::Ok;
  };
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

size_t FirstFormat(const std::vector<DestinationFormat>& formats) {
  size_t first = 0;
  for (size_t i = 0; i < formats.size(); ++i) {
    if (EqualIgnoringCase(formats[i].extension, settings.DefaultFileExtension)) first = i;
  }
  if (settings.UseDefaultDestFormat != 0) return first;
  for (size_t i = 0; i < formats.size(); ++i) {
    if (NumberOf(formats, i) == settings.LastFormatSelected) return i;
  }
  return first;
}

std::vector<std::string> RecentDestinations(const std::string& shown) {
  return OfferedEntries(HistoryList::Destination, shown);
}

void KeepChoice(const DestinationChoice& choice, const std::string& shown) {
  const std::vector<DestinationFormat> formats = DestinationFormats();
  for (size_t i = 0; i < formats.size(); ++i) {
    if (formats[i].extension == choice.extension)
      settings.LastFormatSelected = NumberOf(formats, i);
  }
  settings.DestForceSourceDir = choice.folder.empty() ? 1 : 0;
  if (!choice.folder.empty())
    (void)AddChoice(HistoryList::Destination, platform::AbsolutePath(choice.folder), shown);
}

std::vector<DestinationPart> DestinationParts() {
  if (settings.PromptForDestination == 0) return {DestinationPart::Format};
  if (settings.DestinationWindowCombined != 0) return {DestinationPart::Both};
  return {DestinationPart::Format, DestinationPart::Folder};
}

std::string DestinationProblem(const DestinationChoice& choice) {
  for (const std::string& extension : ExtensionsOf(choice)) {
    const int32_t row = RowOf(extension);
    if (row == kNoFormat || !CanWrite(FormatRow(row))) return Tr("The format cannot be written.");
  }
  if (choice.folder.empty()) return {};
  if (choice.folder.size() > PathText::Capacity())
    return Tr("The path of the folder is longer than 260 characters.");
  if (platform::ExistenceOf(choice.folder) == platform::Existence::Yes &&
      !platform::IsFolder(choice.folder))
    return Tr("\"%1\" is not a folder.", choice.folder);
  return {};
}

std::string WholeFolder(const std::string& typed, const std::string& shown) {
  const bool relative =
      platform::SplitPath(typed).drive.empty() && !typed.starts_with(platform::kSeparator);
  return typed.empty() || !relative ? typed
                                    : platform::AbsolutePath(platform::JoinFolder(shown, typed));
}

DestinationOutlook OutlookOf(const DestinationChoice& choice,
                             const std::vector<std::string>& files) {
  const BatchJob job = JobFor(choice);
  const std::string_view prefix = job.naming.PrefixOf(FunctionFor(choice, job).history);
  DestinationOutlook outlook;
  for (size_t i = 0; i < std::min(files.size(), kMostLookedUp); ++i) {
    const std::string path = PlannedDestination(files[i], {}, prefix, job);
    if (i == 0) outlook.first = path;
    outlook.existing += platform::ExistenceOf(path) == platform::Existence::Yes;
  }
  outlook.freeSpace = platform::FreeSpace(ExistingFolder(platform::FolderOf(outlook.first)));
  return outlook;
}

bool RecipeNamesFormats(const std::string& recipe) {
  Recipe read;
  return !recipe.empty() && ReadRecipe(recipe, KeyTextInForce, read).empty() &&
         std::ranges::none_of(read.outputs,
                              [](const RecipeOutput& output) { return output.save.to.empty(); });
}

BatchJob JobFor(const DestinationChoice& choice) {
  BatchJob job = NewBatchJob();
  if (!RecipeNamesFormats(choice.step)) {
    job.formatIndex = RowOf(choice.extension);
    job.extension = UpperCase(choice.extension);
  }
  job.destinationFolder = choice.folder;
  job.naming.beside = choice.folder.empty();
  if (!choice.comment.empty()) job.writeComments = true;
  return job;
}

BatchFunction FunctionFor(const DestinationChoice& choice, const BatchJob& job) {
  BatchFunction function;
  function.reduce = choice.reduce;
  function.autoOrient = choice.autoOrient;
  function.keepMetadata = choice.keepMetadata;
  auto recipe = std::make_shared<Recipe>();
  if (!choice.step.empty() && ReadRecipe(choice.step, KeyTextInForce, *recipe).empty()) {
    function.history = FunctionOfFamily(recipe->First()->family);
    const FormatLookup lookup = [](const std::string& extension, int32_t& row, std::string& name) {
      row = RowOf(extension);
      name = UpperCase(extension);
      return std::string();
    };
    (void)SetRecipe(recipe, std::string(settings.ExifCopyrightHolder.view()), job, lookup, function);
  }
  AddComment(choice.comment, function);
  return function;
}

}  // namespace fotomill::desktop
