#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "picture/rectangle.h"
#include "processing/geometry/scale.h"
#include "texts/texts.h"

namespace fotomill {

// What a parameter holds, and how it is written in a recipe.
enum class ParameterKind : uint8_t {
  kInteger,    // 12
  kNumber,     // 0.5
  kPercent,    // 60 or 60%
  kAngle,      // degrees, clockwise: 7.5
  // 800x600, 800x, x600, or one value for the longest edge: 800, 50%, 10cm. Each edge is a length
  kSize,
  kLength,     // pixels 12, percent 5%, or 10cm, 25mm, 4in by the picture's resolution
  kColor,      // #RRGGBB, #RRGGBBAA, #RGB or a CSS name
  kChoice,     // one of several words
  kFlag,       // yes or no; its name alone means yes
  kText,       // any text; macros are the operation's to expand
  kFile,       // the name of a file
  kPoint,      // X,Y: two lengths
  kRectangle,  // WxH+X+Y; also a ratio 3:2, or WxH without a place
  kCurve,      // two or more points "0,0 64,80 255,255", each value 0 to 255
};
// Its name in `operations --json`, such as "integer".
std::string_view KindName(ParameterKind kind);

// One parameter of an operation: a constant row.
struct Parameter {
  const char* name;
  ParameterKind kind;
  // "px", "pt", "levels", "%", "degrees"; what plain numbers mean
  const char* unit = "";
  // default, as in a recipe; "": none, and leaving it out is fine; null: must be given
  const char* preset = nullptr;
  // of numbers and of each length of a size; for texts, the most characters (0: any)
  double least = -1e9, most = 1e9;
  const char* choices = "";                // words of a choice, separated by "|"
  const char* label = "";                  // in a dialog
  const char* help = "";                   // one sentence
  // configuration key that the default comes from; `preset` stands in where it is empty
  const char* key = "";
  // choices only: the word for each number of the key from 0, separated by "|"
  const char* keyWords = "";
};

// What the number of a length counts.
enum class LengthUnit : uint8_t { Pixels, Percent, Centimeters, Millimeters, Inches, Points };
// A length as it was written; what it comes to depends on the picture.
struct Length {
  double number = 0;
  LengthUnit unit = LengthUnit::Pixels;
  // Pixels, not rounded. `whole`: what percent are of; `dpi`: pixels per inch, 96 where the picture
  // does not say.
  double Pixels(double whole, double dpi) const;
};

// A color; an alpha of 255 is opaque.
struct AlphaColor {
  uint8_t red = 0, green = 0, blue = 0, alpha = 255;
  bool operator==(const AlphaColor&) const = default;
};

// A point of a curve: the input level and what becomes of it, 0 to 255.
struct CurvePoint {
  double x = 0, y = 0;
};

// A parameter's value. Which fields count depends on the kind.
struct Value {
  bool given = false;            // it has a value: written down, or by default
  bool byDefault = false;        // not given by the recipe
  std::string text;              // as written; Text and File: the value
  double number = 0;             // Integer, Number, Percent (60 for 60 %), Angle
  int32_t choice = 0;            // Choice: its place in the row's list; Flag: 0 or 1
  AlphaColor color;              // Color
  Length x, y;                   // Point, and a rectangle's place; a Length's value is `x`
  Length width, height;          // Size, Rectangle. One value for the longest edge is in `width`
  bool hasWidth = false, hasHeight = false, longestEdge = false;  // Size
  // Rectangle; the numbers of a ratio are width and height
  bool hasPlace = false, ratio = false;
  std::vector<CurvePoint> points;                                 // Curve
};

// Reads a value for a row from its text. Empty when it is right, else what is wrong, as the end of
// a sentence that begins with the parameter's name: "must be 0 to 100".
RecordedText ReadValue(const Parameter& row, std::string_view text, Value& value);

// A color as people write it. False for anything else.
bool ReadColor(std::string_view text, AlphaColor& color);

// Word `index` of a list separated by "|", empty when it has none; and the place of a word, -1 when
// it is not in the list.
std::string_view WordOf(std::string_view list, int32_t index);
// -1 when the list does not have it.
int32_t PlaceOfWord(std::string_view list, std::string_view word);

// The values of one call: one for each parameter of its operation. Asking for a name that the
// operation does not have is a fault of the program.
class Arguments {
 public:
  Arguments() = default;
  // Nothing is given yet; the rows must outlive it.
  explicit Arguments(std::span<const Parameter> rows) : rows_(rows), values_(rows.size()) {}

  // The parameters, in the order of the values.
  std::span<const Parameter> Rows() const { return rows_; }
  Value& At(size_t index) { return values_[index]; }
  const Value& At(size_t index) const { return values_[index]; }
  const Value& Of(std::string_view name) const;  // by the parameter's name

  bool Has(std::string_view name) const { return Of(name).given; }  // written down, or by default
  // Number, Percent (60 for 60 %) or Angle (degrees).
  double Number(std::string_view name) const { return Of(name).number; }
  // Cut toward zero.
  int32_t Integer(std::string_view name) const { return static_cast<int32_t>(Of(name).number); }
  // False unless the flag was given.
  bool Flag(std::string_view name) const { return Of(name).choice != 0; }
  template <typename Enum = int32_t>
  Enum Choice(std::string_view name) const {
    return static_cast<Enum>(Of(name).choice);
  }
  const AlphaColor& Color(std::string_view name) const { return Of(name).color; }
  const std::string& Text(std::string_view name) const { return Of(name).text; }
  // A length in whole pixels, rounded to nearest.
  int32_t Pixels(std::string_view name, double whole, double dpi) const;

 private:
  std::span<const Parameter> rows_;
  std::vector<Value> values_;
};

}  // namespace fotomill
