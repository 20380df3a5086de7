#include "core/text.h"

#include <algorithm>

#include "core/checked.h"

namespace fotomill {

std::string LowerCase(std::string_view text) {
  std::string result(text);
  for (char& c : result) c = LowerCase(c);
  return result;
}

std::string UpperCase(std::string_view text) {
  std::string result(text);
  for (char& c : result) c = UpperCase(c);
  return result;
}

int64_t LeadingInteger(std::string_view text) {
  size_t i = std::min(text.find_first_not_of(" \t\n\v\f\r"), text.size());
  const bool negative = i < text.size() && text[i] == '-';
  if (i < text.size() && (text[i] == '-' || text[i] == '+')) ++i;
  int64_t value = 0;
  for (; i < text.size() && text[i] >= '0' && text[i] <= '9'; ++i) {
    const int64_t digit = text[i] - '0';
    if (!CheckedMultiply<int64_t>(value, 10, value) ||
        !CheckedAdd(value, negative ? -digit : digit, value)) {
      return negative ? INT64_MIN : INT64_MAX;
    }
  }
  return value;
}

std::string_view ListItem(std::string_view list, int64_t index) {
  for (; index > 0; --index) {
    const size_t end = list.find(';');
    if (end == std::string_view::npos) return "Unknown";
    list.remove_prefix(end + 1);
  }
  return index < 0 ? "Unknown" : list.substr(0, list.find(';'));
}

std::string WithThousands(uint64_t number) {
  std::string digits = std::to_string(number);
  for (size_t place = digits.size(); place > 3; place -= 3) digits.insert(place - 3, 1, ',');
  return digits;
}

}  // namespace fotomill
