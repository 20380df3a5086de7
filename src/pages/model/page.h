#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <variant>
#include <vector>

#include "drawing/text_line.h"
#include "picture/palette.h"

namespace fotomill {

// A page and what is on it, independent of how it is drawn. Lengths are in millimeters, positions
// relative to the top left corner of the page, y downward.

struct Point {
  double x = 0, y = 0;
  Point operator+(const Point& other) const { return {x + other.x, y + other.y}; }
  Point operator-(const Point& other) const { return {x - other.x, y - other.y}; }
  Point operator*(double factor) const { return {x * factor, y * factor}; }
  bool operator==(const Point&) const = default;
};

struct Box {
  double x = 0, y = 0, width = 0, height = 0;
  double Right() const { return x + width; }
  double Bottom() const { return y + height; }
  Point Center() const { return {x + width / 2, y + height / 2}; }
  bool operator==(const Box&) const = default;
};

// An upright picture mapped to the parallelogram with its top left at `corner`, its top edge along
// `across` and its left edge along `down`.
struct PictureItem {
  size_t picture = 0;  // id of the picture
  Point corner, across, down;
  std::vector<Point> clip = {};  // a polygon, the visible part; empty: all of it
};

// A line of text at the top of a box; a text that is too wide ends in an ellipsis.
struct TextItem {
  std::string text;  // UTF-8
  Box box;
  std::string font;       // family
  double lineHeight = 4;  // from the top of the tallest letters to the bottom of the deepest
  TextAlign align = TextAlign::Center;
  Color color = 0;
};

struct LineItem {
  Point from, to;
  double width = 0.1;
  Color color = 0;
  double dash = 0;  // length of dashes and of the gaps between them; 0: solid
};

// A filled polygon, convex or not.
struct PolygonItem {
  std::vector<Point> corners;
  Color color = 0;
};

// An area that opens a file, if the output has links.
struct LinkItem {
  Box box;
  std::string file;  // a path
};

using PageItem = std::variant<PictureItem, TextItem, LineItem, PolygonItem, LinkItem>;

// An entry in the table of contents.
struct Bookmark {
  std::string title;  // UTF-8
  double y = 0;       // the position on its page
};

struct Page {
  double width = 0, height = 0;
  Color background = 0xFFFFFF;
  std::vector<PageItem> items = {};  // later ones are drawn over earlier ones
  std::vector<Bookmark> bookmarks = {};
};

// What generators know of a picture.
struct PagePicture {
  size_t id = 0;                  // number in the selection, for PictureItem::picture
  std::string file = {};          // path
  std::string name = {};          // file name without folder
  int32_t width = 0, height = 0;  // pixels, upright
  int32_t bits = 24;              // per pixel
  double dpi = 0;                 // pixels per inch; 0: unknown
  double dpiDown = 0;             // the same from top to bottom; 0: as across
  // texts for it, macros expanded: whatever the generator's options ask for
  std::vector<std::string> texts = {};
};

inline constexpr double kMmPerInch = 25.4;
inline constexpr double kMmPerPoint = kMmPerInch / 72;

}  // namespace fotomill
