#include "processing/filters/mosaic.h"

#include <algorithm>
#include <array>
#include <vector>

#include "processing/geometry/cut.h"
#include "processing/padded_rows.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 32;

void AverageBlock(PictureRecord& picture, const Rectangle& block) {
  const bool hasAlpha = !picture.alpha.Empty();
  uint64_t sums[3] = {}, weight = 0;
  for (int32_t y = block.y; y < block.y + block.height; ++y) {
    const uint8_t* bgr = picture.image.Row(y).data() + 3 * static_cast<size_t>(block.x);
    const uint8_t* opacity = hasAlpha ? picture.alpha.Row(y).data() + block.x : nullptr;
    for (int32_t x = 0; x < block.width; ++x, bgr += 3) {
      const uint64_t own = hasAlpha ? opacity[x] : 1;
      for (int c = 0; c < 3; ++c) sums[c] += own * bgr[c];
      weight += own;
    }
  }
  uint8_t mean[3] = {};
  for (int c = 0; c < 3 && weight > 0; ++c)
    mean[c] = static_cast<uint8_t>((sums[c] + weight / 2) / weight);
  const uint64_t count = static_cast<uint64_t>(block.width) * static_cast<uint64_t>(block.height);
  for (int32_t y = block.y; y < block.y + block.height; ++y) {
    uint8_t* bgr = picture.image.Row(y).data() + 3 * static_cast<size_t>(block.x);
    for (int32_t x = 0; x < block.width; ++x, bgr += 3) std::copy_n(mean, 3, bgr);
    if (hasAlpha) {
      std::fill_n(picture.alpha.Row(y).data() + block.x, block.width,
                  static_cast<uint8_t>((weight + count / 2) / count));
    }
  }
}

// Sums of a window's pixels, by luma range.
struct Ranges {
  struct Sum {
    uint32_t weight, blue, green, red;
  };
  std::array<Sum, kMostOilLevels> sums;
  int32_t levels;

  void Change(const uint8_t* bgr, uint32_t weight) {
    const int32_t luma = (114 * bgr[0] + 587 * bgr[1] + 299 * bgr[2] + 500) / 1000;
    Sum& sum = sums[static_cast<size_t>(luma * levels / 256)];
    sum.weight += weight;
    sum.blue += weight * bgr[0];
    sum.green += weight * bgr[1];
    sum.red += weight * bgr[2];
  }
  const Sum& Most() const {
    const Sum* most = sums.data();
    for (int32_t i = 1; i < levels; ++i) {
      if (sums[static_cast<size_t>(i)].weight > most->weight) most = &sums[static_cast<size_t>(i)];
    }
    return *most;
  }
};

struct OilBand {
  PaddedRows colors, alpha;
  Ranges ranges;
  int32_t radius;
  bool hasAlpha;

  // Adds a column to the window of row y, or subtracts it; unsigned wraparound cancels out.
  template <bool subtract>
  void Column(int32_t x, int32_t y) {
    for (int32_t j = y - radius; j <= y + radius; ++j) {
      const uint32_t weight = hasAlpha ? alpha.Row(j)[x] : 1;
      ranges.Change(colors.Row(j) + static_cast<std::ptrdiff_t>(3) * x,
                    subtract ? 0 - weight : weight);
    }
  }

  void Row(int32_t y, int32_t width, uint8_t* out) {
    ranges.sums.fill({});
    for (int32_t x = -radius; x < radius; ++x) Column<false>(x, y);
    for (int32_t x = 0; x < width; ++x, out += 3) {
      Column<false>(x + radius, y);
      const Ranges::Sum& most = ranges.Most();
      const uint8_t* own = colors.Row(y) + static_cast<std::ptrdiff_t>(3) * x;
      const auto mean = [&](uint32_t sum, uint8_t level) {
        return most.weight == 0 ? level
                                : static_cast<uint8_t>((sum + most.weight / 2) / most.weight);
      };
      out[0] = mean(most.blue, own[0]);
      out[1] = mean(most.green, own[1]);
      out[2] = mean(most.red, own[2]);
      Column<true>(x - radius, y);
    }
  }
};

// Position of the eyes within a detected face, in percent of its height.
constexpr int64_t kEyesFrom = 15, kEyesTo = 60;

struct Point {
  int32_t x, y;
};

// Removes the connected marked pixels around `start` from the mask. Returns whether they form a
// compact spot: no side longer than `widest` or twice the other, and at least half filled.
bool TakeSpot(PackedImage& mask, int32_t width, int32_t height, Point start, int32_t widest,
              std::vector<Point>& spot) {
  spot.assign(1, start);
  mask.Row(start.y).data()[start.x] = 0;
  Point least = start, most = start;
  for (size_t i = 0; i < spot.size(); ++i) {
    const Point at = spot[i];
    least = {std::min(least.x, at.x), std::min(least.y, at.y)};
    most = {std::max(most.x, at.x), std::max(most.y, at.y)};
    for (const Point next : {Point{at.x - 1, at.y}, Point{at.x + 1, at.y}, Point{at.x, at.y - 1},
                             Point{at.x, at.y + 1}}) {
      if (next.x < 0 || next.y < 0 || next.x >= width || next.y >= height) continue;
      uint8_t& mark = mask.Row(next.y).data()[next.x];
      if (mark == 0) continue;
      mark = 0;
      spot.push_back(next);
    }
  }
  const int32_t across = most.x - least.x + 1, down = most.y - least.y + 1;
  return std::max(across, down) <= std::min(widest, 2 * std::min(across, down)) &&
         2 * spot.size() >= static_cast<size_t>(across) * static_cast<size_t>(down);
}

}  // namespace

