#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// A font of the system for short lines of text in pictures. Belongs to one thread.
class CaptionFont {
 public:
  CaptionFont();  // has no font until one is opened
  ~CaptionFont();
  CaptionFont(const CaptionFont&) = delete;
  CaptionFont& operator=(const CaptionFont&) = delete;

  // Opens the font of a family ("Arial") so that its lines are `height` pixels high, from the top
  // of the tallest letters to the bottom of the deepest. Where the system has no such family, a
  // plain sans serif takes its place, the one of the same widths first. ResourceError if there is
  // no font at all.
  Status Open(std::string_view family, int32_t height);
  // Pixels that a text is wide.
  int32_t WidthOf(std::string_view text);
  // The text, with an ellipsis in place of its end where it would be wider than `width`.
  std::string Fitted(std::string_view text, int32_t width);
  // Draws one line into a 24-bit image: centred between the sides of `band`, its top at the band's,
  // smoothed against what is there, and nothing outside the band. Letters that the font lacks come
  // from other fonts.
  void DrawCentred(PackedImage& image, const Rectangle& band, std::string_view text, Color color);

 private:
  struct Fonts;
  std::unique_ptr<Fonts> fonts_;
};

}  // namespace fotomill
