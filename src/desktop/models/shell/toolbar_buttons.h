#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// A toolbar button, identified by a name that is stable across versions.
struct ToolbarButton {
  std::string name;
  bool shown = true;

  bool operator==(const ToolbarButton&) const = default;
};

// Parses the order of buttons: one name per line, "-" before hidden ones. Names not in `known` are
// ignored; missing ones are appended as they are there.
std::vector<ToolbarButton> ParseToolbar(std::string_view text,
                                        std::span<const ToolbarButton> known);

// The user's choice, stored in the file "FMWToolbar.txt" in the data folder.
std::vector<ToolbarButton> LoadToolbar(std::span<const ToolbarButton> known);
// False if the file cannot be written.
[[nodiscard]] bool SaveToolbar(std::span<const ToolbarButton> buttons);

}  // namespace fotomill::desktop
