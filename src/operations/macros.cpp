#include "operations/macros.h"

#include <algorithm>
#include <cstdio>
#include <functional>
#include <optional>

#include "core/text.h"
#include "core/utf8.h"
#include "core/whole_number.h"
#include "metadata/exif/exif_names.h"
#include "metadata/exif/exif_walk.h"
#include "platform/clock.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/name_hint.h"

namespace fotomill {

namespace {

// clang-format off
constexpr MacroRow kMacros[] = {
    {'F', true,  "%F",      TrLater("file name without extension")},
    {'N', true,  "%N",      TrLater("copyright holder: ExifCopyrightHolder, else the user's full name")},
    {'C', true,  "%C",      TrLater("the copyright sign")},
    {'Y', false, "%Y",      TrLater("year")},
    {'D', false, "%D",      TrLater("date when the picture was taken, as 2026-11-22; %D{%Y%m%d-%H%M%S} in another form")},
    {'T', false, "%T",      TrLater("time when the picture was taken, as 14:05:09")},
    {'W', false, "%W",      TrLater("width in pixels")},
    {'H', false, "%H",      TrLater("height in pixels")},
    {'P', false, "%P",      TrLater("page number, from 1")},
    {'E', false, "%E{Tag}", TrLater("text of an EXIF tag, empty if the picture has none")},
    {'%', true,  "%%",      TrLater("a percent sign")},
};
// clang-format on

const MacroRow* FindMacro(char letter) {
  const auto found = std::ranges::find(kMacros, letter, &MacroRow::letter);
  return found != std::end(kMacros) ? found : nullptr;
}

// A macro at the start of `text`, which begins with "%": letter, text in braces and length. nullopt
// if it is not a macro.
struct Macro {
  char letter;
  std::string_view braced;  // a tag, or a form of the date
  size_t length;
};
std::optional<Macro> MacroAt(std::string_view text) {
  if (text.size() < 2 || FindMacro(text[1]) == nullptr) return std::nullopt;
  const bool tag = text[1] == 'E', braced = text.size() > 2 && text[2] == '{';
  if (!tag && (text[1] != 'D' || !braced)) return Macro{text[1], {}, 2};
  const size_t end = text.find('}');
  if (!braced || end == std::string_view::npos || end == 3) return std::nullopt;
  return Macro{text[1], text.substr(3, end - 3), end + 1};
}

std::string Formatted(const char* format, int32_t a, int32_t b, int32_t c) {
  char text[40];
  std::snprintf(text, sizeof text, format, a, b, c);
  return text;
}
std::string TwoDigits(int32_t number) { return Formatted("%02d", number, 0, 0); }

// A field of "%D{...}", as in strftime.
struct DateField {
  char letter;
  std::string (*text)(const platform::LocalTime& time);
};
// clang-format off
constexpr DateField kDateFields[] = {
    {'Y', [](const platform::LocalTime& time) { return Formatted("%04d", time.year, 0, 0); }},
    {'y', [](const platform::LocalTime& time) { return TwoDigits(time.year % 100); }},
    {'m', [](const platform::LocalTime& time) { return TwoDigits(time.month); }},
    {'d', [](const platform::LocalTime& time) { return TwoDigits(time.day); }},
    {'H', [](const platform::LocalTime& time) { return TwoDigits(time.hour); }},
    {'I', [](const platform::LocalTime& time) { return TwoDigits((time.hour + 11) % 12 + 1); }},
    {'p', [](const platform::LocalTime& time) { return std::string(time.hour < 12 ? "AM" : "PM"); }},
    {'M', [](const platform::LocalTime& time) { return TwoDigits(time.minute); }},
    {'S', [](const platform::LocalTime& time) { return TwoDigits(time.second); }},
    {'F', [](const platform::LocalTime& time) { return Formatted("%04d-%02d-%02d", time.year, time.month, time.day); }},
    {'T', [](const platform::LocalTime& time) { return Formatted("%02d:%02d:%02d", time.hour, time.minute, time.second); }},
    {'%', [](const platform::LocalTime&) { return std::string("%"); }},
};
// clang-format on

// The field after a percent sign at the start of `form`; null if it is not one.
const DateField* FieldAt(std::string_view form) {
  const auto found = form.size() < 2 ? std::end(kDateFields)
                                     : std::ranges::find(kDateFields, form[1], &DateField::letter);
  return found != std::end(kDateFields) ? found : nullptr;
}

// The counter at the start of `text`, which begins with "%": its length and number of digits.
struct Counter {
  size_t length;
  int32_t digits;
};
std::optional<Counter> CounterAt(std::string_view text) {
  constexpr size_t kMostDigits = 9;
  size_t end = 1;
  while (end < text.size() && text[end] >= '0' && text[end] <= '9') ++end;
  if (end >= text.size() || text[end] != 'c' || end > 3) return std::nullopt;
  const int32_t digits = ParseNumber(text.substr(1, end - 1)).value_or(1);
  return Counter{end + 1, std::min<int32_t>(digits, kMostDigits)};
}

// Calls `other` for each piece of plain text, and `macro` at each "%" with the rest of the text.
void Scan(std::string_view text, const std::function<void(std::string_view)>& other,
          const std::function<size_t(std::string_view)>& macro) {
  while (!text.empty()) {
    const size_t percent = std::min(text.find('%'), text.size());
    if (percent > 0) other(text.substr(0, percent));
    text.remove_prefix(percent);
    if (!text.empty()) text.remove_prefix(macro(text));
  }
}

// Finds the text of the first entry with a given tag.
class TagFinder : public ExifSink {
 public:
  explicit TagFinder(uint16_t tag) : tag_(tag) {}
  void Directory(int32_t, std::string_view) override {}
  void Line(const ExifLine& line) override {
    if (!found_ && line.value.tag == tag_) found_ = std::string(line.text);
  }
  std::string Take() { return found_.value_or(std::string()); }

