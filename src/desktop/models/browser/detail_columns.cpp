#include "desktop/models/browser/detail_columns.h"

#include <algorithm>
#include <cstdio>

#include "core/choice_lists.h"
#include "core/whole_number.h"
#include "desktop/models/browser/browser_model.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kNarrowest = 20, kWidest = 4000;

std::string NameText(const FolderItem& item) { return item.name; }
std::string TypeText(const FolderItem& item) {
  return item.folder ? std::string(Tr("Folder")) : DescribeFileType(item.name);
}
std::string SizeColumnText(const FolderItem& item) {
  return item.folder ? std::string() : SizeText(item.size, settings.DetailSizeMode);
}
std::string ModifiedText(const FolderItem& item) {
  return item.modified == 0 ? std::string() : DateText(item.modified);
}
std::string DimensionsText(const FolderItem& item) {
  return item.width == 0 ? std::string()
                         : std::to_string(item.width) + " x " + std::to_string(item.height);
}
std::string DepthText(const FolderItem& item) {
  return item.bits == 0 ? std::string()
                        : TrCount("%1 bit", "%1 bits", static_cast<uint64_t>(item.bits));
}

std::string TakenText(const FolderItem& item) { return DateNumberText(item.taken); }

std::string RatingText(const FolderItem& item) { return StarsText(item.rating); }
std::string ColorLabelText(const FolderItem& item) { return LabelText(item.label); }

// clang-format off
constexpr DetailFacts kDetails[] = {
    {TrLater("Name"),       260, false, true,  choice::kSortName,       NameText},
    {TrLater("Type"),       190, false, true,  choice::kSortType,       TypeText},
    {TrLater("Size"),       110, true,  true,  choice::kSortSize,       SizeColumnText},
    {TrLater("Date"),       140, false, true,  choice::kSortDate,       ModifiedText},
    {TrLater("Dimensions"), 110, true,  true,  choice::kSortDimensions, DimensionsText},
    {TrLater("Depth"),       70, true,  true,  -1,                      DepthText},
    {TrLater("EXIF date"),  140, false, false, choice::kSortExifDate,   TakenText},
    {TrLater("Rating"),      90, false, false, -1,                      RatingText},
    {TrLater("Label"),       90, false, false, -1,                      ColorLabelText},
};
// clang-format on

bool Holds(const DetailColumns& columns, size_t detail) {
  return std::ranges::find(columns, detail, &DetailColumn::detail) != columns.end();
}

}  // namespace

std::string DateNumberText(int64_t date) {
  if (date <= 0) return {};
  const auto part = [&](int64_t unit, int64_t size) {
    return static_cast<long long>(date / unit % size);
  };
  char text[64];
  std::snprintf(text, sizeof text, "%04lld-%02lld-%02lld %02lld:%02lld",
                part(10'000'000'000, 10'000), part(100'000'000, 100), part(1'000'000, 100),
                part(10'000, 100), part(100, 100));
  return text;
}

std::span<const DetailFacts> AllDetails() { return kDetails; }

DetailColumns ParseDetailColumns(std::string_view text) {
  DetailColumns columns;
  while (!text.empty()) {
    std::string_view part = text.substr(0, text.find(','));
    text.remove_prefix(std::min(part.size() + 1, text.size()));
    const bool shown = !part.starts_with('-');
    if (!shown) part.remove_prefix(1);
    const size_t colon = part.find(':');
    if (colon == std::string_view::npos) continue;
    const auto detail = std::ranges::find(kDetails, part.substr(0, colon), &DetailFacts::title);
    const auto width = ParseNumber(part.substr(colon + 1));
    const size_t index = static_cast<size_t>(detail - std::begin(kDetails));
    if (index == std::size(kDetails) || !width || Holds(columns, index)) continue;
    columns.push_back({index, std::clamp(*width, kNarrowest, kWidest), shown || index == 0});
  }
  for (size_t i = 0; i < std::size(kDetails); ++i) {
    if (!Holds(columns, i)) columns.push_back({i, kDetails[i].width, kDetails[i].shown});
  }
  return columns;
}

std::string DetailColumnsText(const DetailColumns& columns) {
  std::string text;
  for (const DetailColumn& column : columns) {
    text += std::string(text.empty() ? "" : ",") + (column.shown ? "" : "-") +
            kDetails[column.detail].title + ":" + std::to_string(column.width);
  }
  return text;
}

}  // namespace fotomill::desktop
