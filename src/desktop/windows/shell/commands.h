#pragma once

#include <wx/defs.h>

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/shell/key_map.h"

namespace fotomill::desktop {

class Shell;

// What a command needs; otherwise its menu item and button are disabled.
enum class Needs {
  Nothing,
  Files,  // at least one file selected or focused
  Few,    // two to four files
  Item,   // at least one file or folder
  Undo,   // an operation to undo; shown in the menu item
  Redo,
  ClosedTab,
};

// Where a command occurs in the menu of empty space.
enum class FolderPlace { None, Top, View, Sort };

// A command of the frame: menu item, toolbar button, keys, and
// function. To add a window, add a row in commands.cpp. Menus and
// toolbar use the order of the rows; a row without text is a separator.
struct Command {
  const char* menu;              // "&File"; all texts are in English
  const char* text;              // with mnemonic; null for a separator
  const char* accelerator = "";  // in wxWidgets syntax; empty: none
  const char* help = "";         // a sentence for the status bar
  Needs needs = Needs::Nothing;
  void (*run)(Shell& shell) = nullptr;
  // toolbar symbol (bitmaps.cpp) of a button shown by default; null: a button only if it is chosen
  const char* symbol = nullptr;
  bool inContextMenu = false;               // for files in a browser
  // whether the menu item is checked; null: not checkable
  bool (*checked)(Shell& shell) = nullptr;
  const char* secondKey = nullptr;          // alternative key
  bool oneOf = false;                       // of the adjacent rows like this, one is checked
  FolderPlace place = FolderPlace::None;
};

std::span<const Command> Commands();
// The commands whose keys can be changed, and the key that one has now; empty: none.
std::vector<KeyedCommand> KeyedCommands();
std::string KeyOf(const Command& command);
// The stored name of a command's toolbar button: its symbol, else menu and text in English.
std::string ButtonNameOf(const Command& command);
// Finds a command by that name; null if there is none.
const Command* CommandOfButton(std::string_view name);

// The ID of a row's menu item and button.
inline constexpr int kFirstCommandId = wxID_HIGHEST + 100;
inline int CommandId(const Command& command) {
  return kFirstCommandId + static_cast<int>(&command - Commands().data());
}
bool IsCommandId(int id);  // false for IDs of the toolkit
// The command with such an ID.
const Command& CommandOfId(int id);

// Whether a command is currently available.
bool CanRun(const Command& command, Shell& shell);
// Why a command is not available, as a sentence.
const char* WhyNot(const Command& command, Shell& shell);
// The command that opens the jump window, for its additional key.
const Command& JumpCommand();

}  // namespace fotomill::desktop