 private:
  const uint16_t tag_;
  std::optional<std::string> found_;
};

// Finds the capture time: DateTimeOriginal, else DateTimeDigitized, else DateTime.
class DateFinder : public ExifSink {
 public:
  void Directory(int32_t, std::string_view) override {}
  void Line(const ExifLine& line) override {
    constexpr uint16_t kTags[] = {0x9003, 0x9004, 0x0132};
    for (int rank = 0; rank < 3; ++rank) {
      platform::LocalTime time;
      if (line.value.tag == kTags[rank] && rank < rank_ && Read(line.text, time)) {
        rank_ = rank;
        time_ = time;
      }
    }
  }
  std::optional<platform::LocalTime> Time() const {
    return rank_ < 3 ? std::optional(time_) : std::nullopt;
  }

 private:
  static bool Read(std::string_view text, platform::LocalTime& time) {
    const std::string copy(text);
    const int fields = std::sscanf(copy.c_str(), "%4d%*1[:-]%2d%*1[:-]%2d %2d:%2d:%2d", &time.year,
                                   &time.month, &time.day, &time.hour, &time.minute, &time.second);
    return fields >= 3 && time.year > 0 && time.month >= 1 && time.month <= 12 && time.day >= 1 &&
           time.day <= 31 && time.hour >= 0 && time.hour <= 23 && time.minute >= 0 &&
           time.minute <= 59 && time.second >= 0 && time.second <= 60;
  }
  int rank_ = 3;
  platform::LocalTime time_;
};

platform::LocalTime TimeOf(const MacroFacts& facts, const PictureRecord& picture) {
  DateFinder finder;
  (void)WalkExif(picture.metadata.exif, &finder);
  const auto taken = finder.Time();
  return taken ? *taken : platform::LocalTimeOf(facts.modified);
}

std::string TagText(std::string_view name, const PictureRecord& picture) {
  const auto tag = FindExifTagByName(name);
  if (!tag) return {};
  TagFinder finder(*tag);
  (void)WalkExif(picture.metadata.exif, &finder);
  return finder.Take();
}

std::string DateText(std::string_view form, const platform::LocalTime& time) {
  std::string text;
  Scan(form, [&](std::string_view plain) { text += plain; },
       [&](std::string_view rest) -> size_t {
         const DateField* const field = FieldAt(rest);
         text += field != nullptr ? field->text(time) : "%";
         return field != nullptr ? 2 : 1;
       });
  return text;
}

std::string Expansion(const Macro& macro, const MacroFacts& facts, const PictureRecord& picture) {
  const platform::LocalTime time = macro.letter == 'Y' || macro.letter == 'D' || macro.letter == 'T'
                                       ? TimeOf(facts, picture)
                                       : platform::LocalTime{};
  switch (macro.letter) {
    case 'F': return std::string(platform::SplitPath(facts.fileName).base);
    case 'N':
      return facts.copyrightHolder.empty() ? platform::UserFullName() : facts.copyrightHolder;
    case 'C': return "\u00A9";
    case 'Y': return std::to_string(time.year);
    case 'D': return DateText(macro.braced.empty() ? "%F" : macro.braced, time);
    case 'T': return Formatted("%02d:%02d:%02d", time.hour, time.minute, time.second);
    case 'W': return std::to_string(picture.image.Empty() ? picture.width : picture.image.Width());
    case 'H':
      return std::to_string(picture.image.Empty() ? picture.height : picture.image.Height());
    case 'P': return std::to_string(picture.page + 1);
    case 'E': return TagText(macro.braced, picture);
    default: return "%";
  }
}

std::string Expand(std::string_view text, const MacroFacts& facts, const PictureRecord& picture,
                   const std::function<std::string(std::string)>& safe) {
  std::string expanded;
  Scan(text, [&](std::string_view plain) { expanded += plain; },
       [&](std::string_view rest) {
         const auto macro = MacroAt(rest);
         expanded += macro ? safe(Expansion(*macro, facts, picture)) : "%";
         return macro ? macro->length : 1;
       });
  return expanded;
}

// Bytes of an unknown macro: "%" and the character after it.
size_t UnknownLength(std::string_view text) {
  if (text.size() < 2) return text.size();
  return 1 + std::max(CharacterLength(text.substr(1)), size_t{1});
}

RecordedText UnknownMacro(std::string_view text) {
  if (text.starts_with("%E")) return TrRecorded("needs the name of a tag in %E{Tag}");
  if (text.starts_with("%D")) return TrRecorded("needs a date in %D{...}");
  return TrRecorded("has an unknown macro %1; %% is a percent sign",
                    text.substr(0, UnknownLength(text)));
}

// An error if the form has an unknown field.
RecordedText FormProblem(std::string_view form) {
  RecordedText problem;
  Scan(form, [](std::string_view) {},
       [&](std::string_view rest) -> size_t {
         if (FieldAt(rest) != nullptr) return 2;
         problem = TrRecorded(
             "has an unknown field %1 in %D{...}; %Y, %m, %d, %H, %M and %S are known",
             rest.substr(0, UnknownLength(rest)));
         return 1;
       });
  return problem;
}

// An error if the macro names an unknown tag, or an unknown field of the date.
RecordedText BracedProblem(const Macro& macro) {
  if (macro.letter == 'D') return FormProblem(macro.braced);
  if (macro.letter != 'E' || FindExifTagByName(macro.braced)) return {};
  RecordedText problem = TrRecorded("has an unknown EXIF tag \"%1\".", macro.braced);
  problem.Append(NearestNameQuestion(macro.braced, ExifTagNames()));
  return problem;
}

}  // namespace

std::span<const MacroRow> Macros() { return kMacros; }

std::string ExpandMacros(std::string_view text, const MacroFacts& facts,
                         const PictureRecord& picture) {
  return Expand(text, facts, picture, [](std::string value) { return value; });
}

std::string ExpandNameMacros(std::string_view text, const MacroFacts& facts,
                             const PictureRecord& picture) {
  return Expand(text, facts, picture, [](std::string value) {
    std::erase_if(value, [](char c) { return static_cast<uint8_t>(c) < 0x20 || c == 0x7f; });
    for (char& c : value) {
      if (c == '/' || c == '\\' || c == ':') c = '-';
    }
    return value;
  });
}

RecordedText MacroProblem(std::string_view text) {
  RecordedText problem;
  Scan(text, [](std::string_view) {},
       [&](std::string_view rest) -> size_t {
         const auto macro = MacroAt(rest);
         if (problem.empty()) problem = macro ? BracedProblem(*macro) : UnknownMacro(rest);
         return macro ? macro->length : 1;
       });
  return problem;
}

std::string ExpandCounter(std::string_view text, int64_t number) {
  std::string expanded;
  Scan(text, [&](std::string_view plain) { expanded += plain; },
       [&](std::string_view rest) -> size_t {
         const auto counter = CounterAt(rest);
         const auto macro = MacroAt(rest);
         const size_t length = counter ? counter->length : macro ? macro->length : 1;
         const std::string digits = std::to_string(number);
         const auto width = static_cast<size_t>(counter ? counter->digits : 0);
         if (!counter) expanded += rest.substr(0, length);
         if (counter) expanded.append(width - std::min(width, digits.size()), '0').append(digits);
         return length;
       });
  return expanded;
}

bool NeedsPictureSize(std::string_view text) {
  bool needs = false;
  Scan(text, [](std::string_view) {},
       [&](std::string_view rest) -> size_t {
         const auto macro = MacroAt(rest);
         constexpr std::string_view kOfPicture = "WHP";
         needs = needs || (macro && kOfPicture.find(macro->letter) != std::string_view::npos);
         return macro ? macro->length : 1;
       });
  return needs;
}

bool IsKnownEarly(std::string_view text) {
  bool early = true;
  Scan(text, [](std::string_view) {},
       [&](std::string_view rest) -> size_t {
         const auto macro = MacroAt(rest);
         early = early && macro && FindMacro(macro->letter)->early;
         return macro ? macro->length : 1;
       });
  return early;
}

}  // namespace fotomill
