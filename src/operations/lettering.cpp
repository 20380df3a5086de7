#include "operations/lettering.h"

#include <algorithm>
#include <cmath>
#include <numbers>

#include "drawing/shape_mask.h"
#include "operations/backdrop.h"
#include "processing/color/overlay.h"
#include "processing/filters/blur_mask.h"

namespace fotomill {

namespace {

constexpr uint8_t kShadowAlpha = 160;
constexpr double kShadowSoftness = 2;  // sigma = shadow distance / this
constexpr double kSigmas = 3;          // a blur is invisible beyond this

Size Turned(double width, double height, double degrees) {
  const double radians = degrees * std::numbers::pi / 180;
  const double cosine = std::abs(std::cos(radians)), sine = std::abs(std::sin(radians));
  const auto edge = [](double length) {
    constexpr double kAlmost = 1e-6;  // for multiples of 90 degrees, whose cosine is not exactly 0
    return static_cast<int32_t>(std::clamp(std::ceil(length - kAlmost), 1.0, 1e9));
  };
  return {edge(width * cosine + height * sine), edge(width * sine + height * cosine)};
}

}  // namespace

std::string WithLineFeeds(std::string_view text) {
  std::string lines;
  for (size_t i = 0; i < text.size(); ++i) {
    const bool feed = text.substr(i, 2) == "\\n";
    lines += feed ? '\n' : text[i];
    if (feed) ++i;
  }
  return lines;
}

Status NewLayer(Size size, PictureRecord& layer) {
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, layer.image));
  RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, layer.alpha));
  layer.width = size.width;
  layer.height = size.height;
  layer.bitsPerPixel = 24;
  layer.alphaFlags |= kHasAlpha;
  return Status::Ok;
}

Status LetteringDrawing::Open(const Lettering& lettering, const std::string& text) {
  lettering_ = lettering;
  lettering_.outline = std::min(lettering_.outline, lettering_.em);  // wider ones hide the letters
  RETURN_IF_BAD(font_.Open(lettering.font, lettering.em));
  block_ = LayOutText(font_, text, lettering.layout);
  return Status::Ok;
}

Size LetteringDrawing::Flat() const {
  const bool edges = lettering_.box || lettering_.frame > 0;
  const double more = edges ? 2 * (lettering_.padding + lettering_.frame) : 0;
  return Turned(block_.width + more, block_.height + more, 0);
}

Size LetteringDrawing::Bounds() const {
  const Size flat = Flat();
  return Turned(flat.width, flat.height, lettering_.rotation);
}

int32_t LetteringDrawing::Reach() const {
  const double shadow = lettering_.shadow * (1 + kSigmas / kShadowSoftness);
  return static_cast<int32_t>(std::ceil(std::max(shadow, 0.0) + lettering_.outline)) + 2;
}

Status LetteringDrawing::Draw(double x, double y, const Work& work, PictureRecord& layer) const {
  const Size size{layer.image.Width(), layer.image.Height()}, flat = Flat();
  PackedImage mask;
  // Paints a color through the mask filled by `draw`.
  const auto paint = [&](const AlphaColor& color, const auto& draw) {
    RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, mask));
    if (const Status drawn = draw(); drawn != Status::Ok) return drawn;
    return PaintThroughMask(layer, mask, 0, 0, BackdropOf(color));
  };
  // The center of even sizes is between two pixels, of odd ones on a pixel.
  const Shape outer{x, y, static_cast<double>(flat.width), static_cast<double>(flat.height),
                    lettering_.rotation, 0};
  Shape inner = outer;
  inner.width -= 2 * lettering_.frame;
  inner.height -= 2 * lettering_.frame;
  const auto letters = [&](double away, double stroke) {
    return DrawTextBlock(font_, block_, {x + away, y + away, lettering_.rotation, stroke}, mask,
                         work);
  };
  const auto box = [&] { return DrawShape(outer, mask, work); };
  const auto frame = [&] {
    const Status drawn = DrawShape(outer, mask, work);
    return drawn == Status::Ok ? CutShape(inner, mask, work) : drawn;
  };
  const auto shadow = [&] {
    const Status drawn = letters(lettering_.shadow, 0);
    return drawn == Status::Ok ? BlurMask(mask, lettering_.shadow / kShadowSoftness, work) : drawn;
  };
  if (lettering_.box) RETURN_IF_BAD(paint(lettering_.boxColor, box));
  if (lettering_.frame > 0) RETURN_IF_BAD(paint(lettering_.color, frame));
  if (lettering_.shadow > 0) RETURN_IF_BAD(paint({0, 0, 0, kShadowAlpha}, shadow));
  const auto outline = [&] { return letters(0, lettering_.outline); };
  if (lettering_.outline > 0) RETURN_IF_BAD(paint(lettering_.outlineColor, outline));
  return paint(lettering_.color, [&] { return letters(0, 0); });
}

}  // namespace fotomill
