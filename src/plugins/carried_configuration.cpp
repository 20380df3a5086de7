#include "plugins/carried_configuration.h"

#include <algorithm>
#include <cstring>
#include <string_view>

namespace fotomill {

namespace {

// Each row: type and control, the name with its NUL, then the number, or the text with its NUL.
constexpr uint32_t kText = 0x2;  // bit of a row's type

void Put(std::vector<uint8_t>& out, const void* bytes, size_t size) {
  const auto* first = static_cast<const uint8_t*>(bytes);
  out.insert(out.end(), first, first + size);
}

// Takes a number, zero past the end.
template <class Number>
Number TakeNumber(std::span<const uint8_t>& bytes) {
  Number number = 0;
  const size_t size = std::min(bytes.size(), sizeof number);
  std::memcpy(&number, bytes.data(), size);
  bytes = bytes.subspan(size);
  return number;
}

const char* TakeText(std::span<const uint8_t>& bytes) {
  const auto end = std::ranges::find(bytes, uint8_t{0});
  if (end == bytes.end()) {
    bytes = {};
    return "";
  }
  const char* const text = reinterpret_cast<const char*>(bytes.data());
  bytes = bytes.subspan(static_cast<size_t>(end - bytes.begin()) + 1);
  return text;
}

}  // namespace

std::vector<uint8_t> CarriedConfiguration(std::span<const FMW_CONFIG_ENTRY> rows) {
  std::vector<uint8_t> out;
  for (const FMW_CONFIG_ENTRY& row : rows) {
    const uint32_t type = row.type, control = row.control;
    Put(out, &type, sizeof type);
    Put(out, &control, sizeof control);
    Put(out, row.name, std::strlen(row.name) + 1);
    const size_t size = (type & kText) != 0
                            ? std::strlen(static_cast<const char*>(row.variable)) + 1
                            : sizeof(int32_t);
    Put(out, row.variable, size);
  }
  return out;
}

void ConfigurationCopy::Take(std::span<const uint8_t> carried) {
  if (std::ranges::equal(carried, carried_)) return;
  carried_.assign(carried.begin(), carried.end());
  numbers_.clear();
  rows_.clear();
  for (std::span<const uint8_t> rest = carried_; !rest.empty();) {
    FMW_CONFIG_ENTRY row = {};
    row.type = TakeNumber<uint32_t>(rest);
    row.control = TakeNumber<uint32_t>(rest);
    row.name = TakeText(rest);
    if ((row.type & kText) != 0) {
      row.variable = TakeText(rest);
    } else {
      numbers_.push_back(TakeNumber<int32_t>(rest));
    }
    rows_.push_back(row);
  }
  size_t next = 0;
  for (FMW_CONFIG_ENTRY& row : rows_) {
    if ((row.type & kText) == 0) row.variable = &numbers_[next++];
  }
}

}  // namespace fotomill
