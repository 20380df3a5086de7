#include "printing/value_parsing.h"

#include <charconv>

#include "operations/macros.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kMostCells = 100;

bool ParseGrid(std::string_view text, int32_t& columns, int32_t& rows) {
  const char* const end = text.data() + text.size();
  const auto first = std::from_chars(text.data(), end, columns);
  if (first.ec != std::errc() || first.ptr == end || (*first.ptr | 0x20) != 'x') return false;
  const auto second = std::from_chars(first.ptr + 1, end, rows);
  const auto fits = [](int32_t count) { return count >= 1 && count <= kMostCells; };
  return second.ec == std::errc() && second.ptr == end && fits(columns) && fits(rows);
}

}  // namespace

std::string ReadLength(const std::string& text, double& length, double unit) {
  if (text.empty()) return {};
  const auto given = ParseLength(text, unit);
  if (!given) return Tr("\"%1\" is not a length such as 10mm, 1cm or 0.5in.", text);
  length = *given;
  return {};
}

std::string ReadGrid(const std::string& text, int32_t& columns, int32_t& rows) {
  int32_t across = 0, down = 0;
  if (text.empty()) return {};
  if (!ParseGrid(text, across, down))
    return Tr("\"%1\" is not a number of columns and rows such as 4x5.", text);
  columns = across;
  rows = down;
  return {};
}

std::string ReadColor(const std::string& text, Color& color) {
  if (text.empty()) return {};
  const std::string_view digits = std::string_view(text).substr(text.starts_with('#') ? 1 : 0);
  uint32_t value = 0;
  const char* const last = digits.data() + digits.size();
  const auto [end, error] = std::from_chars(digits.data(), last, value, 16);
  if (digits.size() != 6 || error != std::errc() || end != last)
    return Tr("\"%1\" is not a color as RRGGBB, such as FFFFFF.", text);
  color = (value & 0xFF) << 16 | (value & 0xFF00) | value >> 16;
  return {};
}

std::string CheckMacros(const std::string& text) {
  const RecordedText problem = MacroProblem(text);
  return problem.empty() ? std::string() : "\"" + text + "\" " + problem.shown;
}

std::vector<std::string> NamesOf(std::span<const NamedSize> sizes) {
  std::vector<std::string> names;
  for (const NamedSize& size : sizes) names.emplace_back(size.name);
  return names;
}

}  // namespace fotomill
