#include "desktop/windows/edit/edit_commands.h"

#include <wx/menu.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "operations/recipe_library.h"

namespace fotomill::desktop {

namespace {

struct EditCommand {
  const char* menu;
  const char* text;  // null for a separator
  const char* key = "";
  void (*run)(EditFrame& frame) = nullptr;
  bool (*enabled)(const EditFrame& frame) = nullptr;  // null: always
};

template <void (EditFrame::*action)()>
void Do(EditFrame& frame) {
  (frame.*action)();
}
template <void (EditFrame::*action)(int), int by>
void DoBy(EditFrame& frame) {
  (frame.*action)(by);
}
template <PreviewMode mode>
void Show(EditFrame& frame) {
  frame.SetMode(mode);
}
bool HasSteps(const EditFrame& frame) { return frame.HasSteps(); }
bool HasCurrent(const EditFrame& frame) { return frame.Steps().Current() != StepList::kNone; }
bool CanUndo(const EditFrame& frame) { return frame.Steps().CanUndo(); }
bool CanRedo(const EditFrame& frame) { return frame.Steps().CanRedo(); }

constexpr const char* kFile = TrLater("&File");
constexpr const char* kEdit = TrLater("&Edit");
constexpr const char* kView = TrLater("&View");

// clang-format off
constexpr EditCommand kCommands[] = {
    {kFile, TrLater("&Open recipe..."),        "Ctrl+O",       Do<&EditFrame::OpenRecipe>},
    {kFile, TrLater("Save as &recipe..."),     "Ctrl+S",       Do<&EditFrame::SaveRecipeAs>, HasSteps},
    {kFile, TrLater("&Export recipe..."),      "Ctrl+Shift+S", Do<&EditFrame::ExportRecipe>, HasSteps},
    {kFile, nullptr},
    {kFile, TrLater("&Save copies..."),        "Ctrl+E",       Do<&EditFrame::SaveCopies>, HasSteps},
    {kFile, TrLater("C&hange files"),          "Ctrl+Return",  Do<&EditFrame::ChangeFiles>, HasSteps},
    {kFile, nullptr},
    {kFile, TrLater("&Close"),                 "Ctrl+W",       [](EditFrame& frame) { frame.Close(); }},
    {kEdit, TrLater("&Undo"),                  "Ctrl+Z",       Do<&EditFrame::Undo>, CanUndo},
    {kEdit, TrLater("Re&do"),                  "Ctrl+Y",       Do<&EditFrame::Redo>, CanRedo},
    {kEdit, nullptr},
    {kEdit, TrLater("&Add step"),              "Ctrl+N",       Do<&EditFrame::AddChosen>},
    {kEdit, TrLater("&Remove step"),           "Ctrl+D",       Do<&EditFrame::RemoveStep>, HasCurrent},
    {kEdit, TrLater("Move step &up"),          "Alt+Up",       DoBy<&EditFrame::MoveStep, -1>, HasCurrent},
    {kEdit, TrLater("Move step dow&n"),        "Alt+Down",     DoBy<&EditFrame::MoveStep, 1>, HasCurrent},
    {kView, TrLater("&Result"),                "Ctrl+1",       Show<PreviewMode::After>},
    {kView, TrLater("&Split"),                 "Ctrl+2",       Show<PreviewMode::Split>},
    {kView, TrLater("Side &by side"),          "Ctrl+3",       Show<PreviewMode::Sides>},
    {kView, nullptr},
    {kView, TrLater("Zoom &in"),               "Ctrl++",       [](EditFrame& frame) { frame.Canvas().ZoomBy(ViewTransform::kStep); }},
    {kView, TrLater("Zoom &out"),              "Ctrl+-",       [](EditFrame& frame) { frame.Canvas().ZoomBy(1 / ViewTransform::kStep); }},
    {kView, TrLater("Fit to &window"),         "Ctrl+0",       [](EditFrame& frame) { frame.Canvas().SetZoom(ZoomMode::Fit); }},
    {kView, TrLater("&Actual size"),           "Ctrl+Shift+0", [](EditFrame& frame) { frame.Canvas().ZoomActual(); }},
    {kView, nullptr},
    {kView, TrLater("&Next picture"),          "Ctrl+PageDown", DoBy<&EditFrame::StepPicture, 1>},
    {kView, TrLater("&Previous picture"),      "Ctrl+PageUp",  DoBy<&EditFrame::StepPicture, -1>},
};
// clang-format on

// The recipes of the library; they are listed each time the menu is opened.
wxMenu* NewRecipeMenu(EditFrame& frame) {
  auto* menu = new wxMenu;
  const auto fill = [menu, &frame] {
    while (menu->GetMenuItemCount() > 0) menu->Destroy(menu->FindItemByPosition(0));
    for (const NamedRecipe& recipe : ListRecipes()) {
      const wxMenuItem* const item =
          menu->Append(wxID_ANY, wxControl::EscapeMnemonics(Shown(recipe.name)));
      frame.Bind(
          wxEVT_MENU,
          [&frame, name = recipe.name](wxCommandEvent&) {
            std::string text, path;
            if (FindRecipe(name, text, path).empty()) frame.LoadRecipe(name, text);
          },
          item->GetId());
    }
  };
  fill();
  frame.Bind(wxEVT_MENU_OPEN, [menu, fill](wxMenuEvent& event) {
    if (event.GetMenu() == menu) fill();
    event.Skip();
  });
  return menu;
}

}  // namespace

wxMenuBar* NewEditMenu(EditFrame& frame) {
  auto* bar = new wxMenuBar;
  std::map<std::string, wxMenu*> menus;
  for (const EditCommand& command : kCommands) {
    wxMenu*& menu = menus[command.menu];
    if (menu == nullptr) bar->Append(menu = new wxMenu, Label(command.menu));
    if (command.text == nullptr) {
      menu->AppendSeparator();
      continue;
    }
    const int id = menu->Append(wxID_ANY, Label(command.text) + "\t" + command.key)->GetId();
    frame.Bind(
        wxEVT_MENU, [&frame, &command](wxCommandEvent&) { command.run(frame); }, id);
    if (command.enabled == nullptr) continue;
    frame.Bind(
        wxEVT_UPDATE_UI,
        [&frame, &command](wxUpdateUIEvent& event) { event.Enable(command.enabled(frame)); }, id);
  }
  bar->Append(NewRecipeMenu(frame), Label("Rec&ipes"));
  return bar;
}

}  // namespace fotomill::desktop
