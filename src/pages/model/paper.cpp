#include "pages/model/paper.h"

#include <charconv>
#include <cmath>
#include <utility>

#include "core/text.h"
#include "pages/model/page.h"

namespace fotomill {

namespace {

constexpr double kInch = kMmPerInch;

// clang-format off
constexpr NamedSize kPapers[] = {
    {"A3",      {297, 420}},
    {"A4",      {210, 297}},
    {"A5",      {148, 210}},
    {"A6",      {105, 148}},
    {"A2",      {420, 594}},
    {"A1",      {594, 841}},
    {"A0",      {841, 1189}},
    {"B4",      {250, 353}},
    {"B5",      {176, 250}},
    {"JIS-B4",  {257, 364}},
    {"JIS-B5",  {182, 257}},
    {"Letter",  {8.5 * kInch, 11 * kInch}},
    {"Legal",   {8.5 * kInch, 14 * kInch}},
    {"Tabloid", {11 * kInch, 17 * kInch}},
    {"Executive", {7.25 * kInch, 10.5 * kInch}},
    {"A3+",     {329, 483}},
    {"10x15cm", {100, 150}},
    {"13x18cm", {130, 180}},
    {"4x6in",   {4 * kInch, 6 * kInch}},
    {"5x7in",   {5 * kInch, 7 * kInch}},
    {"8x10in",  {8 * kInch, 10 * kInch}},
};

constexpr NamedSize kPrintSizes[] = {
    {"10x15cm",     {100, 150}},
    {"9x13cm",      {90, 130}},
    {"13x18cm",     {130, 180}},
    {"20x25cm",     {200, 250}},
    {"4x6in",       {4 * kInch, 6 * kInch}},
    {"5x7in",       {5 * kInch, 7 * kInch}},
    {"8x10in",      {8 * kInch, 10 * kInch}},
    {"wallet",      {2.5 * kInch, 3.5 * kInch}},
    {"passport",    {35, 45}, true},
    {"passport-us", {2 * kInch, 2 * kInch}, true},
    {"id",          {25, 35}, true},
    {"id-card",     {53.98, 85.6}, true},
};

// A unit in millimeters.
struct Unit {
  const char* name;
  double mm;
};
constexpr Unit kUnits[] = {{"mm", 1}, {"cm", 10}, {"in", kInch}, {"pt", kMmPerPoint}};
// clang-format on

// Cuts a unit off the end of a text; `usual` if there is none.
double TakeUnit(std::string_view& text, double usual) {
  for (const Unit& unit : kUnits) {
    const std::string_view name = unit.name;
    if (text.size() < name.size()) continue;
    if (!EqualIgnoringCase(text.substr(text.size() - name.size()), name)) continue;
    text.remove_suffix(name.size());
    return unit.mm;
  }
  return usual;
}

std::optional<double> ParseNumber(std::string_view text) {
  double value = 0;
  const auto [end, error] =
      std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed);
  if (error != std::errc() || end != text.data() + text.size() || !std::isfinite(value) ||
      value < 0 || std::signbit(value))
    return std::nullopt;
  return value;
}

}  // namespace

std::span<const NamedSize> Papers() { return kPapers; }
std::span<const NamedSize> PrintSizes() { return kPrintSizes; }

std::optional<double> ParseLength(std::string_view text, double unit) {
  const double mm = TakeUnit(text, unit);
  const auto number = ParseNumber(text);
  return number ? std::optional(*number * mm) : std::nullopt;
}

std::optional<PaperSize> ParseSize(std::string_view text, std::span<const NamedSize> names) {
  for (const NamedSize& named : names) {
    if (EqualIgnoringCase(text, named.name)) return named.size;
  }
  const double mm = TakeUnit(text, 1);
  const size_t by = text.find_first_of("xX");
  if (by == std::string_view::npos) return std::nullopt;
  const auto width = ParseLength(text.substr(0, by), mm), height = ParseNumber(text.substr(by + 1));
  if (!width || !height) return std::nullopt;
  const PaperSize size{*width, *height * mm};
  const auto fits = [](double side) { return side >= kLeastSide && side <= kMostSide; };
  return fits(size.width) && fits(size.height) ? std::optional(size) : std::nullopt;
}

}  // namespace fotomill
