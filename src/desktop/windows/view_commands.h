#pragma once

#include <span>

namespace fotomill::desktop {

class ViewFrame;

// What a view window can do, in the order of its menu; a row without text is a line there.
struct ViewCommand {
  static constexpr int kMostKeys = 3;

  const char* text;
  const char* shownKey;  // beside the text
  int keys[kMostKeys];   // WXK_* or characters; 0 ends them
  void (*run)(ViewFrame& view);
  bool (*checked)() = nullptr;  // whether its menu item has a mark; null for one that never has
};

std::span<const ViewCommand> ViewCommands();
// The command of a key, null if none.
const ViewCommand* ViewCommandOfKey(int key);

}  // namespace fotomill::desktop
