#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// A button of the toolbar, by a name that stays the same from version to version.
struct ToolbarButton {
  std::string name;
  bool shown = true;

  bool operator==(const ToolbarButton&) const = default;
};

// The buttons in the order of a text with a name a line, "-" in front of those that are hidden.
// Names that `known` does not have are passed over; known ones that the text does not have follow
// at the end, shown.
std::vector<ToolbarButton> ParseToolbar(std::string_view text, std::span<const std::string> known);

// As the user has chosen them, kept in the data folder in the file "FMWToolbar.txt".
std::vector<ToolbarButton> LoadToolbar(std::span<const std::string> known);
// False when the file cannot be written.
[[nodiscard]] bool SaveToolbar(std::span<const ToolbarButton> buttons);

}  // namespace fotomill::desktop
