#include "desktop/models/shell/toolbar_buttons.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/history_list.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "FMWToolbar.txt";
constexpr size_t kMostButtons = 200;
constexpr char kHidden = '-';

}  // namespace

std::vector<ToolbarButton> ParseToolbar(std::string_view text,
                                        std::span<const ToolbarButton> known) {
  std::vector<ToolbarButton> buttons;
  const auto add = [&](std::string_view name, bool shown) {
    const bool there = std::ranges::any_of(
        buttons, [&](const ToolbarButton& button) { return button.name == name; });
    if (!there && std::ranges::find(known, name, &ToolbarButton::name) != known.end())
      buttons.push_back({std::string(name), shown});
  };
  for (std::string_view line : ParseHistoryList(std::string(text), kMostButtons)) {
    const bool hidden = line.starts_with(kHidden);
    add(line.substr(hidden ? 1 : 0), !hidden);
  }
  for (const ToolbarButton& button : known) add(button.name, button.shown);
  return buttons;
}

std::vector<ToolbarButton> LoadToolbar(std::span<const ToolbarButton> known) {
  std::string text;
  const std::string path = DataFile(kFile);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  return ParseToolbar(text, known);
}

bool SaveToolbar(std::span<const ToolbarButton> buttons) {
  const EditResult result =
      EditTextFile(DataFile(kFile), limits.listFileBytes, [&](std::string& text) {
        text.clear();
        for (const ToolbarButton& button : buttons) {
          if (!button.shown) text += kHidden;
          text.append(button.name).append(platform::kLineEnd);
        }
      });
  return result == EditResult::Done || result == EditResult::Unchanged;
}

}  // namespace fotomill::desktop