Status MosaicPicture(PictureRecord& picture, const Rectangle& area, int32_t side,
                     const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  if (area.width <= 0 || area.height <= 0) return Status::Ok;
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const Rectangle seen = Clipped(area, width, height);
  if (seen.width == 0) return Status::Ok;
  const int64_t firstRow = (static_cast<int64_t>(seen.y) - area.y) / side,
                firstColumn = (static_cast<int64_t>(seen.x) - area.x) / side;
  const auto count = static_cast<int32_t>(
      (static_cast<int64_t>(seen.y) + seen.height - 1 - area.y) / side - firstRow + 1);
  const int64_t right = static_cast<int64_t>(seen.x) + seen.width;
  return ForBands(count, 1, work, [&](int32_t first, int32_t end) {
    for (int32_t i = first; i < end; ++i) {
      const auto top = static_cast<int32_t>(area.y + (firstRow + i) * side);
      for (int64_t left = area.x + firstColumn * side; left < right; left += side) {
        const Rectangle wanted =
            Clipped({static_cast<int32_t>(left) - seen.x, top - seen.y, side, side}, seen.width,
                    seen.height);
        if (wanted.width > 0)
          AverageBlock(picture,
                       {wanted.x + seen.x, wanted.y + seen.y, wanted.width, wanted.height});
      }
    }
    return Status::Ok;
  });
}

Status RemoveRedEye(PictureRecord& picture, const Rectangle& area, double ratio) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const Rectangle seen = Clipped(area, picture.image.Width(), picture.image.Height());
  for (int32_t y = seen.y; y < seen.y + seen.height; ++y) {
    uint8_t* bgr = picture.image.Row(y).data() + 3 * static_cast<size_t>(seen.x);
    for (int32_t x = 0; x < seen.width; ++x, bgr += 3) {
      const int32_t others = bgr[0] + bgr[1];
      if (2 * bgr[2] > ratio * others) bgr[2] = static_cast<uint8_t>((others + 1) / 2);
    }
  }
  return Status::Ok;
}

Status RemoveRedEyesOfFace(PictureRecord& picture, const Rectangle& face, const Rectangle& area,
                           double ratio) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const auto part = [&](int64_t percent) {
    return static_cast<int32_t>(face.height * percent / 100);
  };
  const int32_t left = std::max({face.x, area.x, 0});
  const int32_t top = std::max({face.y + part(kEyesFrom), area.y, 0});
  const int32_t right = std::min({face.x + face.width, area.x + area.width, picture.image.Width()});
  const int32_t bottom =
      std::min({face.y + part(kEyesTo), area.y + area.height, picture.image.Height()});
  if (right <= left || bottom <= top) return Status::Ok;
  const int32_t width = right - left, height = bottom - top;
  PackedImage mask;
  RETURN_IF_BAD(NewAlphaPlane(width, height, mask));
  for (int32_t y = 0; y < height; ++y) {
    const uint8_t* bgr = picture.image.Row(top + y).data() + 3 * static_cast<size_t>(left);
    uint8_t* const row = mask.Row(y).data();
    for (int32_t x = 0; x < width; ++x, bgr += 3)
      row[x] = bgr[2] > ratio * std::max(bgr[0], bgr[1]) ? 1 : 0;
  }
  const int32_t widest = std::max(face.width / 5, 2);
  std::vector<Point> spot;
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x) {
      if (mask.Row(y).data()[x] == 0 || !TakeSpot(mask, width, height, {x, y}, widest, spot))
        continue;
      for (const Point& at : spot) {
        uint8_t* const bgr =
            picture.image.Row(top + at.y).data() + 3 * static_cast<size_t>(left + at.x);
        bgr[2] = static_cast<uint8_t>((bgr[0] + bgr[1] + 1) / 2);
      }
    }
  }
  return Status::Ok;
}

Status OilPicture(PictureRecord& picture, int32_t radius, int32_t levels, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  const auto paint = [&](int32_t first, int32_t end) {
    OilBand band;
    band.radius = radius;
    band.ranges.levels = levels;
    band.hasAlpha = !picture.alpha.Empty();
    RETURN_IF_BAD(band.colors.Open(picture.image, radius));
    if (band.hasAlpha) RETURN_IF_BAD(band.alpha.Open(picture.alpha, radius));
    for (int32_t y = first; y < end; ++y) band.Row(y, width, image.Row(y).data());
    return Status::Ok;
  };
  RETURN_IF_BAD(ForBands(height, kLeastRows, work, paint));
  picture.image = std::move(image);
  return Status::Ok;
}

}  // namespace fotomill
