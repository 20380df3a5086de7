#include "catalog/search/search_criteria.h"

#include <algorithm>
#include <cmath>

#include "core/folded_text.h"
#include "core/natural_order.h"
#include "core/text.h"
#include "core/whole_number.h"
#include "platform/paths.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// A file being examined.
struct Examined {
  std::string_view path;
  uint64_t size;
  const PictureFacts* facts;  // with the parts of the row
};

bool HasKeyword(const PictureTags& tags, std::string_view wanted) {
  return std::ranges::any_of(tags.keywords, [&](std::string_view keyword) {
    if (IsTextLike(keyword, wanted)) return true;
    for (size_t from = 0; from <= keyword.size();) {
      const size_t end = std::min(keyword.find_first_of("/|", from), keyword.size());
      if (IsTextLike(keyword.substr(from, end - from), wanted)) return true;
      from = end + 1;
    }
    return false;
  });
}

// Whether any of the texts contains a part.
bool AnyContains(std::initializer_list<std::string_view> texts, std::string_view part) {
  return std::ranges::any_of(texts,
                             [&](std::string_view text) { return ContainsText(text, part); });
}

bool InRange(const std::optional<NumberRange>& range, int64_t number) {
  return range->Contains(number);
}

bool HasName(const SearchCriteria& wanted, const Examined& file) {
  return MatchesFilter(FoldCase(platform::FileNameOf(file.path)), FoldCase(wanted.name));
}
bool HasSize(const SearchCriteria& wanted, const Examined& file) {
  return InRange(wanted.size, static_cast<int64_t>(file.size));
}
bool HasComment(const SearchCriteria& wanted, const Examined& file) {
  const PictureTags& tags = file.facts->tags;
  return AnyContains({tags.title, tags.description, tags.comment}, wanted.comment);
}
bool HasKeywords(const SearchCriteria& wanted, const Examined& file) {
  return std::ranges::all_of(wanted.keywords, [&](std::string_view keyword) {
    return HasKeyword(file.facts->tags, keyword);
  });
}
bool HasText(const SearchCriteria& wanted, const Examined& file) {
  const PictureTags& tags = file.facts->tags;
  return AnyContains({platform::FileNameOf(file.path), tags.title, tags.description, tags.comment,
                      tags.camera, tags.creator, tags.copyright, tags.sublocation, tags.city,
                      tags.state, tags.country},
                     wanted.text) ||
         std::ranges::any_of(tags.keywords, [&](std::string_view keyword) {
           return ContainsText(keyword, wanted.text);
         });
}
bool HasCamera(const SearchCriteria& wanted, const Examined& file) {
  return ContainsText(file.facts->tags.camera, wanted.camera);
}
bool HasLabel(const SearchCriteria& wanted, const Examined& file) {
  return IsTextLike(file.facts->tags.label, wanted.label);
}
bool HasRating(const SearchCriteria& wanted, const Examined& file) {
  return InRange(wanted.rating, file.facts->tags.rating);
}
bool WasTaken(const SearchCriteria& wanted, const Examined& file) {
  const int64_t taken = file.facts->tags.taken;
  return taken > 0 && InRange(wanted.taken, taken);
}
bool HasFormat(const SearchCriteria& wanted, const Examined& file) {
  return std::ranges::find(wanted.formats, file.facts->format) != wanted.formats.end();
}
bool HasWidth(const SearchCriteria& wanted, const Examined& file) {
  return file.facts->width > 0 && InRange(wanted.width, file.facts->width);
}
bool HasHeight(const SearchCriteria& wanted, const Examined& file) {
  return file.facts->height > 0 && InRange(wanted.height, file.facts->height);
}
bool HasFaces(const SearchCriteria&, const Examined& file) { return file.facts->faces > 0; }
bool HasDamage(const SearchCriteria&, const Examined& file) {
  return file.facts->decoded != Status::Ok;
}

struct Criterion {
  uint32_t parts;  // of the facts that the test needs
  bool (*wanted)(const SearchCriteria& criteria);
  bool (*test)(const SearchCriteria& criteria, const Examined& file);
};
// The cheapest first.
// clang-format off
constexpr Criterion kCriteria[] = {
    {0,            [](const SearchCriteria& c) { return !c.name.empty() && c.name != "*"; }, HasName},
    {0,            [](const SearchCriteria& c) { return c.size.has_value(); },   HasSize},
    {kFactsTags,   [](const SearchCriteria& c) { return !c.comment.empty(); },   HasComment},
    {kFactsTags,   [](const SearchCriteria& c) { return !c.keywords.empty(); },  HasKeywords},
    {kFactsTags,   [](const SearchCriteria& c) { return !c.text.empty(); },      HasText},
    {kFactsTags,   [](const SearchCriteria& c) { return !c.camera.empty(); },    HasCamera},
    {kFactsTags,   [](const SearchCriteria& c) { return !c.label.empty(); },     HasLabel},
    {kFactsTags,   [](const SearchCriteria& c) { return c.rating.has_value(); }, HasRating},
    {kFactsTags,   [](const SearchCriteria& c) { return c.taken.has_value(); },  WasTaken},
    {kFactsHeader, [](const SearchCriteria& c) { return !c.formats.empty(); },   HasFormat},
    {kFactsHeader, [](const SearchCriteria& c) { return c.width.has_value(); },  HasWidth},
    {kFactsHeader, [](const SearchCriteria& c) { return c.height.has_value(); }, HasHeight},
    {kFactsFaces,  [](const SearchCriteria& c) { return c.faces; },              HasFaces},
    {kFactsDamage, [](const SearchCriteria& c) { return c.damaged; },            HasDamage},
};
// clang-format on

