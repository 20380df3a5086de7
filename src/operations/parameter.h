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

// The type of a parameter, and its syntax in a recipe.
enum class ParameterKind : uint8_t {
  kInteger,    // 12
  kNumber,     // 0.5
  kPercent,    // 60 or 60%
  kAngle,      // degrees, clockwise: 7.5
  // 800x600, 800x, x600, or one value for the longest edge: 800, 50%, 10cm. Edges are lengths
  kSize,
  kLength,     // pixels 12, percent 5%, or 10cm, 25mm, 4in, which depend on the resolution
  kColor,      // #RRGGBB, #RRGGBBAA, #RGB or a CSS name
  kChoice,     // one of a list of words
  kFlag,       // yes or no; the name alone means yes
  kText,       // any text; the operation expands macros
  kFile,       // the name of a file
  kPoint,      // X,Y: two lengths
  kRectangle,  // WxH+X+Y; also an aspect ratio 3:2, or WxH without position
  kCurve,      // two or more points "0,0 64,80 255,255", values 0 to 255
};
// The name in `operations --json`, such as "integer".
std::string_view KindName(ParameterKind kind);

// A parameter of an operation: a constant row.
struct Parameter {
  const char* name;
  ParameterKind kind;
  // unit of plain numbers: "px", "pt", "levels", "%", "degrees"
  const char* unit = "";
  // default, in recipe syntax; "": optional without default; null: required
  const char* preset = nullptr;
  // for numbers and each length of a size; for texts, the maximum length (0: none)
  double least = -1e9, most = 1e9;
  const char* choices = "";                // separated by "|"
  const char* label = "";                  // in dialogs
  const char* help = "";                   // one sentence
  // configuration key with the default; if its value is empty, `preset` applies
  const char* key = "";
  // for choices: the words for the key's numbers from 0, separated by "|"
  const char* keyWords = "";
};

// The unit of a length.
enum class LengthUnit : uint8_t { Pixels, Percent, Centimeters, Millimeters, Inches, Points };
// A length as written; its size in pixels depends on the picture.
struct Length {
  double number = 0;
  LengthUnit unit = LengthUnit::Pixels;
  // In pixels, not rounded. `whole` is 100 %; `dpi` is in pixels per inch, 96 if the picture does
  // not specify it.
  double Pixels(double whole, double dpi) const;
};

// A color; alpha 255 is opaque.
struct AlphaColor {
  uint8_t red = 0, green = 0, blue = 0, alpha = 255;
  bool operator==(const AlphaColor&) const = default;
};

// A point of a curve: input and output level, 0 to 255.
struct CurvePoint {
  double x = 0, y = 0;
};

// A parameter's value. The kind decides which fields are used.
struct Value {
  bool given = false;            // has a value, explicit or default
  bool byDefault = false;        // the value is the default
  std::string text;              // as written; Text and File: the value
  double number = 0;             // Integer, Number, Percent (60 for 60 %), Angle
  int32_t choice = 0;            // Choice: index in the row's list; Flag: 0 or 1
  AlphaColor color;              // Color
  Length x, y;                   // Point, position of a rectangle; `x`: Length
  Length width, height;          // Size, Rectangle. `width` also for the longest edge
  bool hasWidth = false, hasHeight = false, longestEdge = false;  // Size
  // Rectangle; for a ratio, width and height are its numbers
  bool hasPlace = false, ratio = false;
  std::vector<CurvePoint> points;                                 // Curve
};

// Parses a value for a row. Empty if valid, else what is wrong, as the end of a sentence that
// begins with the parameter's name: "must be 0 to 100".
RecordedText ReadValue(const Parameter& row, std::string_view text, Value& value);

// Parses a color; false if invalid.
bool ReadColor(std::string_view text, AlphaColor& color);

// Word `index` of a list separated by "|", empty if out of range; and the index of a word, -1 if
// not found.
std::string_view WordOf(std::string_view list, int32_t index);
// -1 if not found.
int32_t PlaceOfWord(std::string_view list, std::string_view word);

// The values for one call, one per parameter of the operation. Asking for an unknown name is a
// programming error.
class Arguments {
 public:
  Arguments() = default;
  // All values are unset; `rows` must outlive this object.
  explicit Arguments(std::span<const Parameter> rows) : rows_(rows), values_(rows.size()) {}

  // The parameters, in the same order as the values.
  std::span<const Parameter> Rows() const { return rows_; }
  Value& At(size_t index) { return values_[index]; }
  const Value& At(size_t index) const { return values_[index]; }
  const Value& Of(std::string_view name) const;  // by parameter name

  bool Has(std::string_view name) const { return Of(name).given; }  // explicit or default
  // Number, Percent (60 for 60 %) or Angle (degrees).
  double Number(std::string_view name) const { return Of(name).number; }
  // Truncated toward zero.
  int32_t Integer(std::string_view name) const { return static_cast<int32_t>(Of(name).number); }
  // False if not given.
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
