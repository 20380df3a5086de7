#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "desktop/models/browser/folder_listing.h"
#include "metadata/tags/tag_edit.h"

namespace fotomill::desktop {

// Which files a browser shows by rating and label.
enum class TagFilter : uint8_t {
  All,
  OneStar,  // or more
  TwoStars,
  ThreeStars,
  FourStars,
  FiveStars,
  Unrated,
  Rejected,
  FirstLabel,  // in the order of kLabelNames
  LastLabel = FirstLabel + 4,
};
// Outdated tags count until the new ones are read, so that files stay in place.
bool Passes(const FolderItem& item, TagFilter filter);
// For a list of choices, translated.
std::string TagFilterName(TagFilter filter);

// "3 stars, Red"; empty without rating and label.
std::string TagText(int32_t rating, const std::string& label);
// Five stars at most, or a cross for rejected pictures; and the label, translated.
std::string StarsText(int32_t rating);
std::string LabelText(const std::string& label);
// The color of a label, 0xBBGGRR; gray for other programs' words.
uint32_t LabelColor(const std::string& label);

// The changes of a digit key: 0 to 5 are stars, 6 to 9 labels. With `label`, the current label, the
// key of the same one removes it. None for other keys.
std::optional<TagChanges> ChangesOfKey(int key, const std::string& label);

}  // namespace fotomill::desktop
