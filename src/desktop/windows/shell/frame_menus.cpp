#include "desktop/windows/shell/frame_menus.h"

#include <wx/control.h>
#include <wx/frame.h>
#include <wx/menu.h>
#include <wx/toolbar.h>

#include <map>
#include <string>
#include <vector>

#include "core/text.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/apply_steps.h"
#include "desktop/windows/edit/quick_menu.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "operations/recipe_library.h"
#include "settings/history_list.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kFileMenu = 0, kRecentPlace = 1;  // index in the menu bar; index in that menu
constexpr int kMostRecent = 1000;
constexpr int kRecentId = kFirstCommandId + 1000;  // of the submenu; its items follow
constexpr int kRecipesId = kFirstCommandId + 3000, kMostRecipes = 500;  // likewise

// The menu text with its key, in wxWidgets syntax.
wxString MenuText(const Command& command) {
  const std::string key = KeyOf(command);
  return Label(command.text) + (key.empty() ? wxString() : "\t" + Shown(key));
}

wxItemKind KindOf(const Command& command) {
  if (command.checked == nullptr) return wxITEM_NORMAL;
  return command.oneOf ? wxITEM_RADIO : wxITEM_CHECK;
}

}  // namespace

FrameMenus::FrameMenus(Shell& shell) : shell_(shell) {
  BuildBar();
  AddRecentFiles();
  AddFunctions();
  BindSecondKeys();
  BindCommands();
}

void FrameMenus::BuildBar() {
  auto* bar = new wxMenuBar;
  std::map<std::string, wxMenu*> menus;
  for (const Command& command : Commands()) {
    wxMenu*& menu = menus[command.menu];
    if (menu == nullptr) bar->Append(menu = new wxMenu, Label(command.menu));
    if (command.text == nullptr) {
      menu->AppendSeparator();
      continue;
    }
    menu->Append(CommandId(command), MenuText(command), Label(command.help), KindOf(command));
  }
  shell_.Window().SetMenuBar(bar);
}

void FrameMenus::AddRecentFiles() {
  recent_ = new wxMenu;
  wxMenu* const file = shell_.Window().GetMenuBar()->GetMenu(kFileMenu);
  file->Insert(kRecentPlace, kRecentId, Label("R&ecent files"), recent_,
               Label("Opens a picture again that was opened before."));
  shell_.Window().Bind(
      wxEVT_MENU,
      [this](wxCommandEvent& event) {
        const auto place = static_cast<size_t>(event.GetId() - kRecentId - 1);
        if (place < recentFiles_.size()) shell_.OpenPath(std::string(recentFiles_[place]));
      },
      kRecentId + 1, kRecentId + kMostRecent);
  UpdateRecentFiles();
}

void FrameMenus::UpdateRecentFiles() {
  while (recent_->GetMenuItemCount() > 0) recent_->Destroy(recent_->FindItemByPosition(0));
  recentFiles_.clear();
  for (const RecentFile& file : LoadRecentFiles()) {
    if (file.path == kDefaultEntry || recentFiles_.size() == kMostRecent) continue;
    recentFiles_.push_back(file.path);
    const size_t number = recentFiles_.size();
    const wxString key = number < 10 ? wxString::Format("&%zu ", number) : wxString();
    recent_->Append(kRecentId + static_cast<int>(number),
                    key + wxControl::EscapeMnemonics(Shown(file.path)));
  }
  shell_.Window().GetMenuBar()->Enable(kRecentId, !recentFiles_.empty());
  LogEvent("recent-files", std::to_string(recentFiles_.size()));
}

void FrameMenus::AddFunctions() {
  wxMenuBar* const bar = shell_.Window().GetMenuBar();
  wxMenu* const functions = bar->GetMenu(static_cast<size_t>(bar->FindMenu(Label("F&unctions"))));
  functions->AppendSeparator();
  functions->AppendSubMenu(NewQuickMenu(), Label("&Quick actions"),
                           Label("Changes the selected files at once, with the last values."));
  HandleQuickActions(
      shell_.Window(), shell_,
      [this] {
        const BrowserPage* const browser = shell_.Tabs().Front();
        return browser != nullptr && browser->Model().HasFileForFunction();
      },
      [this] { return shell_.Tabs().SelectedFiles(); });
  AddRecipes(*functions);
}

// The recipes of the library; they are listed each time the menu is opened.
void FrameMenus::AddRecipes(wxMenu& functions) {
  recipes_ = new wxMenu;
  functions.Append(kRecipesId, Label("Appl&y recipe"), recipes_,
                    Label("Applies a recipe to the selected pictures and saves copies."));
  shell_.Window().Bind(
      wxEVT_MENU,
      [this](wxCommandEvent& event) {
        const auto place = static_cast<size_t>(event.GetId() - kRecipesId - 1);
        if (place < recipeNames_.size()) RunRecipe(shell_, std::string(recipeNames_[place]));
      },
      kRecipesId + 1, kRecipesId + kMostRecipes);
  shell_.Window().Bind(wxEVT_MENU_OPEN, [this, &functions](wxMenuEvent& event) {
    if (event.GetMenu() == &functions) ListRecipesInMenu();
    event.Skip();
  });
  ListRecipesInMenu();
}

