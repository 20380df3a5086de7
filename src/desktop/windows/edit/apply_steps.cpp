#include "desktop/windows/edit/apply_steps.h"

#include <wx/frame.h>
#include <wx/msgdlg.h>

#include <memory>

#include "batch/new_job.h"
#include "batch/rewrite/edit_run.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/batch/destination_dialog.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "files/previous_file.h"
#include "operations/engine.h"
#include "operations/recipe_library.h"
#include "settings/job_options.h"
#include "settings/key_texts.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

std::vector<BatchFile> BatchOf(const std::vector<std::string>& files) {
  std::vector<BatchFile> batch;
  for (const std::string& file : files) batch.push_back({.name = file, .below = {}, .hint = {}});
  return batch;
}

using RecipePointer = std::shared_ptr<const Recipe>;
using ReadRecipes = std::map<std::string, RecipePointer>;

// Null if it has a mistake.
RecipePointer Read(const std::string& text) {
  auto recipe = std::make_shared<Recipe>();
  return ReadRecipe(text, KeyTextInForce, *recipe).empty() ? recipe : nullptr;
}

// Those without mistakes.
ReadRecipes ReadAll(const FileRecipes& recipes) {
  ReadRecipes read;
  for (const auto& [file, text] : recipes) {
    if (RecipePointer recipe = Read(text)) read.emplace(file, std::move(recipe));
  }
  return read;
}

std::vector<std::string> FilesOf(const FileRecipes& recipes) {
  std::vector<std::string> files;
  for (const auto& [file, text] : recipes) files.push_back(file);
  return files;
}

void Change(Shell& shell, const std::vector<std::string>& files, RecipePointer recipe,
            ReadRecipes own) {
  auto previous = std::make_shared<PreviousFiles>(FileOperationKind::Change);
  EditFunction function;
  function.request.recipe = std::move(recipe);
  function.request.copyrightHolder = std::string(settings.ExifCopyrightHolder.view());
  function.request.faces = FaceOptionsFromSettings();
  function.request.reduction = ReduceOptionsFromSettings();
  function.request.turnsUpright = settings.ExifAdjustOrientation != 0;
  function.request.threads = files.size() > 1 ? 1 : 0;
  function.recipes = std::move(own);
  function.backups = settings.CreateBackups != 0;
  function.keepPrevious = [previous](const std::string& path) { return previous->Keep(path); };
  function.replaced = [previous](const std::string& path) { previous->Replaced(path); };
  shell.Batches().Run(
      NewBatchJob(),
      [batch = BatchOf(files), function](BatchJob& job) { return RunEdit(batch, function, job); },
      previous);
}

}  // namespace

bool SaveCopiesOf(Shell& shell, wxWindow& parent, const std::vector<std::string>& files,
                  const std::string& recipe) {
  DestinationDialog dialog(&parent, Label("Save"), files, {}, recipe);
  LogEvent("prompt", "destination");
  if (dialog.ShowModal() != wxID_OK) return false;
  const DestinationChoice choice = dialog.Choice();
  BatchJob job = JobFor(choice);
  BatchFunction function = FunctionFor(choice, job);
  shell.Batches().Run(BatchOf(files), std::move(function), std::move(job));
  return true;
}

bool ChangeFilesBy(Shell& shell, const std::vector<std::string>& files, const std::string& recipe) {
  const RecipePointer read = Read(recipe);
  if (read == nullptr || RefusesChange(&shell.Window(), files)) return false;
  Change(shell, files, read, {});
  return true;
}

bool SaveCopiesOf(Shell& shell, wxWindow& parent, const FileRecipes& recipes) {
  const ReadRecipes read = ReadAll(recipes);
  const std::vector<std::string> files = FilesOf(recipes);
  if (files.empty() || read.size() != recipes.size()) return false;
  DestinationDialog dialog(&parent, Label("Save"), files, {}, recipes.begin()->second);
  LogEvent("prompt", "destination");
  if (dialog.ShowModal() != wxID_OK) return false;
  const DestinationChoice choice = dialog.Choice();
  BatchJob job = JobFor(choice);
  BatchFunction function = FunctionFor(choice, job);
  function.decodedSide = {};
  function.transform = [read, stop = job.stop.Token()](PictureRecord& picture) {
    const auto own = read.find(std::string(picture.fileName.view()));
    if (own == read.end()) return Status::Ok;
    EngineOptions options;
    options.work.goesOn = [&stop] { return !stop.Asked(); };
    return ApplySteps(picture, own->second->common, options);
  };
  shell.Batches().Run(BatchOf(files), std::move(function), std::move(job));
  return true;
}

bool ChangeFilesBy(Shell& shell, const FileRecipes& recipes) {
  const ReadRecipes read = ReadAll(recipes);
  const std::vector<std::string> files = FilesOf(recipes);
  if (recipes.empty() || read.size() != recipes.size()) return false;
  if (RefusesChange(&shell.Window(), files)) return false;
  Change(shell, files, read.begin()->second, read);
  return true;
}

void RunRecipe(Shell& shell, const std::string& name) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  std::string text, path;
  std::string wrong = FindRecipe(name, text, path);
  Recipe recipe;
  if (wrong.empty()) {
    const std::vector<Mistake> mistakes = ReadRecipe(text, KeyTextInForce, recipe);
    if (!mistakes.empty()) wrong = mistakes.front().Text();
  }
  if (!wrong.empty()) {
    LogEvent("prompt", "recipe-problem " + name);
    wxMessageBox(Shown(wrong), Shown(name), wxOK | wxICON_WARNING, &shell.Window());
    return;
  }
  (void)SaveCopiesOf(shell, shell.Window(), files, text);
}

}  // namespace fotomill::desktop
