#include "drawing/text_shaping.h"

#include <fribidi.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <string>

#include "core/utf8.h"

namespace fotomill {

namespace {

constexpr char32_t kUnknown = 0xFFFD;
constexpr double kFraction = 64;

// Characters with the same font, script and direction.
struct TextRun {
  size_t start, count;
  size_t face;
  hb_script_t script;
  int8_t level;
};

std::u32string Characters(std::string_view text) {
  std::u32string characters;
  while (!text.empty()) {
    const char32_t c = NextCharacter(text, kUnknown);
    const bool control = c < 0x20 || (c >= 0x7F && c < 0xA0);
    characters += c == '\t' ? U' ' : control ? kUnknown : c;
  }
  return characters;
}

std::vector<int8_t> Levels(const std::u32string& text) {
  static_assert(sizeof(FriBidiLevel) == sizeof(int8_t));
  const auto count = static_cast<FriBidiStrIndex>(text.size());
  const std::vector<FriBidiChar> characters(text.begin(), text.end());
  std::vector<FriBidiCharType> types(text.size());
  std::vector<FriBidiBracketType> brackets(text.size());
  std::vector<int8_t> levels(text.size());
  fribidi_get_bidi_types(characters.data(), count, types.data());
  fribidi_get_bracket_types(characters.data(), count, types.data(), brackets.data());
  FriBidiParType direction = FRIBIDI_PAR_ON;
  if (fribidi_get_par_embedding_levels_ex(types.data(), brackets.data(), count, &direction,
                                          levels.data()) == 0)
    std::ranges::fill(levels, int8_t{0});
  return levels;
}

class Shaper {
 public:
  Shaper(FontFaces& fonts, const TextParagraph& paragraph, size_t start, size_t count,
         double spacing)
      : fonts_(fonts),
        shaping_(*LoadedHarfBuzz()),
        paragraph_(paragraph),
        text_(std::u32string_view(paragraph.characters).substr(start, count)),
        start_(start),
        spacing_(static_cast<int32_t>(std::lround(spacing * kFraction))) {}

  TextLine Shape() {
    std::vector<TextRun> runs = Runs();
    OrderRuns(runs);
    buffer_.reset(shaping_.hb_buffer_create());
    for (const TextRun& run : runs) ShapeRun(run);
    line_.width = std::max(pen_, 0);
    return std::move(line_);
  }

 private:
  // Whether a character belongs to the preceding one: marks, joiners, variation selectors.
  bool Continues(char32_t c) const {
    const auto category =
        shaping_.hb_unicode_general_category(shaping_.hb_unicode_funcs_get_default(), c);
    return category == HB_UNICODE_GENERAL_CATEGORY_NON_SPACING_MARK ||
           category == HB_UNICODE_GENERAL_CATEGORY_ENCLOSING_MARK ||
           category == HB_UNICODE_GENERAL_CATEGORY_SPACING_MARK ||
           category == HB_UNICODE_GENERAL_CATEGORY_FORMAT;
  }
  bool IsFormat(char32_t c) const {
    return shaping_.hb_unicode_general_category(shaping_.hb_unicode_funcs_get_default(), c) ==
           HB_UNICODE_GENERAL_CATEGORY_FORMAT;
  }

  // The script of each character; characters without one inherit it from the preceding character.
  std::vector<hb_script_t> Scripts() const {
    std::vector<hb_script_t> scripts(text_.size());
    hb_script_t last = HB_SCRIPT_COMMON;
    for (size_t i = 0; i < text_.size(); ++i) {
      const hb_script_t own =
          shaping_.hb_unicode_script(shaping_.hb_unicode_funcs_get_default(), text_[i]);
      const bool shared = own == HB_SCRIPT_COMMON || own == HB_SCRIPT_INHERITED ||
                          own == HB_SCRIPT_UNKNOWN;
      if (!shared && last == HB_SCRIPT_COMMON) std::fill_n(scripts.begin(), i, own);
      if (!shared) last = own;
      scripts[i] = last;
    }
    return scripts;
  }

