#include "core/nearest_name.h"

#include <algorithm>
#include <cstdint>
#include <vector>

#include "core/text.h"

namespace fotomill {

namespace {

// longer texts are not typos, and the table below stays small
constexpr size_t kLongestName = 64;

// Edit distance: characters to change, insert, delete or swap with a neighbor to turn `a` into `b`.
size_t EditDistance(std::string_view a, std::string_view b) {
  std::vector<size_t> beforeLast(b.size() + 1), last(b.size() + 1), row(b.size() + 1);
  for (size_t j = 0; j <= b.size(); ++j) last[j] = j;
  for (size_t i = 1; i <= a.size(); ++i) {
    row[0] = i;
    for (size_t j = 1; j <= b.size(); ++j) {
      const size_t change = LowerCase(a[i - 1]) == LowerCase(b[j - 1]) ? 0 : 1;
      row[j] = std::min({last[j] + 1, row[j - 1] + 1, last[j - 1] + change});
      const bool swapped = i > 1 && j > 1 && LowerCase(a[i - 1]) == LowerCase(b[j - 2]) &&
                           LowerCase(a[i - 2]) == LowerCase(b[j - 1]);
      if (swapped) row[j] = std::min(row[j], beforeLast[j - 2] + 1);
    }
    std::swap(beforeLast, last);
    std::swap(last, row);
  }
  return last[b.size()];
}

// The closest name with a distance below `fewest` and at least one character in place.
std::string_view NearestBelow(size_t fewest, std::string_view typed,
                              std::span<const std::string_view> names) {
  std::string_view nearest;
  for (const std::string_view name : names) {
    if (name.size() > kLongestName) continue;
    const bool beginning =
        typed.size() >= 2 && EqualIgnoringCase(name.substr(0, typed.size()), typed);
    const size_t distance = beginning ? 1 : EditDistance(typed, name);
    if (distance < fewest && distance < std::max(typed.size(), name.size())) {
      fewest = distance;
      nearest = name;
    }
  }
  return nearest;
}

}  // namespace

std::string_view NearestName(std::string_view typed, std::span<const std::string_view> names) {
  constexpr size_t kShortestBeginning = 3;
  if (typed.size() < 2 || typed.size() > kLongestName) return {};
  for (const std::string_view name : names) {
    if (name.size() <= kLongestName && EditDistance(typed, name) <= 1) return name;
  }
  std::string_view only;
  for (const std::string_view name : names) {
    if (typed.size() < kShortestBeginning ||
        !EqualIgnoringCase(name.substr(0, typed.size()), typed))
      continue;
    if (!only.empty()) return {};
    only = name;
  }
  return only;
}

std::string_view NearestOfAll(std::string_view typed, std::span<const std::string_view> names) {
  const std::string_view nearest = NearestBelow(SIZE_MAX, typed.substr(0, kLongestName), names);
  return nearest.empty() && !names.empty() ? names.front() : nearest;
}

}  // namespace fotomill
