#include "formats/text/fixed_font.h"

#include <algorithm>
#include <iterator>

namespace fotomill {

namespace {

struct Glyph {
  char32_t codePoint;
  GlyphRows rows;
};

constexpr Glyph kGlyphs[] = {
#include "formats/text/fixed_font.inc"
};
constexpr char32_t kUnknown = 0xfffd;
static_assert(std::ranges::is_sorted(kGlyphs, {}, &Glyph::codePoint));
static_assert(std::end(kGlyphs)[-1].codePoint == kUnknown);

}  // namespace

const GlyphRows& GlyphOf(char32_t codePoint) {
  const auto* const found = std::ranges::lower_bound(kGlyphs, codePoint, {}, &Glyph::codePoint);
  const bool known = found != std::end(kGlyphs) && found->codePoint == codePoint;
  return (known ? *found : std::end(kGlyphs)[-1]).rows;
}

}  // namespace fotomill
