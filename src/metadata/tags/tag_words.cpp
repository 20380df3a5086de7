// Sources: XMP specification part 2, section 3.2; the digiKam project, "digiKam Handbook", and the
// values its files hold; Microsoft, "Photo Metadata Policies", System.Rating.
#include "metadata/tags/tag_words.h"

#include <algorithm>
#include <charconv>
#include <cmath>

#include "core/text.h"

namespace fotomill {

namespace {

constexpr std::string_view kDigiKamLabels[] = {"",     "Red",    "Orange", "Yellow", "Green",
                                               "Blue", "Purple", "Gray",   "Black",  "White"};

std::vector<std::string> Leaves(const std::vector<std::string>& tags, char separator) {
  std::vector<std::string> leaves;
  for (const std::string& tag : tags) leaves.emplace_back(LeafOf(tag, separator));
  return leaves;
}

std::optional<double> NumberOf(std::string_view text) {
  text.remove_prefix(std::min(text.find_first_not_of(" \t\r\n+"), text.size()));
  double number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  return error == std::errc{} && std::isfinite(number) ? std::optional(number) : std::nullopt;
}

}  // namespace

std::optional<int32_t> RatingOf(const XmpTags& tags) {
  const auto rating = NumberOf(tags.rating);
  if (rating) return static_cast<int32_t>(std::lround(std::clamp(*rating, -1.0, 5.0)));
  const auto percent = NumberOf(tags.microsoftRating);
  if (!percent) return {};
  int32_t stars = 5;
  while (stars > 0 && *percent < MicrosoftRating(stars)) --stars;
  return stars;
}

std::string LabelOf(const XmpTags& tags) {
  if (!tags.label.empty() || tags.digiKamLabel.empty()) return tags.label;
  const int64_t number = LeadingInteger(tags.digiKamLabel);
  const bool known = number > 0 && number < static_cast<int64_t>(std::size(kDigiKamLabels));
  return known ? std::string(kDigiKamLabels[number]) : std::string();
}

std::vector<std::string> KeywordsOf(const XmpTags& tags) {
  if (!tags.keywords.empty()) return tags.keywords;
  if (!tags.digiKamTags.empty()) return Leaves(tags.digiKamTags, '/');
  if (!tags.lightroomTags.empty()) return Leaves(tags.lightroomTags, '|');
  return Leaves(tags.microsoftTags, '/');
}

std::string_view LeafOf(std::string_view keyword, char separator) {
  return keyword.substr(keyword.rfind(separator) + 1);
}

int32_t DigiKamLabel(std::string_view label) {
  for (size_t i = 0; i < std::size(kDigiKamLabels); ++i) {
    if (EqualIgnoringCase(kDigiKamLabels[i], label)) return static_cast<int32_t>(i);
  }
  return -1;
}

int32_t MicrosoftRating(int32_t rating) {
  constexpr int32_t kPercents[] = {0, 1, 25, 50, 75, 99};
  return kPercents[std::clamp(rating, 0, 5)];
}

}  // namespace fotomill