void FrameMenus::ListRecipesInMenu() {
  while (recipes_->GetMenuItemCount() > 0) recipes_->Destroy(recipes_->FindItemByPosition(0));
  recipeNames_.clear();
  for (const NamedRecipe& recipe : ListRecipes()) {
    if (recipeNames_.size() == kMostRecipes) break;
    recipeNames_.push_back(recipe.name);
    recipes_->Append(kRecipesId + static_cast<int>(recipeNames_.size()),
                     wxControl::EscapeMnemonics(Shown(recipe.name)));
  }
}

void FrameMenus::BindSecondKeys() {
  std::vector<wxAcceleratorEntry> keys;
  const auto taken = [commands = KeyedCommands()](const std::string& key) {
    return UserKeys().Conflict(commands, {}, key) != nullptr;
  };
  for (const Command& command : Commands()) {
    wxAcceleratorEntry key(0, 0, CommandId(command));
    if (command.secondKey == nullptr || KeyOf(command) != command.accelerator) continue;
    if (!taken(command.secondKey) && key.FromString(wxString("\t") + command.secondKey))
      keys.push_back(key);
  }
  const int32_t code = settings.JumpWindowHotKey;
  const char letter = code > 0 && code < 0x80 ? UpperCase(static_cast<char>(code)) : '\0';
  if ((IsLetter(letter) || IsDigit(letter)) && !taken(std::string("Ctrl+Shift+") + letter))
    keys.emplace_back(wxACCEL_CTRL | wxACCEL_SHIFT, letter, CommandId(JumpCommand()));
  shell_.Window().SetAcceleratorTable(
      wxAcceleratorTable(static_cast<int>(keys.size()), keys.data()));
}

void FrameMenus::UpdateKeys() {
  for (const Command& command : Commands()) {
    if (command.text == nullptr) continue;
    wxMenuItem* const item = shell_.Window().GetMenuBar()->FindItem(CommandId(command));
    if (item->GetItemLabel() != MenuText(command)) item->SetItemLabel(MenuText(command));
  }
  BindSecondKeys();
}

void FrameMenus::BindCommands() {
  const int last = kFirstCommandId + static_cast<int>(Commands().size()) - 1;
  shell_.Window().Bind(
      wxEVT_MENU,
      [this](wxCommandEvent& event) {
        const Command& command = CommandOfId(event.GetId());
        if (CanRun(command, shell_)) command.run(shell_);
      },
      kFirstCommandId, last);
  shell_.Window().Bind(
      wxEVT_UPDATE_UI, [this](wxUpdateUIEvent& event) { Update(event); }, kFirstCommandId, last);
}

void FrameMenus::Update(wxUpdateUIEvent& event) {
  const Command& command = CommandOfId(event.GetId());
  event.Enable(CanRun(command, shell_));
  // A radio item of a menu is unchecked by checking another one.
  const bool checked = command.checked != nullptr && command.checked(shell_);
  const bool radio = command.oneOf && dynamic_cast<wxToolBar*>(event.GetEventObject()) == nullptr;
  if (command.checked != nullptr && (checked || !radio)) event.Check(checked);
  if (command.needs != Needs::Undo && command.needs != Needs::Redo) return;
  const UndoList& undo = shell_.Files().Undoable();
  const std::string name = command.needs == Needs::Undo ? undo.UndoName() : undo.RedoName();
  const wxString verb = Label(command.text);
  const wxString text =
      (name.empty() ? verb : Label("%1 %2", verb, Shown(name))) + "\t" + Shown(KeyOf(command));
  wxMenuBar* const bar = shell_.Window().GetMenuBar();
  if (event.GetEventObject() == bar || bar->FindItem(event.GetId())->GetItemLabel() != text) {
    bar->FindItem(event.GetId())->SetItemLabel(text);
  }
}

// Commands for the folder, and as submenus the choices of the menu bar's View menu.
void FrameMenus::ShowFolderMenu(wxWindow& window, const wxPoint& place) {
  wxMenu menu;
  auto* const view = new wxMenu;
  auto* const sort = new wxMenu;
  for (const Command& command : Commands()) {
    if (command.text == nullptr || command.place == FolderPlace::None) continue;
    wxMenu& target = command.place == FolderPlace::View   ? *view
                     : command.place == FolderPlace::Sort ? *sort
                                                          : menu;
    wxMenuItem* const item =
        target.Append(CommandId(command), MenuText(command), Label(command.help), KindOf(command));
    if (command.checked != nullptr && command.checked(shell_)) item->Check();
    item->Enable(CanRun(command, shell_));
  }
  menu.AppendSeparator();
  menu.AppendSubMenu(view, Label("&View"));
  menu.AppendSubMenu(sort, Label("&Sort"));
  LogEvent("folder-commands", std::to_string(menu.GetMenuItemCount()));
  window.PopupMenu(&menu, place);
}

void FrameMenus::ShowContextMenu(wxWindow& window, const wxPoint& place) {
  wxMenu menu;
  for (const Command& command : Commands()) {
    if (command.text == nullptr || !command.inContextMenu) continue;
    menu.Append(CommandId(command), MenuText(command), Label(command.help));
  }
  menu.AppendSubMenu(NewQuickMenu(), Label("&Quick actions"));
  if (const std::vector<std::string> files = shell_.Tabs().SelectedFiles(); !files.empty()) {
    menu.AppendSeparator();
    menu.AppendSubMenu(new OpenWithMenu(shell_, files), Label("Open &with"));
  }
  window.PopupMenu(&menu, place);
}

}  // namespace fotomill::desktop
