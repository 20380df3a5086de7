#include "desktop/windows/shell/command_symbols.h"

#include <string>

#include "desktop/windows/shell/commands.h"

namespace fotomill::desktop {

namespace {

struct Row {
  std::string_view button;  // ButtonNameOf
  std::string_view symbol;  // in bitmaps.cpp
};

// Of commands without a button by default.
constexpr Row kRows[] = {
    {"File/Open", "folder"},
    {"File/New tab", "new-tab"},
    {"File/Close tab", "close"},
    {"File/New folder", "new-folder"},
    {"Edit/Undo", "undo"},
    {"Edit/Redo", "redo"},
    {"Edit/Cut", "cut"},
    {"Edit/Copy", "copy"},
    {"Edit/Paste", "paste"},
    {"Edit/Rename", "rename"},
    {"Edit/Find pictures", "search"},
    {"View/List", "list"},
    {"View/Details", "list"},
    {"View/Small thumbnails", "grid"},
    {"View/Normal thumbnails", "grid"},
    {"View/Large thumbnails", "grid"},
    {"View/Larger", "zoom-in"},
    {"View/Smaller", "zoom-out"},
    {"View/Refresh", "rotate-right"},
    {"View/Folders", "folder"},
    {"View/Side pane", "info"},
    {"Go/Back", "back"},
    {"Go/Forward", "forward"},
    {"Go/Parent folder", "up"},
    {"Go/Favorite", "favorite"},
    {"Functions/View in another window", "view"},
    {"Functions/Compare", "compare"},
    {"Functions/Resize", "transform"},
    {"Functions/Edit", "effects"},
    {"Functions/Rotate left", "rotate-left"},
    {"Functions/Rotate right", "rotate-right"},
    {"Functions/Edit EXIF", "exif"},
    {"Functions/Create archive", "archive"},
    {"Functions/Delete permanently", "trash"},
    {"Tags/1 star", "favorite"},
    {"Tags/2 stars", "favorite"},
    {"Tags/3 stars", "favorite"},
    {"Tags/4 stars", "favorite"},
    {"Tags/5 stars", "favorite"},
    {"Tags/Rejected", "close"},
    {"Tools/Archive manager", "archive"},
    {"Help/Find command", "search"},
};

}  // namespace

std::string_view SymbolOf(const Command& command) {
  if (command.symbol != nullptr) return command.symbol;
  const std::string name = ButtonNameOf(command);
  for (const Row& row : kRows) {
    if (row.button == name) return row.symbol;
  }
  return "command";
}

}  // namespace fotomill::desktop
