#include "core/natural_order.h"

#include <algorithm>

#include "core/text.h"

namespace fotomill {

namespace {

// The run of digits at `from`, without leading zeros; advances `from` past it.
std::string_view TakeNumber(std::string_view text, size_t& from) {
  size_t end = from;
  while (end < text.size() && IsDigit(text[end])) ++end;
  size_t begin = from;
  while (begin + 1 < end && text[begin] == '0') ++begin;
  from = end;
  return text.substr(begin, end - begin);
}

int CompareNumbers(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return a.size() < b.size() ? -1 : 1;
  return a.compare(b);
}

// Wildcard match, backtracking to the last star only.
bool MatchesPattern(std::string_view text, std::string_view pattern) {
  size_t t = 0, p = 0, star = std::string_view::npos, resume = 0;
  while (t < text.size()) {
    if (p < pattern.size() && pattern[p] == '*') {
      star = p++;
      resume = t;
    } else if (p < pattern.size() &&
               (pattern[p] == '?' || LowerCase(pattern[p]) == LowerCase(text[t]))) {
      ++t;
      ++p;
    } else if (star != std::string_view::npos) {
      p = star + 1;
      t = ++resume;
    } else {
      return false;
    }
  }
  while (p < pattern.size() && pattern[p] == '*') ++p;
  return p == pattern.size();
}

}  // namespace

int CompareNatural(std::string_view a, std::string_view b) {
  size_t i = 0, j = 0;
  while (i < a.size() && j < b.size()) {
    int order;
    if (IsDigit(a[i]) && IsDigit(b[j])) {
      order = CompareNumbers(TakeNumber(a, i), TakeNumber(b, j));
    } else {
      order = static_cast<uint8_t>(LowerCase(a[i++])) - static_cast<uint8_t>(LowerCase(b[j++]));
    }
    if (order != 0) return order;
  }
  if (i < a.size() || j < b.size()) return i < a.size() ? 1 : -1;
  return a.compare(b);
}

bool MatchesFilter(std::string_view text, std::string_view pattern) {
  if (pattern.find_first_of("*?") != std::string_view::npos) return MatchesPattern(text, pattern);
  const auto same = [](char a, char b) { return LowerCase(a) == LowerCase(b); };
  return std::search(text.begin(), text.end(), pattern.begin(), pattern.end(), same) !=
             text.end() ||
         pattern.empty();
}

}  // namespace fotomill
