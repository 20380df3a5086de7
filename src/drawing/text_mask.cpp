#include "drawing/text_mask.h"

#include "drawing/text_shaping.h"

#include FT_OUTLINE_H
#include FT_STROKER_H

#include <algorithm>
#include <cmath>
#include <numbers>
#include <type_traits>
#include <vector>

namespace fotomill {

namespace {

constexpr double kFraction = 64;  // pixel units in FreeType's coordinates
constexpr double kOne = 65536;    // 1.0 in FreeType's matrices

// Adds spans of a row; the uncovered part of a pixel keeps its value. FreeType counts rows upward.
void AddSpans(int y, int count, const FT_Span* spans, void* user) {
  auto& mask = *static_cast<PackedImage*>(user);
  uint8_t* const row = mask.Row(mask.Height() - 1 - y).data();
  for (const FT_Span& span : std::span(spans, static_cast<size_t>(count))) {
    for (int x = span.x; x < span.x + span.len; ++x) {
      const int open = (255 - row[x]) * (255 - span.coverage);
      row[x] = static_cast<uint8_t>(255 - (open + 127) / 255);
    }
  }
}

// An outline with its own points, for boxes and strokes.
struct Points {
  std::vector<FT_Vector> places;
  // The type differs between FreeType releases.
  std::vector<std::remove_pointer_t<decltype(FT_Outline::tags)>> tags;
  std::vector<std::remove_pointer_t<decltype(FT_Outline::contours)>> ends;

  Points(size_t points, size_t contours) : places(points), tags(points), ends(contours) {}
  FT_Outline Outline() {
    FT_Outline outline{};
    outline.points = places.data();
    outline.tags = tags.data();
    outline.contours = ends.data();
    return outline;
  }
};

// A frame: an outer rectangle and a hole.
Points Box(double em) {
  Points box(8, 2);
  const double thick = std::max(em / 20, 1.0), margin = em * (kBoxAdvance - kBoxWidth) / 2;
  const auto corner = [&](double inset, bool right, bool top) {
    const double x = margin + (right ? em * kBoxWidth - inset : inset);
    const double y = top ? em * kBoxHeight - inset : inset;
    return FT_Vector{std::lround(x * kFraction), std::lround(y * kFraction)};
  };
  box.places = {corner(0, false, false),     corner(0, false, true),
                corner(0, true, true),       corner(0, true, false),
                corner(thick, false, false), corner(thick, true, false),
                corner(thick, true, true),   corner(thick, false, true)};
  std::ranges::fill(box.tags, FT_CURVE_TAG_ON);
  box.ends = {3, 7};
  return box;
}

class LineDrawing {
 public:
  LineDrawing(const FontFaces& fonts, const LinePlace& place, PackedImage& mask)
      : fonts_(fonts), place_(place), mask_(mask) {
    const double radians = place.angle * std::numbers::pi / 180;
    const auto cosine = static_cast<FT_Fixed>(std::lround(std::cos(radians) * kOne)),
               sine = static_cast<FT_Fixed>(std::lround(std::sin(radians) * kOne));
    turn_ = {cosine, sine, -sine, cosine};  // y is upward
    if (place.stroke > 0 && FT_Stroker_New(fonts.Library(), &stroker_) == 0) {
      FT_Stroker_Set(stroker_, std::max(std::lround(place.stroke * kFraction), 1L),
                     FT_STROKER_LINECAP_ROUND, FT_STROKER_LINEJOIN_ROUND, 0);
    }
  }
  ~LineDrawing() {
    if (stroker_ != nullptr) FT_Stroker_Done(stroker_);
  }
  LineDrawing(const LineDrawing&) = delete;
  LineDrawing& operator=(const LineDrawing&) = delete;

  Status Draw(const PlacedGlyph& glyph) {
    if (glyph.face == PlacedGlyph::kBox) {
      Points box = Box(fonts_.Em());
      FT_Outline outline = box.Outline();
      outline.n_points = 8;
      outline.n_contours = 2;
      return DrawOutline(outline, glyph);
    }
    const FT_Face face = fonts_.Outlines(static_cast<size_t>(glyph.face));
    // Upright text is hinted vertically only, so its spacing stays even.
    const FT_Int32 load = FT_LOAD_NO_BITMAP | (place_.angle == 0 ? FT_LOAD_TARGET_LIGHT
                                                                 : FT_LOAD_NO_HINTING);
    if (FT_Load_Glyph(face, glyph.glyph, load) != 0) return Status::Ok;
    if (face->glyph->format != FT_GLYPH_FORMAT_OUTLINE) return Status::Ok;
    return DrawOutline(face->glyph->outline, glyph);
  }

 private:
  Status DrawOutline(FT_Outline& outline, const PlacedGlyph& glyph) {
    FT_Outline_Translate(&outline, glyph.x, glyph.y);
    if (place_.angle != 0) FT_Outline_Transform(&outline, &turn_);
    FT_Outline_Translate(
        &outline, std::lround(place_.x * kFraction),
        std::lround((static_cast<double>(mask_.Height()) - place_.y) * kFraction));
    return place_.stroke > 0 ? DrawEdges(outline) : Fill(outline);
  }

  Status DrawEdges(FT_Outline& outline) {
    if (stroker_ == nullptr) return Status::MemoryAllocationError;
    FT_UInt points = 0, contours = 0;
    if (outline.n_points == 0) return Status::Ok;
    if (FT_Stroker_ParseOutline(stroker_, &outline, 0) != 0 ||
        FT_Stroker_GetCounts(stroker_, &points, &contours) != 0) {
      return Status::MemoryAllocationError;
    }
    if (points > kMostPoints || contours > kMostPoints) return Status::Ok;
    Points edges(points, contours);
    FT_Outline stroked = edges.Outline();
    FT_Stroker_Export(stroker_, &stroked);
    return Fill(stroked);
  }

  Status Fill(FT_Outline& outline) {
    FT_BBox box;
    FT_Outline_Get_CBox(&outline, &box);
    const bool outside = box.xMax <= 0 || box.yMax <= 0 || box.xMin >= mask_.Width() * 64L ||
                         box.yMin >= mask_.Height() * 64L;
    if (outline.n_points == 0 || outside) return Status::Ok;
    FT_Raster_Params params{};
    params.flags = FT_RASTER_FLAG_AA | FT_RASTER_FLAG_DIRECT | FT_RASTER_FLAG_CLIP;
    params.gray_spans = AddSpans;
    params.user = &mask_;
    params.clip_box = {0, 0, std::min(mask_.Width(), kFarthest),
                       std::min(mask_.Height(), kFarthest)};
    return FT_Outline_Render(fonts_.Library(), &outline, &params) == 0
               ? Status::Ok
               : Status::MemoryAllocationError;
  }

  static constexpr FT_UInt kMostPoints = 32767;
  static constexpr int32_t kFarthest = 32767;  // spans count columns in 16 bits
  const FontFaces& fonts_;
  const LinePlace& place_;
  PackedImage& mask_;
  FT_Matrix turn_{};
  FT_Stroker stroker_ = nullptr;
};

}  // namespace

Status DrawLine(const FontFaces& fonts, const TextLine& line, const LinePlace& place,
                PackedImage& mask, const Work& work) {
  LineDrawing drawing(fonts, place, mask);
  for (const PlacedGlyph& glyph : line.glyphs) {
    if (!work.GoesOn()) return Status::FunctionCancelled;
    RETURN_IF_BAD(drawing.Draw(glyph));
  }
  return Status::Ok;
}

}  // namespace fotomill
