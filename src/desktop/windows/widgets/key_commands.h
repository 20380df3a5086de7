#pragma once

#include <wx/menu.h>

#include <algorithm>
#include <span>

#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

// One thing that a window without a menu bar can do, by keys and by the menu of the right mouse
// button, whose order is that of the rows; a row without text is a line there.
template <typename Window>
struct KeyCommand {
  static constexpr int kMostKeys = 3;

  const char* text;
  const char* shownKey;  // beside the text
  int keys[kMostKeys];   // WXK_* or characters; 0 ends them
  void (*run)(Window& window);
  // whether its menu item has a mark; null for one that never has
  bool (*checked)(const Window& window) = nullptr;
};

// The command of a key, null if none.
template <typename Window>
const KeyCommand<Window>* CommandOfKey(std::span<const KeyCommand<Window>> commands, int key) {
  const auto has = [key](const KeyCommand<Window>& command) {
    return std::ranges::find(command.keys, key) != std::end(command.keys);
  };
  const auto found = key == 0 ? commands.end() : std::ranges::find_if(commands, has);
  return found == commands.end() ? nullptr : &*found;
}

// Shows the commands of `window` as a menu at a place of `owner`, which may be a part of it.
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
    // The key is shown beside the text only: keys are the window's own.
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

// Members as commands: of the window itself, and of the canvas in it that has the focus.
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

// A setting that is on or off, as a command of windows that follow it.
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
