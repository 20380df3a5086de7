#include "desktop/models/batch/named_sizes.h"

#include <optional>
#include <string_view>

#include "core/whole_number.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kMostPixels = 100000;  // per edge

std::optional<NamedSize> ReadSize(std::string_view text) {
  const size_t comma = text.find(',');
  if (comma == std::string_view::npos) return std::nullopt;
  const auto width = ParseNumber(text.substr(0, comma)),
             height = ParseNumber(text.substr(comma + 1));
  const auto isEdge = [](const std::optional<int32_t>& edge) {
    return edge && *edge >= 1 && *edge <= kMostPixels;
  };
  if (!isEdge(width) || !isEdge(height)) return std::nullopt;
  const std::string across = std::to_string(*width), down = std::to_string(*height);
  return NamedSize{across + " \u00D7 " + down, "resize " + across + "x" + down};
}

}  // namespace

std::vector<NamedSize> SizeSettings() {
  std::vector<NamedSize> sizes;
  for (const std::string_view text :
       {settings.Transform320.view(), settings.Transform640.view(), settings.Transform800.view(),
        settings.Transform1024.view(), settings.Transform1280.view()}) {
    sizes.push_back(ReadSize(text).value_or(NamedSize{}));
  }
  return sizes;
}

std::vector<NamedSize> NamedSizes() {
  std::vector<NamedSize> sizes = SizeSettings();
  std::erase_if(sizes, [](const NamedSize& size) { return size.step.empty(); });
  return sizes;
}

}  // namespace fotomill::desktop
