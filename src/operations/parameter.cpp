#include "operations/parameter.h"

#include <algorithm>
#include <cassert>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <optional>

#include "core/text.h"
#include "texts/name_hint.h"

namespace fotomill {

namespace {

constexpr double kUsualDpi = 96;

struct UnitName {
  std::string_view name;
  LengthUnit unit;
};
constexpr UnitName kUnits[] = {{"px", LengthUnit::Pixels},
                               {"%", LengthUnit::Percent},
                               {"cm", LengthUnit::Centimeters},
                               {"mm", LengthUnit::Millimeters},
                               {"in", LengthUnit::Inches},
                               {"pt", LengthUnit::Points}};

// Removes a decimal number from the start of `text`; no exponent, no infinity.
std::optional<double> TakeDecimal(std::string_view& text) {
  std::string_view rest = text;
  if (rest.starts_with('+')) rest.remove_prefix(1);
  if (rest.empty() || (rest[0] != '-' && rest[0] != '.' && (rest[0] < '0' || rest[0] > '9')))
    return std::nullopt;
  double number = 0;
  const auto [end, error] =
      std::from_chars(rest.data(), rest.data() + rest.size(), number, std::chars_format::fixed);
  if (error != std::errc() || !std::isfinite(number)) return std::nullopt;
  text = rest.substr(static_cast<size_t>(end - rest.data()));
  return number;
}

std::optional<double> WholeDecimal(std::string_view text) {
  const auto number = TakeDecimal(text);
  return text.empty() ? number : std::nullopt;
}

bool TakeLength(std::string_view& text, Length& length, LengthUnit plain = LengthUnit::Pixels) {
  const auto number = TakeDecimal(text);
  if (!number) return false;
  length = {*number, plain};
  for (const UnitName& unit : kUnits) {
    if (!text.starts_with(unit.name)) continue;
    length.unit = unit.unit;
    text.remove_prefix(unit.name.size());
    break;
  }
  return true;
}

bool Take(std::string_view& text, char wanted) {
  if (text.empty() || LowerCase(text[0]) != wanted) return false;
  text.remove_prefix(1);
  return true;
}

// Formats a number without trailing zeros.
std::string Decimal(double number) {
  char text[40];
  std::snprintf(text, sizeof text, "%.10g", number);
  return text;
}

RecordedText OutOfLimits(const Parameter& row) {
  if (row.most >= 1e9) return TrRecorded("must be at least %1", Decimal(row.least));
  return TrRecorded("must be %1 to %2", Decimal(row.least), Decimal(row.most));
}

bool InLimits(const Parameter& row, double number) {
  return number >= row.least && number <= row.most;
}

RecordedText ReadNumber(const Parameter& row, std::string_view text, Value& value) {
  if (row.kind == ParameterKind::kPercent && text.ends_with('%')) text.remove_suffix(1);
  const auto number = WholeDecimal(text);
  const bool whole = row.kind == ParameterKind::kInteger;
  if (!number) {
    return whole                                 ? TrRecorded("must be a whole number")
           : row.kind == ParameterKind::kPercent ? TrRecorded("must be a percentage")
                                                 : TrRecorded("must be a number");
  }
  if (!InLimits(row, *number)) return OutOfLimits(row);
  if (whole && *number != std::floor(*number)) return TrRecorded("must be a whole number");
  value.number = *number;
  return {};
}

// Checks a length against the row's limits.
RecordedText CheckLength(const Parameter& row, const Length& length) {
  return InLimits(row, length.number) ? RecordedText() : OutOfLimits(row);
}

RecordedText ReadLength(const Parameter& row, std::string_view text, Value& value) {
  const bool points = std::string_view(row.unit) == "pt";
  if (!TakeLength(text, value.x, points ? LengthUnit::Points : LengthUnit::Pixels) || !text.empty())
    return TrRecorded("must be a length such as 12, 5% or 2cm");
  return CheckLength(row, value.x);
}

RecordedText ReadSize(const Parameter& row, std::string_view text, Value& value) {
  constexpr const char* kForms =
      TrLater("must be a size such as 800x600, 800x, x600, 800 or 50%");
  value.hasWidth = TakeLength(text, value.width);
  const bool both = Take(text, 'x');
  value.hasHeight = both && TakeLength(text, value.height);
  value.longestEdge = !both;
  if (!text.empty() || (!value.hasWidth && !value.hasHeight)) return TrRecorded(kForms);
  if (value.hasWidth) {
    if (const RecordedText wrong = CheckLength(row, value.width); !wrong.empty()) return wrong;
  }
  return value.hasHeight ? CheckLength(row, value.height) : RecordedText();
}

RecordedText ReadPoint(const Parameter& row, std::string_view text, Value& value) {
  if (!TakeLength(text, value.x) || !Take(text, ',') || !TakeLength(text, value.y) ||
      !text.empty()) {
    return TrRecorded("must be a point such as 10,20 or 50%,50%");
  }
  const RecordedText wrong = CheckLength(row, value.x);
  return wrong.empty() ? CheckLength(row, value.y) : wrong;
}

RecordedText ReadRectangle(const Parameter& row, std::string_view text, Value& value) {
  constexpr const char* kForms = TrLater(
      "must be a rectangle such as 400x300+10+20, a size such as 400x300, or a ratio such as 3:2");
  if (!TakeLength(text, value.width)) return TrRecorded(kForms);
  value.ratio = Take(text, ':');
  if (!value.ratio && !Take(text, 'x')) return TrRecorded(kForms);
  if (!TakeLength(text, value.height)) return TrRecorded(kForms);
  if (value.width.number <= 0 || value.height.number <= 0)
    return TrRecorded("must have a width and a height above 0");
  if (!value.ratio && !text.empty()) {
    value.hasPlace = true;
    // In "+10" and "-10", the sign is part of the number.
    if ((text[0] != '+' && text[0] != '-') || !TakeLength(text, value.x) || text.empty() ||
        (text[0] != '+' && text[0] != '-') || !TakeLength(text, value.y)) {
      return TrRecorded(kForms);
    }
  }
  if (!text.empty()) return TrRecorded(kForms);
  for (const Length& length : {value.width, value.height, value.x, value.y}) {
    if (std::abs(length.number) > row.most) return OutOfLimits(row);
  }
  return {};
}

RecordedText ReadCurve(std::string_view text, Value& value) {
  constexpr const char* kForms =
      TrLater("must be two or more points such as \"0,0 64,80 255,255\", from left to right");
  while (!text.empty()) {
    if (Take(text, ' ')) continue;
    const auto x = TakeDecimal(text);
    if (!x || !Take(text, ',')) return TrRecorded(kForms);
    const auto y = TakeDecimal(text);
    if (!y || (!text.empty() && text[0] != ' ')) return TrRecorded(kForms);
    if (*x < 0 || *x > 255 || *y < 0 || *y > 255)
      return TrRecorded("must have values from 0 to 255");
    if (!value.points.empty() && *x <= value.points.back().x) return TrRecorded(kForms);
    if (value.points.size() == 256) return TrRecorded(kForms);
    value.points.push_back({*x, *y});
  }
  return value.points.size() >= 2 ? RecordedText() : TrRecorded(kForms);
}

std::vector<std::string_view> WordsOf(std::string_view list) {
  std::vector<std::string_view> words;
  for (int32_t i = 0; !WordOf(list, i).empty(); ++i) words.push_back(WordOf(list, i));
  return words;
}

RecordedText ReadChoice(const Parameter& row, std::string_view text, Value& value) {
  value.choice = PlaceOfWord(row.choices, LowerCase(text));
  if (value.choice >= 0) return {};
  const auto words = WordsOf(row.choices);
  std::string known;
  for (size_t i = 0; i + 1 < words.size(); ++i) known.append(i == 0 ? "" : ", ").append(words[i]);
  RecordedText wrong = words.size() == 1 ? TrRecorded("must be %1.", words[0])
                                         : TrRecorded("must be %1 or %2.", known, words.back());
  wrong.Append(NearestNameQuestion(text, words));
  return wrong;
}

RecordedText ReadFlag(std::string_view text, Value& value) {
  for (const std::string_view yes : {"yes", "true", "on", "1"}) {
    if (EqualIgnoringCase(text, yes)) {
      value.choice = 1;
      return {};
    }
  }
  for (const std::string_view no : {"no", "false", "off", "0"}) {
    if (EqualIgnoringCase(text, no)) return {};
  }
  return TrRecorded("must be yes or no");
}

RecordedText ReadByKind(const Parameter& row, std::string_view text, Value& value) {
  switch (row.kind) {
    case ParameterKind::kInteger:
    case ParameterKind::kNumber:
    case ParameterKind::kPercent:
    case ParameterKind::kAngle: return ReadNumber(row, text, value);
    case ParameterKind::kSize: return ReadSize(row, text, value);
    case ParameterKind::kLength: return ReadLength(row, text, value);
    case ParameterKind::kColor:
      return ReadColor(text, value.color)
                 ? RecordedText()
                 : TrRecorded("must be a color such as #ff8800, #ff880080 or orange");
    case ParameterKind::kChoice: return ReadChoice(row, text, value);
    case ParameterKind::kFlag: return ReadFlag(text, value);
    case ParameterKind::kPoint: return ReadPoint(row, text, value);
    case ParameterKind::kRectangle: return ReadRectangle(row, text, value);
    case ParameterKind::kCurve: return ReadCurve(text, value);
    case ParameterKind::kText:
    case ParameterKind::kFile: break;
  }
  if (text.find('\0') != std::string_view::npos) return TrRecorded("must not contain a zero byte");
  const bool tooLong =
      row.most > 0 && row.most < 1e9 && static_cast<double>(text.size()) > row.most;
  return tooLong ? TrRecorded("must have at most %1 characters", Decimal(row.most))
                 : RecordedText();
}

}  // namespace

std::string_view KindName(ParameterKind kind) {
  constexpr std::string_view kNames[] = {"integer", "number", "percent",   "angle", "size",
                                         "length",  "color",  "choice",    "flag",  "text",
                                         "file",    "point",  "rectangle", "curve"};
  return kNames[static_cast<size_t>(kind)];
}

double Length::Pixels(double whole, double dpi) const {
  if (!(dpi > 0)) dpi = kUsualDpi;
  switch (unit) {
    case LengthUnit::Percent: return number * whole / 100;
    case LengthUnit::Centimeters: return number * dpi / 2.54;
    case LengthUnit::Millimeters: return number * dpi / 25.4;
    case LengthUnit::Inches: return number * dpi;
    case LengthUnit::Points: return number * dpi / 72;
    case LengthUnit::Pixels: break;
  }
  return number;
}

RecordedText ReadValue(const Parameter& row, std::string_view text, Value& value) {
  Value read;
  read.text = text;
  RecordedText wrong = ReadByKind(row, text, read);
  if (!wrong.empty()) return wrong;
  read.given = true;
  value = std::move(read);
  return {};
}

std::string_view WordOf(std::string_view list, int32_t index) {
  for (; index > 0 && !list.empty(); --index) {
    const size_t end = list.find('|');
    list.remove_prefix(end == std::string_view::npos ? list.size() : end + 1);
  }
  return index < 0 ? std::string_view() : list.substr(0, list.find('|'));
}

int32_t PlaceOfWord(std::string_view list, std::string_view word) {
  for (int32_t i = 0; !WordOf(list, i).empty(); ++i) {
    if (WordOf(list, i) == word) return i;
  }
  return -1;
}

const Value& Arguments::Of(std::string_view name) const {
  static const Value kNone;
  for (size_t i = 0; i < rows_.size(); ++i) {
    if (rows_[i].name == name) return values_[i];
  }
  assert(false && "the operation has no such parameter");
  return kNone;
}

int32_t Arguments::Pixels(std::string_view name, double whole, double dpi) const {
  return static_cast<int32_t>(
      std::floor(std::clamp(Of(name).x.Pixels(whole, dpi) + 0.5, -2e9, 2e9)));
}

}  // namespace fotomill
