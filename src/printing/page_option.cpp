#include "printing/page_option.h"

#include <algorithm>

#include "core/whole_number.h"

namespace fotomill {

void PageValues::Set(std::string_view name, std::string_view value) {
  if (!value.empty()) {
    values_.insert_or_assign(std::string(name), std::string(value));
  } else if (const auto place = values_.find(name); place != values_.end()) {
    values_.erase(place);
  }
}

const std::string& PageValues::Text(std::string_view name) const {
  static const std::string none;
  const auto place = values_.find(name);
  return place == values_.end() ? none : place->second;
}

int32_t PageValues::Number(std::string_view name, int32_t usual) const {
  return ParseNumber<int32_t>(Text(name)).value_or(usual);
}

std::vector<std::string> PageValues::Texts(std::string_view name) const {
  const std::string_view all = Text(name);
  std::vector<std::string> texts;
  for (size_t start = 0; start < all.size();) {
    const size_t end = std::min(all.find(',', start), all.size());
    std::string_view text = all.substr(start, end - start);
    while (text.starts_with(' ')) text.remove_prefix(1);
    while (text.ends_with(' ')) text.remove_suffix(1);
    texts.emplace_back(text);
    start = end + 1;
  }
  return texts;
}

}  // namespace fotomill
