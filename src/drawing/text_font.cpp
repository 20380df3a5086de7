#include "drawing/text_font.h"

#include <cmath>
#include <utility>

#include "core/utf8.h"
#include "drawing/text_mask.h"
#include "drawing/text_shaping.h"
#include "processing/color/overlay.h"

namespace fotomill {

namespace {

constexpr char32_t kUnknown = 0xFFFD;
constexpr std::string_view kEllipsis = "\xE2\x80\xA6";

}  // namespace

TextFont::TextFont() : fonts_(std::make_unique<FontFaces>()) {}
TextFont::~TextFont() = default;

Status TextFont::Open(std::string_view family, double em) { return fonts_->OpenForEm(family, em); }
Status TextFont::OpenForLine(std::string_view family, double height) {
  return fonts_->OpenForLine(family, height);
}

double TextFont::Ascent() const { return fonts_->Ascent(); }
double TextFont::LineHeight() const { return fonts_->Ascent() + fonts_->Descent(); }

TextLine TextFont::Shape(std::string_view text, double spacing) {
  const TextParagraph paragraph = ReadParagraph(text);
  return ShapeLine(*fonts_, paragraph, 0, paragraph.characters.size(), spacing);
}

TextLine TextFont::Shape(const TextParagraph& paragraph, size_t start, size_t count,
                         double spacing) {
  return ShapeLine(*fonts_, paragraph, start, count, spacing);
}

Status TextFont::Draw(const TextLine& line, const LinePlace& place, PackedImage& mask,
                      const Work& work) const {
  return DrawLine(*fonts_, line, place, mask, work);
}

int32_t TextFont::WidthOf(std::string_view text) { return (Shape(text).width + 63) >> 6; }

std::string TextFont::Fitted(std::string_view text, int32_t width) {
  if (WidthOf(text) <= width) return std::string(text);
  std::string fitted(kEllipsis);
  for (std::string_view rest = text; !rest.empty();) {
    (void)NextCharacter(rest, kUnknown);
    std::string longer = std::string(text.substr(0, text.size() - rest.size())).append(kEllipsis);
    if (WidthOf(longer) > width) break;
    fitted = std::move(longer);
  }
  return fitted;
}

Status TextFont::DrawIn(PackedImage& image, const Rectangle& band, TextAlign align,
                        std::string_view text, Color color) {
  const TextLine line = Shape(text);
  PackedImage mask;
  RETURN_IF_BAD(NewAlphaPlane(band.width, band.height, mask));
  const int32_t room = band.width - ((line.width + 63) >> 6);
  const int32_t start = align == TextAlign::Left ? 0 : align == TextAlign::Center ? room / 2 : room;
  RETURN_IF_BAD(
      Draw(line, {.x = static_cast<double>(start), .y = std::floor(Ascent())}, mask));
  const Backdrop ink{static_cast<uint8_t>(color >> 16), static_cast<uint8_t>(color >> 8),
                     static_cast<uint8_t>(color)};
  PaintThroughMask(image, mask, band.x, band.y, ink);
  return Status::Ok;
}

}  // namespace fotomill
