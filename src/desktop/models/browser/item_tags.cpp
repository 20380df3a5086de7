#include "desktop/models/browser/item_tags.h"

#include <algorithm>

#include "core/text.h"
#include "metadata/tags/tag_lines.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr uint32_t kLabelColors[] = {0x3c32d7, 0x2ec4f2, 0x46a532, 0xd27832, 0xaf419b};
static_assert(std::size(kLabelColors) == std::size(kLabelNames));

int32_t Number(TagFilter filter) { return static_cast<int32_t>(filter); }

}  // namespace

bool Passes(const FolderItem& item, TagFilter filter) {
  if (filter == TagFilter::All) return true;
  if (!item.tagged && !item.outdated) return false;
  if (filter == TagFilter::Unrated) return item.rating == 0;
  if (filter == TagFilter::Rejected) return item.rating < 0;
  if (filter <= TagFilter::FiveStars) return item.rating >= Number(filter);
  const auto label = static_cast<size_t>(Number(filter) - Number(TagFilter::FirstLabel));
  return EqualIgnoringCase(item.label, kLabelNames[label]);
}

std::string TagFilterName(TagFilter filter) {
  if (filter == TagFilter::All) return Tr("All files");
  if (filter == TagFilter::Unrated) return Tr("Not rated");
  if (filter == TagFilter::Rejected) return Tr("Rejected");
  if (filter == TagFilter::FiveStars) return Tr("5 stars");
  if (filter < TagFilter::FiveStars)
    return TrCount("%1 star or more", "%1 stars or more", static_cast<uint64_t>(Number(filter)));
  const auto label = static_cast<size_t>(Number(filter) - Number(TagFilter::FirstLabel));
  return Tr("Label: %1", LabelText(std::string(kLabelNames[label])));
}

std::string TagText(int32_t rating, const std::string& label) {
  std::string text;
  if (rating > 0) text = TrCount("%1 star", "%1 stars", static_cast<uint64_t>(rating));
  if (rating < 0) text = Tr("rejected");
  if (!label.empty()) text.append(text.empty() ? "" : ", ").append(LabelText(label));
  return text;
}

std::string StarsText(int32_t rating) {
  if (rating < 0) return "\xE2\x9C\x95";
  std::string text;
  for (int32_t i = 0; i < std::min(rating, 5); ++i) text += "\xE2\x98\x85";
  return text;
}

std::string LabelText(const std::string& label) {
  PictureTags tags;
  tags.label = label;
  return label.empty() ? std::string() : TagLines(tags).front().text;
}

uint32_t LabelColor(const std::string& label) {
  for (size_t i = 0; i < std::size(kLabelNames); ++i) {
    if (EqualIgnoringCase(kLabelNames[i], label)) return kLabelColors[i];
  }
  return 0x808080;
}

std::optional<TagChanges> ChangesOfKey(int key, const std::string& label) {
  constexpr int kFirstLabelKey = '6';
  TagChanges changes;
  if (key >= '0' && key <= '5') {
    changes.rating = key - '0';
  } else if (key >= kFirstLabelKey && key <= '9') {
    const std::string_view name = kLabelNames[key - kFirstLabelKey];
    changes.label = EqualIgnoringCase(name, label) ? "" : name;
  } else {
    return {};
  }
  return changes;
}

}  // namespace fotomill::desktop
