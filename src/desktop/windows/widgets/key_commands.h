#pragma once

#include <wx/accel.h>
#include <wx/menu.h>

#include <algorithm>
#include <span>

#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

// A command of a window without menu bar, by keys and in its context menu, which is in row order; a
// row without text is a separator.
template <typename Window>
struct KeyCommand {
  static constexpr int kMostKeys = 3;

  const char* text;
  const char* shownKey;  // displayed beside the text
  int keys[kMostKeys];   // WXK_* or characters; ends with 0
  void (*run)(Window& window);
  // whether the menu item is checked; null: not checkable
  bool (*checked)(const Window& window) = nullptr;
  // if not null, the row is a submenu, whose commands the window handles
  wxMenu* (*newSubmenu)() = nullptr;
};

// Finds the command of a key; null if there is none.
template <typename Window>
const KeyCommand<Window>* CommandOfKey(std::span<const KeyCommand<Window>> commands, int key) {
  const auto has = [key](const KeyCommand<Window>& command) {
    return std::ranges::find(command.keys, key) != std::end(command.keys);
  };
  const auto found = key == 0 ? commands.end() : std::ranges::find_if(commands, has);
  return found == commands.end() ? nullptr : &*found;
}

// Shows the commands of `window` as a menu at a position in `owner`, which may be a child of it.
template <typename Window>
void ShowCommandMenu(std::span<const KeyCommand<Window>> commands, Window& window, wxWindow& owner,
                     const wxPoint& place) {
  wxMenu menu;
  int id = wxID_HIGHEST + 1;
  for (const KeyCommand<Window>& command : commands) {
    if (command.text == nullptr) {
      menu.AppendSeparator();
      continue;
    }
    if (command.newSubmenu != nullptr) {
      menu.AppendSubMenu(command.newSubmenu(), Label(command.text));
      continue;
    }
    // Keys are only displayed, as the window handles them.
    const wxString text = Label(command.text) + "    " + command.shownKey;
    if (command.checked == nullptr) {
      menu.Append(++id, text);
    } else {
      menu.AppendCheckItem(++id, text)->Check(command.checked(window));
    }
    menu.Bind(
        wxEVT_MENU, [&window, run = command.run](wxCommandEvent&) { run(window); }, id);
  }
  owner.PopupMenu(&menu, place);
}

// A menu of a menu bar: the commands of a group, which separators delimit, counted from 0.
struct MenuGroup {
  const char* title;
  size_t group;
};

// The text of a menu item. Keys that the toolkit understands also run the command when the menu bar
// is visible; others are only displayed.
template <typename Window>
wxString MenuTextOf(const KeyCommand<Window>& command) {
  wxAcceleratorEntry key;
  const bool known = key.FromString(wxString("\t") + command.shownKey);
  return Label(command.text) + (known ? "\t" : "    ") + command.shownKey;
}

// A menu bar with the commands of `window`, which must outlive it.
template <typename Window>
wxMenuBar* NewCommandBar(std::span<const KeyCommand<Window>> commands,
                         std::span<const MenuGroup> groups, Window& window) {
  auto* const bar = new wxMenuBar;
  for (const MenuGroup& row : groups) {
    auto* const menu = new wxMenu;
    size_t group = 0;
    for (const KeyCommand<Window>& command : commands) {
      if (command.text == nullptr) ++group;
      if (command.text == nullptr || group != row.group) continue;
      if (command.newSubmenu != nullptr) {
        menu->AppendSubMenu(command.newSubmenu(), Label(command.text));
        continue;
      }
      const bool checkable = command.checked != nullptr;
      wxMenuItem* const item = menu->Append(wxID_ANY, MenuTextOf(command), wxEmptyString,
                                            checkable ? wxITEM_CHECK : wxITEM_NORMAL);
      window.Bind(
          wxEVT_MENU, [&window, run = command.run](wxCommandEvent&) { run(window); },
          item->GetId());
      if (!checkable) continue;
      window.Bind(
          wxEVT_UPDATE_UI,
          [&window, checked = command.checked](wxUpdateUIEvent& event) {
            event.Check(checked(window));
          },
          item->GetId());
    }
    bar->Append(menu, Label(row.title));
  }
  return bar;
}

// Converts member functions to commands: of the window, or of its focused canvas.
template <auto action, typename Window>
void Of(Window& window) {
  (window.*action)();
}
template <auto action, typename Window>
void OfCanvas(Window& window) {
  (window.Canvas().*action)();
}
template <auto mode, typename Window>
void Zoom(Window& window) {
  window.Canvas().SetZoom(mode);
}

// A command that toggles a setting.
template <typename Window, int32_t Settings::*setting>
void SwitchSetting(Window& window) {
  settings.*setting = settings.*setting == 0 ? 1 : 0;
  window.SettingSwitched();
}
template <typename Window, int32_t Settings::*setting>
bool SettingIsOn(const Window&) {
  return settings.*setting != 0;
}

}  // namespace fotomill::desktop