  std::vector<TextRun> Runs() {
    const int8_t* const levels = paragraph_.levels.data() + start_;
    const std::vector<hb_script_t> scripts = Scripts();
    std::vector<TextRun> runs;
    for (size_t i = 0, end = 0; i < text_.size(); i = end) {
      std::u32string visible(1, text_[i]);
      for (end = i + 1; end < text_.size() && Continues(text_[end]); ++end) {
        if (!IsFormat(text_[end])) visible += text_[end];
      }
      const size_t face = fonts_.FaceFor(visible);
      const bool more = !runs.empty() && runs.back().face == face &&
                        runs.back().script == scripts[i] && runs.back().level == levels[i];
      if (!more) runs.push_back({i, 0, face, scripts[i], levels[i]});
      runs.back().count += end - i;
    }
    return runs;
  }

  // Rule L2: from the highest level down to the lowest odd one, reverses all runs at that
  // level or higher.
  static void OrderRuns(std::vector<TextRun>& runs) {
    int8_t highest = 0;
    for (const TextRun& run : runs) highest = std::max(highest, run.level);
    for (int8_t level = highest; level > 0; --level) {
      for (size_t i = 0; i < runs.size(); ++i) {
        size_t end = i;
        while (end < runs.size() && runs[end].level >= level) ++end;
        std::reverse(runs.begin() + static_cast<ptrdiff_t>(i),
                     runs.begin() + static_cast<ptrdiff_t>(end));
        i = std::max(i, end);
      }
    }
  }

  void ShapeRun(const TextRun& run) {
    hb_buffer_t* const buffer = buffer_.get();
    shaping_.hb_buffer_clear_contents(buffer);
    // all of the paragraph, as letters join those beyond a run
    const std::u32string& all = paragraph_.characters;
    shaping_.hb_buffer_add_utf32(
        buffer, reinterpret_cast<const uint32_t*>(all.data()), static_cast<int>(all.size()),
        static_cast<unsigned>(start_ + run.start), static_cast<int>(run.count));
    shaping_.hb_buffer_set_direction(buffer,
                                     run.level % 2 != 0 ? HB_DIRECTION_RTL : HB_DIRECTION_LTR);
    shaping_.hb_buffer_set_script(buffer, run.script);
    shaping_.hb_buffer_guess_segment_properties(buffer);  // the language
    shaping_.hb_shape(fonts_.Shaper(run.face), buffer, nullptr, 0);
    unsigned count = 0;
    const hb_glyph_info_t* const glyphs = shaping_.hb_buffer_get_glyph_infos(buffer, &count);
    const hb_glyph_position_t* const places =
        shaping_.hb_buffer_get_glyph_positions(buffer, &count);
    for (unsigned i = 0; i < count; ++i) Put(run.face, glyphs[i], places[i]);
  }

  void Put(size_t face, const hb_glyph_info_t& info, const hb_glyph_position_t& place) {
    const uint32_t glyph = info.codepoint;
    const bool box = glyph == 0;
    const int32_t advance =
        box ? static_cast<int32_t>(fonts_.Em() * kBoxAdvance * kFraction) : place.x_advance;
    line_.glyphs.push_back({box ? PlacedGlyph::kBox : static_cast<int32_t>(face), glyph,
                            pen_ + place.x_offset, place.y_offset, info.cluster});
    pen_ += advance == 0 ? 0 : advance + spacing_;
  }

  struct BufferDeleter {
    void operator()(hb_buffer_t* buffer) const { LoadedHarfBuzz()->hb_buffer_destroy(buffer); }
  };
  FontFaces& fonts_;
  const HarfBuzz& shaping_;
  const TextParagraph& paragraph_;
  const std::u32string_view text_;  // of the line
  const size_t start_;              // of the line in the paragraph
  const int32_t spacing_;
  std::unique_ptr<hb_buffer_t, BufferDeleter> buffer_;
  int32_t pen_ = 0;
  TextLine line_;
};

}  // namespace

TextParagraph ReadParagraph(std::string_view text) {
  TextParagraph paragraph{.characters = Characters(text), .levels = {}};
  paragraph.levels = Levels(paragraph.characters);
  return paragraph;
}

TextLine ShapeLine(FontFaces& fonts, const TextParagraph& paragraph, size_t start, size_t count,
                   double spacing) {
  return Shaper(fonts, paragraph, start, count, spacing).Shape();
}

}  // namespace fotomill
