#include "pages/pdf/pdf_fonts.h"

#include <algorithm>
#include <cmath>
#include <set>

#include "drawing/font_faces.h"
#include "drawing/text_shaping.h"
#include "pages/pdf/font_subset.h"

namespace fotomill {

namespace {

constexpr double kEm = 1000;           // pixels; positions are then thousandths of the em
constexpr double kFraction = 64;       // of a pixel
constexpr size_t kMostMappings = 100;  // in one block of a character map

std::string Hex16(uint32_t value) {
  char digits[8];
  std::snprintf(digits, sizeof digits, "%04X", value & 0xFFFFu);
  return digits;
}

std::string Utf16Hex(const std::u32string& text) {
  std::string hex;
  for (const char32_t c : text) {
    if (c >= 0x10000) {
      hex += Hex16(0xD800 + ((c - 0x10000) >> 10)) + Hex16(0xDC00 + ((c - 0x10000) & 0x3FF));
    } else {
      hex += Hex16(c);
    }
  }
  return hex;
}

std::string ColorOperator(Color color) {
  const auto part = [color](int shift) { return PdfNumber((color >> shift & 255) / 255.0) + " "; };
  return part(0) + part(8) + part(16) + "rg ";
}

// A font's name in PDF syntax, with the tag of a subset.
std::string SubsetName(FT_Face face, size_t number) {
  const char* const written = FT_Get_Postscript_Name(face);
  std::string name(6, 'A');
  for (size_t i = 6; i-- > 0; number /= 26) name[i] = static_cast<char>('A' + number % 26);
  name += '+';
  for (const char* c = written != nullptr ? written : "Font"; *c != 0; ++c) {
    if ((*c >= '0' && *c <= '9') || (*c >= 'A' && *c <= 'Z') || (*c >= 'a' && *c <= 'z') ||
        *c == '-')
      name += *c;
  }
  return name;
}

// The characters that each glyph of a line stands for: those of its cluster for the first glyph of
// the cluster, nothing for the others.
std::vector<std::u32string> TextsOf(const TextParagraph& paragraph, const TextLine& line) {
  std::set<size_t> starts{paragraph.characters.size()};
  for (const PlacedGlyph& glyph : line.glyphs) starts.insert(glyph.character);
  std::vector<std::u32string> texts;
  for (const PlacedGlyph& glyph : line.glyphs) {
    const auto start = starts.find(glyph.character);
    if (start == starts.end() || std::next(start) == starts.end()) {
      texts.emplace_back();
      continue;
    }
    const size_t end = *std::next(start);
    texts.push_back(paragraph.characters.substr(glyph.character, end - glyph.character));
  }
  return texts;
}

}  // namespace

Status PdfFonts::OpenFamily(const std::string& name, TextFont*& font) {
  std::unique_ptr<TextFont>& family = families_[name];
  if (family == nullptr) {
    auto opened = std::make_unique<TextFont>();
    RETURN_IF_BAD(opened->Open(name, kEm));
    family = std::move(opened);
  }
  font = family.get();
  return Status::Ok;
}

PdfFonts::Font& PdfFonts::FontOf(TextFont& family, size_t face) {
  const FontFile& file = family.Faces().FileOf(face);
  const auto [place, added] = numbers_.try_emplace({file.path, file.index}, fonts_.size());
  if (added) {
    FT_Face outlines = family.Faces().Outlines(face);
    const double scale = kEm / outlines->units_per_EM;
    const FT_BBox& box = outlines->bbox;
    fonts_.push_back(
        {.name = SubsetName(outlines, fonts_.size()),
         .file = file,
         .ascent = static_cast<double>(outlines->ascender) * scale,
         .descent = static_cast<double>(outlines->descender) * scale,
         .box = {static_cast<double>(box.xMin) * scale, static_cast<double>(box.yMin) * scale,
                 static_cast<double>(box.xMax - box.xMin) * scale,
                 static_cast<double>(box.yMax - box.yMin) * scale},
         .glyphs = {}});
  }
  return fonts_[place->second];
}

Status PdfFonts::Show(const TextItem& item, std::string& content) {
  if (item.text.empty()) return Status::Ok;
  TextFont* family = nullptr;
  RETURN_IF_BAD(OpenFamily(item.font, family));
  const double em = item.lineHeight * kEm / family->LineHeight();
  if (em <= 0) return Status::Ok;
  const auto room = static_cast<int32_t>(std::min(item.box.width / em * kEm, 1e8));
  const std::string shown = family->Fitted(item.text, room);
  const TextParagraph paragraph = ReadParagraph(shown);
  const TextLine line = family->Shape(paragraph, 0, paragraph.characters.size(), 0);
  const double width = line.width / kFraction / kEm * em;
  const double rest = item.box.width - width;
  const double shift = item.align == TextAlign::Left     ? 0
                       : item.align == TextAlign::Center ? rest / 2
                                                         : rest;
  const Point start{item.box.x + shift, item.box.y + family->Ascent() / kEm * em};
  // a shortened text is found by its full wording
  const bool cut = shown != item.text;
  if (cut) content += "/Span << /ActualText " + PdfText(item.text) + " >> BDC\n";
  content += "BT " + ColorOperator(item.color);
  ShowGlyphs(*family, paragraph, line, start, em, content);
  content += cut ? "ET EMC\n" : "ET\n";
  return Status::Ok;
}

void PdfFonts::ShowGlyphs(TextFont& family, const TextParagraph& paragraph, const TextLine& line,
                          Point start, double em, std::string& content) {
  const std::vector<std::u32string> texts = TextsOf(paragraph, line);
  const double unit = em / kEm / kFraction;  // of the glyphs' positions
  double pen = 0;                            // where the reader is, in thousandths of the em
  const PlacedGlyph* before = nullptr;
  for (size_t i = 0; i < line.glyphs.size(); ++i) {
    const PlacedGlyph& glyph = line.glyphs[i];
    // a box: the font's own, glyph 0
    const size_t face = glyph.face == PlacedGlyph::kBox ? 0 : static_cast<size_t>(glyph.face);
    Font& font = FontOf(family, face);
    const auto number = static_cast<size_t>(&font - fonts_.data());
    const auto [entry, added] = font.glyphs.try_emplace(glyph.glyph);
    if (added) {
      FT_Face outlines = family.Faces().Outlines(face);
      if (FT_Load_Glyph(outlines, glyph.glyph, FT_LOAD_NO_SCALE) == 0) {
        entry->second.advance = static_cast<double>(outlines->glyph->metrics.horiAdvance) * kEm /
                                outlines->units_per_EM;
      }
    }
    if (entry->second.text.empty() && glyph.face != PlacedGlyph::kBox)
      entry->second.text = texts[i];
    if (before == nullptr || before->face != glyph.face || before->y != glyph.y) {
      if (before != nullptr) content += "] TJ\n";
      content += std::string("/F") + std::to_string(number) + " " + PdfNumber(em) +
                 " Tf 1 0 0 -1 " + PdfNumber(start.x + glyph.x * unit) + " " +
                 PdfNumber(start.y - glyph.y * unit) + " Tm [";
    } else if (const double gap = pen - glyph.x / kFraction; std::abs(gap) > 0.01) {
      content += PdfNumber(gap);
    }
    content += std::string("<") + Hex16(glyph.glyph) + ">";
    pen = glyph.x / kFraction + entry->second.advance;
    before = &glyph;
  }
  if (before != nullptr) content += "] TJ\n";
}

Status PdfFonts::Write(PdfFile& file, int32_t resources) const {
  std::string names = "<<";
  for (size_t i = 0; i < fonts_.size(); ++i) {
    const int32_t object = file.NewObject();
    RETURN_IF_BAD(WriteFont(file, object, fonts_[i]));
    names += std::string(" /F") + std::to_string(i) + " " + PdfReference(object);
  }
  file.Write(resources, names + " >>");
  return Status::Ok;
}

namespace {

// The widths of glyphs, one array for each run of consecutive ones.
template <typename Glyphs>
std::string WidthsOf(const Glyphs& glyphs) {
  std::string widths = "[";
  uint32_t next = UINT32_MAX;
  for (const auto& [glyph, facts] : glyphs) {
    if (glyph != next) widths += (widths.size() > 1 ? "] " : "") + std::to_string(glyph) + " [";
    widths += PdfNumber(facts.advance) + " ";
    next = glyph + 1;
  }
  return widths + (widths.size() > 1 ? "]]" : "]");
}

// Source: Adobe Technical Note 5411, "ToUnicode Mapping File Tutorial" (2003).
template <typename Glyphs>
std::string MapOf(const Glyphs& glyphs) {
  std::vector<std::string> rows;
  for (const auto& [glyph, facts] : glyphs) {
    if (!facts.text.empty())
      rows.push_back(std::string("<") + Hex16(glyph) + "> <" + Utf16Hex(facts.text) + ">\n");
  }
  std::string map =
      "/CIDInit /ProcSet findresource begin\n12 dict begin\nbegincmap\n/CIDSystemInfo << /Registry "
      "(Adobe) /Ordering (UCS) /Supplement 0 >> def\n/CMapName /Adobe-Identity-UCS def\n/CMapType "
      "2 def\n1 begincodespacerange\n<0000> <FFFF>\nendcodespacerange\n";
  for (size_t i = 0; i < rows.size(); i += kMostMappings) {
    const size_t count = std::min(kMostMappings, rows.size() - i);
    map += std::to_string(count) + " beginbfchar\n";
    for (size_t k = i; k < i + count; ++k) map += rows[k];
    map += "endbfchar\n";
  }
  return map + "endcmap\nCMapName currentdict /CMap defineresource pop\nend\nend\n";
}

std::span<const uint8_t> BytesOf(const std::string& text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

}  // namespace

// Source: ISO 32000-1:2008, section 9.7.
Status PdfFonts::WriteFont(PdfFile& file, int32_t object, const Font& font) {
  std::vector<uint32_t> glyphs;
  for (const auto& entry : font.glyphs) glyphs.push_back(entry.first);
  FontProgram program;
  RETURN_IF_BAD(SubsetFont(font.file, glyphs, program));
  const int32_t descendant = file.NewObject(), descriptor = file.NewObject(),
                bytes = file.NewObject(), map = file.NewObject();
  RETURN_IF_BAD(file.WriteDeflated(
      bytes,
      program.compact ? "/Subtype /CIDFontType0C"
                      : std::string("/Length1 ") + std::to_string(program.bytes.size()),
      program.bytes));
  RETURN_IF_BAD(file.WriteDeflated(map, "", BytesOf(MapOf(font.glyphs))));
  const Box& box = font.box;
  constexpr int kSymbolic = 4;
  file.Write(descriptor,
             std::string("<< /Type /FontDescriptor /FontName /") + font.name + " /Flags " +
                 std::to_string(kSymbolic) + " /FontBBox [" + PdfNumber(box.x) + " " +
                 PdfNumber(box.y) + " " + PdfNumber(box.Right()) + " " + PdfNumber(box.Bottom()) +
                 "] /ItalicAngle 0 /Ascent " + PdfNumber(font.ascent) + " /Descent " +
                 PdfNumber(font.descent) + " /CapHeight " + PdfNumber(font.ascent) + " /StemV 80 " +
                 (program.compact ? "/FontFile3 " : "/FontFile2 ") + PdfReference(bytes) + " >>");
  file.Write(descendant,
             std::string("<< /Type /Font /Subtype /") +
                 (program.compact ? "CIDFontType0" : "CIDFontType2 /CIDToGIDMap /Identity") +
                 " /BaseFont /" + font.name +
                 " /CIDSystemInfo << /Registry (Adobe) /Ordering (Identity) /Supplement 0 >> "
                 "/FontDescriptor " +
                 PdfReference(descriptor) + " /DW 1000 /W " + WidthsOf(font.glyphs) + " >>");
  file.Write(object, std::string("<< /Type /Font /Subtype /Type0 /BaseFont /") + font.name +
                         " /Encoding /Identity-H /DescendantFonts [" + PdfReference(descendant) +
                         "] /ToUnicode " + PdfReference(map) + " >>");
  return Status::Ok;
}

}  // namespace fotomill
