#include <wx/filedlg.h>
#include <wx/msgdlg.h>
#include <wx/textdlg.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/apply_steps.h"
#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "operations/recipe_library.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/key_texts.h"

// Recipes of an Edit window, and applying its steps.
namespace fotomill::desktop {

namespace {

constexpr size_t kMostMistakes = 8;  // shown at once

wxString RecipeFilter() { return Label("Recipes") + " (*.recipe)|*.recipe"; }

}  // namespace

void EditFrame::OpenRecipe() {
  wxFileDialog dialog(this, Label("Open recipe"), "", "", RecipeFilter(),
                      wxFD_OPEN | wxFD_FILE_MUST_EXIST);
  if (dialog.ShowModal() != wxID_OK) return;
  std::string text, path;
  const std::string wrong = FindRecipe(Utf8(dialog.GetPath()), text, path);
  if (!wrong.empty()) {
    wxMessageBox(Shown(wrong), Label("Open recipe"), wxOK | wxICON_WARNING, this);
    return;
  }
  LoadRecipe(std::string(platform::FileNameOf(path)), text);
}

void EditFrame::LoadRecipe(const std::string& name, const std::string& text) {
  Recipe recipe;
  const std::vector<Mistake> mistakes = ReadRecipe(text, KeyTextInForce, recipe);
  wxString problem;
  for (size_t i = 0; i < std::min(mistakes.size(), kMostMistakes); ++i)
    problem += Shown(mistakes[i].Text()) + "\n";
  if (problem.empty() && recipe.outputs.size() > 1)
    problem = Label("This recipe has several outputs. Run it from the Functions menu.");
  // Saved again, it would lose them.
  if (problem.empty() && recipe.outputs.front().hasSave)
    problem = Label("This recipe also sets formats or names. Run it from the Functions menu.");
  if (!problem.empty()) {
    LogEvent("prompt", "recipe-problem " + name);
    wxMessageBox(problem, Shown(name), wxOK | wxICON_WARNING, this);
    return;
  }
  std::vector<Step> steps = std::move(recipe.common);
  for (Step& step : recipe.outputs.front().steps) steps.push_back(std::move(step));
  LogEvent("edit-recipe", name + " steps=" + std::to_string(steps.size()));
  steps_.Replace(std::move(steps));
  StepsChanged();
}

void EditFrame::SaveRecipeAs() {
  wxTextEntryDialog dialog(this, Label("Name of the recipe in the Functions menu:"),
                           Label("Save recipe"));
  LogEvent("prompt", "recipe-name");
  if (dialog.ShowModal() != wxID_OK || dialog.GetValue().empty()) return;
  const std::string path = RecipePath(Utf8(dialog.GetValue()));
  if (path.empty()) {
    wxMessageBox(Label("This name cannot be used for a file."), Label("Save recipe"),
                 wxOK | wxICON_WARNING, this);
    return;
  }
  if (platform::FileExists(path)) {
    wxMessageDialog replace(this, Label("A recipe of this name exists. Replace it?"),
                            Label("Save recipe"), wxOK | wxCANCEL | wxICON_QUESTION);
    replace.SetOKLabel(Label("&Replace"));
    if (replace.ShowModal() != wxID_OK) return;
  }
  WriteRecipe(path);
}

void EditFrame::ExportRecipe() {
  wxFileDialog dialog(this, Label("Export recipe"), "", "", RecipeFilter(),
                      wxFD_SAVE | wxFD_OVERWRITE_PROMPT);
  if (dialog.ShowModal() != wxID_OK) return;
  std::string path = Utf8(dialog.GetPath());
  if (platform::ExtensionOf(path).empty()) path += ".recipe";
  WriteRecipe(path);
}

void EditFrame::WriteRecipe(const std::string& path) {
  const std::string wrong = SaveRecipe(path, steps_.RecipeText());
  LogEvent("edit-saved", path);
  if (wrong.empty()) return SetStatusText(Label("Saved as %1.", Shown(path)));
  wxMessageBox(Shown(wrong), Label("Save recipe"), wxOK | wxICON_WARNING, this);
}

void EditFrame::SaveCopies() {
  if (HasSteps() && SaveCopiesOf(shell_, *this, files_, steps_.RecipeText())) Applied();
}

void EditFrame::ChangeFiles() {
  if (HasSteps() && ChangeFilesBy(shell_, files_, steps_.RecipeText())) Applied();
}

// The batch runs without this window.
void EditFrame::Applied() {
  (void)memory_.KeepLast(steps_.Applied());
  changed_ = false;
  Close();
}

}  // namespace fotomill::desktop
