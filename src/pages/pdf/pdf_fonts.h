#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "core/status.h"
#include "drawing/font_files.h"
#include "drawing/text_font.h"
#include "pages/model/page.h"
#include "pages/pdf/pdf_file.h"

namespace fotomill {

// The fonts of a document. Each is embedded once, reduced to the glyphs that are used, with a table
// that maps them back to text, so that texts can be searched and copied.
class PdfFonts {
 public:
  // Appends operators that show a line of text, in millimeters with y downward. ResourceError if
  // there is no font.
  Status Show(const TextItem& item, std::string& content);
  // Writes all fonts used so far, and a dictionary of them as `resources`. ResourceError if a font
  // cannot be embedded.
  Status Write(PdfFile& file, int32_t resources) const;

 private:
  struct Glyph {
    double advance = 0;   // thousandths of the em
    std::u32string text;  // the characters it stands for
  };
  struct Font {
    std::string name;
    FontFile file;
    double ascent = 0, descent = 0;  // thousandths of the em, descent below zero
    Box box;                         // of all glyphs: x and y of the bottom left
    std::map<uint32_t, Glyph> glyphs;
  };
  using Key = std::pair<std::string, int32_t>;  // path and index

  Status OpenFamily(const std::string& name, TextFont*& font);
  Font& FontOf(TextFont& family, size_t face);
  void ShowGlyphs(TextFont& family, const TextParagraph& paragraph, const TextLine& line,
                  Point start, double em, std::string& content);
  static Status WriteFont(PdfFile& file, int32_t object, const Font& font);

  std::map<std::string, std::unique_ptr<TextFont>> families_;
  std::map<Key, size_t> numbers_;  // of fonts_
  std::vector<Font> fonts_;
};

}  // namespace fotomill
