#pragma once

#include <wx/defs.h>

#include <span>
#include <string_view>

namespace fotomill::desktop {

class Shell;

// When a command can be used; where it cannot, its menu item and button are gray.
enum class Needs {
  Nothing,
  Files,  // at least one file selected or focused
  Few,    // two to four files
  Item,   // at least one file or folder
  Undo,   // something to take back; the menu item then names it
  Redo,
  ClosedTab,
};

// One function of the frame: a menu item, perhaps a button, its keys, and what it does. A new
// window is one row in commands.cpp. Menus and toolbar are in the order of the rows; a row without
// text draws a line in its menu.
struct Command {
  const char* menu;              // "&File"; these texts are in English
  const char* text;              // with mnemonic; null for a separator
  const char* accelerator = "";  // as wxWidgets writes them, empty for none
  const char* help = "";         // one sentence for the status bar
  Needs needs = Needs::Nothing;
  void (*run)(Shell& shell) = nullptr;
  // of the button in the toolbar (bitmaps.cpp), null for no button
  const char* symbol = nullptr;
  bool inContextMenu = false;               // of a file in a browser
  // whether its menu item has a mark; null for one that never has
  bool (*checked)(Shell& shell) = nullptr;
  const char* secondKey = nullptr;          // that does the same
};

std::span<const Command> Commands();
// The command with a button's symbol, null if none.
const Command* CommandOfSymbol(std::string_view symbol);

// The id of a row's menu item and button.
inline constexpr int kFirstCommandId = wxID_HIGHEST + 100;
inline int CommandId(const Command& command) {
  return kFirstCommandId + static_cast<int>(&command - Commands().data());
}
bool IsCommandId(int id);  // false for identifiers of the toolkit
// The command of such an id.
const Command& CommandOfId(int id);

// Whether a command can be used at present.
bool CanRun(const Command& command, Shell& shell);
// What is missing where a command cannot be used, as a sentence.
const char* WhyNot(Needs needs);

}  // namespace fotomill::desktop