// Splits a range at ".."; without it, both ends are the whole text. Both ends must not be empty.
bool SplitRange(std::string_view text, std::string_view& least, std::string_view& most) {
  const size_t dots = text.find("..");
  least = text.substr(0, dots);
  most = dots == std::string_view::npos ? text : text.substr(dots + 2);
  return !least.empty() || !most.empty();
}

// Parses both ends; an empty one is unlimited. `parse` is called with whether it is the upper end.
template <typename Parse>
std::optional<NumberRange> ParseRange(std::string_view text, const Parse& parse) {
  std::string_view least, most;
  if (!SplitRange(text, least, most)) return std::nullopt;
  NumberRange range;
  if (!least.empty()) {
    const std::optional<int64_t> number = parse(least, false);
    if (!number) return std::nullopt;
    range.least = *number;
  }
  if (!most.empty()) {
    const std::optional<int64_t> number = parse(most, true);
    if (!number) return std::nullopt;
    range.most = *number;
  }
  return range.least <= range.most ? std::optional(range) : std::nullopt;
}

std::optional<int64_t> ParseBytes(std::string_view text) {
  int64_t unit = 1;
  constexpr std::string_view kUnits = "kmg";
  const size_t place = kUnits.find(LowerCase(text.back()));
  if (place != std::string_view::npos) {
    unit = int64_t{1} << (10 * (place + 1));
    text.remove_suffix(1);
  }
  const auto number = ParseNumber<int64_t>(text);
  if (!number || *number < 0 || *number > INT64_MAX / unit) return std::nullopt;
  return *number * unit;
}

// A date as 14 digits; missing ones are `missing`.
std::optional<int64_t> ParseDate(std::string_view text, char missing) {
  constexpr std::string_view kForm = "0000-00-00 00:00:00";
  std::string digits;
  if (text.size() > kForm.size()) return std::nullopt;
  for (size_t i = 0; i < text.size(); ++i) {
    const char c = text[i];
    const bool digit = c >= '0' && c <= '9';
    if (digit != (kForm[i] == '0')) return std::nullopt;
    if (digit) digits += c;
    if (!digit && c != kForm[i] && !(i < 10 && c == ':') && !(i == 10 && c == 'T'))
      return std::nullopt;
  }
  if (digits.size() < 4 || digits.size() % 2 != 0 || text.back() < '0') return std::nullopt;
  const auto within = [&](size_t place, int64_t least, int64_t most) {
    const auto part = digits.size() > place ? ParseNumber<int64_t>(digits.substr(place, 2)) : least;
    return *part >= least && *part <= most;
  };
  if (!within(4, 1, 12) || !within(6, 1, 31)) return std::nullopt;
  digits.resize(14, missing);
  return ParseNumber<int64_t>(digits);
}

}  // namespace

std::vector<std::string> ExtensionsOfFormat(int32_t row) {
  const auto kindOf = [](const FormatEntry& entry) {  // "Jpeg" of "(JPG) Jpeg"
    const std::string_view text = entry.description.view();
    return text.substr(std::min(text.find(") "), text.size()));
  };
  const FormatEntry& wanted = FormatRow(row);
  std::vector<std::string> extensions{UpperCase(wanted.extension.view())};
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& entry = FormatRow(i);
    if (i != row && !kindOf(entry).empty() && kindOf(entry) == kindOf(wanted))
      extensions.push_back(UpperCase(entry.extension.view()));
  }
  return extensions;
}

bool IsEmpty(const SearchCriteria& criteria) {
  return std::ranges::none_of(kCriteria,
                              [&](const Criterion& row) { return row.wanted(criteria); });
}

bool Meets(const SearchCriteria& criteria, std::string_view path, uint64_t size,
           const std::function<const PictureFacts*(uint32_t parts)>& factsWith) {
  bool met = true;
  for (const Criterion& row : kCriteria) {
    if (!row.wanted(criteria)) continue;
    const PictureFacts* const facts = row.parts == 0 ? nullptr : factsWith(row.parts);
    met = (row.parts == 0 || facts != nullptr) && row.test(criteria, {path, size, facts});
    if (met == criteria.any) return met;
  }
  return met;
}

std::optional<NumberRange> ParseNumberRange(std::string_view text) {
  return ParseRange(text, [](std::string_view end, bool) { return ParseNumber<int64_t>(end); });
}

std::optional<NumberRange> ParseSizeRange(std::string_view text) {
  return ParseRange(text, [](std::string_view end, bool) { return ParseBytes(end); });
}

std::optional<NumberRange> ParseDateRange(std::string_view text) {
  return ParseRange(
      text, [](std::string_view end, bool most) { return ParseDate(end, most ? '9' : '0'); });
}

}  // namespace fotomill
