#include "desktop/models/batch/destination_choice.h"

#include <algorithm>
#include <memory>

#include "batch/destination_name.h"
#include "batch/new_job.h"
#include "batch/recipe_function.h"
#include "core/text.h"
#include "operations/macros.h"
#include "operations/recipe_library.h"
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

// Writable rows that are not in the destination list. Rows that write the same files as a listed
// one, such as JPEG besides JPG, are left out.
std::vector<int32_t> FurtherRows() {
  constexpr uint32_t kNeverListed = FMT_WALLPAPER | FMT_CLIPBOARD | FMT_SPARE;
  std::vector<WriteOperation> listed;
  for (const int32_t row : DestinationRows()) listed.push_back(FormatRow(row).write);
  std::vector<int32_t> further;
  for (int32_t row = 0; row < formatCount; ++row) {
    const FormatEntry& entry = FormatRow(row);
    if (!CanWrite(entry) || entry.enabled == 0 || (entry.flags & kNeverListed) != 0) continue;
    if (std::ranges::find(listed, entry.write) != listed.end()) continue;
    listed.push_back(entry.write);
    further.push_back(row);
  }
  return further;
}

int32_t RowOf(const std::string& extension) {
  for (const int32_t row : DestinationRows()) {
    if (EqualIgnoringCase(FormatRow(row).extension, extension)) return row;
  }
  for (const int32_t row : FurtherRows()) {
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

// The recipe of a choice: its own or that of the library, then the resize step, with the choice's
// quality and name where the recipe has none. Empty on success, else what is wrong, as a sentence.
std::string RecipeFor(const DestinationChoice& choice, Recipe& recipe) {
  std::string text = choice.step, path;
  if (text.empty() && !choice.recipe.empty()) {
    if (std::string wrong = FindRecipe(choice.recipe, text, path); !wrong.empty()) return wrong;
  }
  Recipe resize;
  for (const auto& [source, target] :
       {std::pair(text, &recipe), std::pair(choice.resize, &resize)}) {
    if (source.empty()) continue;
    const std::vector<Mistake> mistakes = ReadRecipe(source, KeyTextInForce, *target);
    if (!mistakes.empty()) return mistakes.front().Text();
  }
  if (recipe.outputs.empty()) recipe.outputs.emplace_back();
  for (RecipeOutput& output : recipe.outputs) {
    output.steps.insert(output.steps.end(), resize.common.begin(), resize.common.end());
    if (output.save.name.empty()) output.save.name = choice.name;
    if (output.save.quality != 0 || output.save.mostBytes != 0) continue;
    const bool own = choice.extension.empty() || RecipeNamesFormats(choice.step);
    if (!HasQuality(UpperCase(own ? output.save.to : choice.extension))) continue;
    output.save.quality = choice.quality;
    output.save.mostBytes = choice.mostBytes;
  }
  return {};
}

bool NeedsRecipe(const DestinationChoice& choice) {
  return !choice.recipe.empty() || !choice.step.empty() || !choice.resize.empty() ||
         !choice.name.empty() || choice.quality != 0 || choice.mostBytes != 0;
}

// What is wrong with a name pattern, as a sentence.
std::string NameProblem(const std::string& pattern) {
  if (const RecordedText wrong = MacroProblem(pattern); !wrong.empty())
    return Tr("The name %1.", wrong.shown);
  if (pattern.find_first_of("/\\") != std::string::npos)
    return Tr("The name must not contain a folder.");
  return {};
}

// The path of the first output of a file. If its name needs the picture, with the pattern instead.
std::string PlannedPath(const std::string& file, const DestinationChoice& choice,
                        const BatchFunction& function, const BatchJob& job) {
  const BatchOutput* const output = function.outputs.empty() ? nullptr : &function.outputs[0];
  std::string base =
      std::string(job.naming.PrefixOf(function.history)).append(platform::SplitPath(file).base);
  if (output != nullptr && output->name)
    base = output->nameNeedsPicture ? choice.name : output->name(file, nullptr);
  const std::string_view folder = output == nullptr ? std::string_view() : output->folder;
  return PlannedDestination(file, {ExtensionOfFormat(job), {}, folder, base}, job);
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
  for (const int32_t row : FurtherRows()) {
    const FormatEntry& entry = FormatRow(row);
    formats.push_back({LowerCase(entry.extension), std::string(entry.description), row, true});
  }
  for (const PluginFormatFacts& format : PluginFormats()) {
    if (format.canWrite)
      formats.push_back({LowerCase(format.extension), PluginDescription(format), kSpareRow, true});
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

bool ResizeStep(const std::string& typed, std::string& step) {
  step.clear();
  constexpr std::string_view kTimes = "\u00D7";
  std::string text;
  for (size_t i = 0; i < typed.size(); ++i) {
    const bool times = typed.compare(i, kTimes.size(), kTimes) == 0;
    if (times) i += kTimes.size() - 1;
    if (typed[i] != ' ') text += times ? 'x' : typed[i];
  }
  if (text.empty()) return true;
  Recipe recipe;
  const std::string line = "resize " + text;
  if (text.find_first_not_of("0123456789.x%") != std::string::npos ||
      !ReadRecipe(line, KeyTextInForce, recipe).empty())
    return false;
  step = line;
  return true;
}

DestinationChoice LastChoice() {
  return {.extension = {},
          .folder = {},
          .recipe = std::string(settings.DestinationRecipe.view()),
          .name = std::string(settings.DestinationNamePattern.view())};
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
  if (choice.step.empty()) {
    settings.DestinationRecipe = SettingText(choice.recipe);
    settings.DestinationNamePattern = SettingText(choice.name);
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
  if (std::string wrong = NameProblem(choice.name); !wrong.empty()) return wrong;
  Recipe recipe;
  if (std::string wrong = RecipeFor(choice, recipe); !wrong.empty()) return wrong;
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
  const BatchFunction function = FunctionFor(choice, job);
  DestinationOutlook outlook;
  for (size_t i = 0; i < std::min(files.size(), kMostLookedUp); ++i) {
    const std::string path = PlannedPath(files[i], choice, function, job);
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
  if (NeedsRecipe(choice) && RecipeFor(choice, *recipe).empty()) {
    if (recipe->HasSteps()) function.history = FunctionOfFamily(recipe->First()->family);
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
