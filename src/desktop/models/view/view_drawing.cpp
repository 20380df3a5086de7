#include "desktop/models/view/view_drawing.h"

#include <algorithm>
#include <array>
#include <vector>

#include "picture/packed_image.h"
#include "processing/color/blend.h"
#include "processing/pixel_rows.h"

namespace fotomill::desktop {

namespace {

// Positions are in 1/65536 of a source pixel.
using Positions = std::vector<int64_t>;

// Source positions for `count` shown pixels from `first`.
Positions PositionsOf(int32_t first, int32_t count, int32_t shown, int32_t size, bool between) {
  Positions positions(static_cast<size_t>(count));
  const double step = static_cast<double>(size) / shown;
  const double last = size - (between ? 1.0 : 1.0 / 65536);
  for (int32_t i = 0; i < count; ++i) {
    const double position = (first + i + 0.5) * step - (between ? 0.5 : 0);
    positions[static_cast<size_t>(i)] =
        static_cast<int64_t>(std::clamp(position, 0.0, last) * 65536);
  }
  return positions;
}

// Two rows of a picture, and a line's position between them.
struct RowPair {
  const uint8_t *upper, *lower;
  int32_t v;  // weight of the lower row, in 1/256

  RowPair(const PackedImage& image, int64_t row)
      : upper(image.Row(static_cast<int32_t>(row >> 16)).data()),
        lower(image.Row(std::min(static_cast<int32_t>(row >> 16) + 1, image.Height() - 1)).data()),
        v(static_cast<int32_t>(row & 0xffff) >> 8) {}
};

// The columns next to a position, and the weight of the right one, in 1/256.
struct ColumnPair {
  int32_t left, right, u;

  ColumnPair(int64_t column, int32_t width)
      : left(static_cast<int32_t>(column >> 16)),
        right(std::min(left + 1, width - 1)),
        u(static_cast<int32_t>(column & 0xffff) >> 8) {}
};

// A line interpolated between two rows of bytes, times 256, for the columns needed. Blending whole
// rows is fast.
class LineBetween {
 public:
  void Set(const RowPair& rows, const Positions& columns, int32_t width, int32_t channels) {
    channels_ = channels;
    first_ = channels * static_cast<int32_t>(columns.front() >> 16);
    const int32_t end = channels * std::min(static_cast<int32_t>(columns.back() >> 16) + 2, width);
    sums_.resize(static_cast<size_t>(end - first_));
    for (int32_t i = first_; i < end; ++i) {
      sums_[static_cast<size_t>(i - first_)] =
          static_cast<uint16_t>(rows.upper[i] * (256 - rows.v) + rows.lower[i] * rows.v);
    }
  }
  const uint16_t* At(int32_t column) const { return sums_.data() + (channels_ * column - first_); }

 private:
  std::vector<uint16_t> sums_;
  int32_t channels_ = 0, first_ = 0;
};

inline uint8_t* DrawPixelBetween(const LineBetween& line, const ColumnPair& at, uint8_t* rgb) {
  const uint16_t *left = line.At(at.left), *right = line.At(at.right);
  for (int channel = 2; channel >= 0; --channel) {
    *rgb++ =
        static_cast<uint8_t>((left[channel] * (256 - at.u) + right[channel] * at.u + 32768) >> 16);
  }
  return rgb;
}

// The same for pixels with alpha: colors are weighted by alpha, so that transparent pixels do not
// contribute.
uint8_t* BlendPixelBetween(const RowPair& rows, const RowPair& alphas, const ColumnPair& at,
                           const uint8_t* behind, uint8_t* rgb) {
  constexpr uint32_t kWhole = 65536 * 255;  // weight of an opaque pixel
  const auto weight = [](int32_t across, int32_t down, uint8_t alpha) {
    return static_cast<uint32_t>(across * down * alpha);
  };
  const uint32_t upperLeft = weight(256 - at.u, 256 - rows.v, alphas.upper[at.left]);
  const uint32_t upperRight = weight(at.u, 256 - rows.v, alphas.upper[at.right]);
  const uint32_t lowerLeft = weight(256 - at.u, rows.v, alphas.lower[at.left]);
  const uint32_t lowerRight = weight(at.u, rows.v, alphas.lower[at.right]);
  const uint32_t through = kWhole - upperLeft - upperRight - lowerLeft - lowerRight;
  for (int32_t channel = 2; channel >= 0; --channel) {
    const int32_t left = 3 * at.left + channel, right = 3 * at.right + channel;
    const uint32_t sum = upperLeft * rows.upper[left] + upperRight * rows.upper[right] +
                         lowerLeft * rows.lower[left] + lowerRight * rows.lower[right];
    *rgb++ = static_cast<uint8_t>((sum + through * *behind++ + kWhole / 2) / kWhole);
  }
  return rgb;
}

// Draws lines with bilinear interpolation.
class BetweenPixels {
 public:
  BetweenPixels(const ViewSource& source, const Positions& columns)
      : source_(source), columns_(columns) {}

  void Draw(int64_t row, uint8_t* rgb) {
    const int32_t width = source_.image.Width();
    colors_.Set(RowPair(source_.image, row), columns_, width, 3);
    for (const int64_t column : columns_)
      rgb = DrawPixelBetween(colors_, ColumnPair(column, width), rgb);
  }

  void Blend(int64_t row, const uint8_t* behind, uint8_t* rgb) {
    constexpr uint16_t kOpaque = 255 * 256;
    const int32_t width = source_.image.Width();
    const RowPair rows(source_.image, row), alphaRows(source_.alpha, row);
    colors_.Set(rows, columns_, width, 3);
    alphas_.Set(alphaRows, columns_, width, 1);
    for (const int64_t column : columns_) {
      const ColumnPair at(column, width);
      const uint16_t left = *alphas_.At(at.left), right = *alphas_.At(at.right);
      if (left == kOpaque && right == kOpaque) {
        rgb = DrawPixelBetween(colors_, at, rgb);
      } else if (left == 0 && right == 0) {
        rgb = std::copy_n(behind, 3, rgb);
      } else {
        rgb = BlendPixelBetween(rows, alphaRows, at, behind, rgb);
      }
      behind += 3;
    }
  }

 private:
  const ViewSource source_;
  const Positions& columns_;
  LineBetween colors_, alphas_;
};

void DrawNearest(const uint8_t* bgr, const Positions& columns, uint8_t* rgb) {
  for (const int64_t column : columns) {
    const uint8_t* pixel = bgr + 3 * (column >> 16);
    for (int channel = 2; channel >= 0; --channel) *rgb++ = pixel[channel];
  }
}

void BlendNearest(const uint8_t* bgr, const uint8_t* alpha, const Positions& columns,
                  const uint8_t* behind, uint8_t* rgb) {
  for (const int64_t column : columns) {
    const uint8_t* pixel = bgr + 3 * (column >> 16);
    for (int channel = 2; channel >= 0; --channel)
      *rgb++ = Blend(*behind++, pixel[channel], alpha[column >> 16]);
  }
}

// Two background rows: one for lines whose squares start with the first color, one for the other.
class RowsBehind {
 public:
  RowsBehind(const Backdrop& backdrop, int32_t left, int32_t width)
      : side_(backdrop.squares ? backdrop.side : 1) {
    for (int32_t phase = 0; phase < 2; ++phase) {
      for (int32_t x = left; x < left + width; ++x) {
        const Color color =
            backdrop.squares ? backdrop.square[(x / side_ + phase) & 1] : backdrop.around;
        for (int shift = 0; shift < 24; shift += 8)
          rows_[phase].push_back(static_cast<uint8_t>(color >> shift));
      }
    }
  }
  const uint8_t* Row(int32_t y) const { return rows_[y / side_ & 1].data(); }

 private:
  int32_t side_;
  std::array<std::vector<uint8_t>, 2> rows_;
};

}  // namespace

void DrawView(const ViewSource& source, const ViewTransform& transform, const Backdrop& backdrop,
              bool smooth, RgbImage& canvas) {
  const Rectangle shown{transform.X(), transform.Y(), transform.ShownWidth(),
                        transform.ShownHeight()};
  const bool covered = shown.x <= 0 && shown.y <= 0 && shown.x + shown.width >= canvas.width &&
                       shown.y + shown.height >= canvas.height;
  if (!covered) canvas = FilledImage(canvas.width, canvas.height, backdrop.around);
  DrawPart(source, shown, backdrop, smooth, canvas);
}

void DrawPart(const ViewSource& source, const Rectangle& shown, const Backdrop& backdrop,
              bool smooth, RgbImage& canvas) {
  const PackedImage& image = source.image;
  const int32_t left = std::max(shown.x, 0), right = std::min(shown.x + shown.width, canvas.width);
  const int32_t top = std::max(shown.y, 0),
                bottom = std::min(shown.y + shown.height, canvas.height);
  if (left >= right || top >= bottom || image.Empty() || image.Bits() != 24 || canvas.Empty())
    return;
  const bool same = image.Width() == shown.width && image.Height() == shown.height;
  const bool between = smooth && !same;
  const bool opaque = source.alpha.Empty();
  const auto columns =
      PositionsOf(left - shown.x, right - left, shown.width, image.Width(), between);
  const auto rows = PositionsOf(top - shown.y, bottom - top, shown.height, image.Height(), between);
  const RowsBehind behind(backdrop, left, opaque ? 0 : right - left);
  BetweenPixels pixels(source, columns);
  for (int32_t line = top; line < bottom; ++line) {
    uint8_t* const rgb = canvas.Row(line) + 3 * left;
    const int64_t row = rows[static_cast<size_t>(line - top)];
    const int32_t nearest = static_cast<int32_t>(row >> 16);
    const uint8_t* const bgr = image.Row(nearest).data();
    if (between && opaque) {
      pixels.Draw(row, rgb);
    } else if (between) {
      pixels.Blend(row, behind.Row(line), rgb);
    } else if (!opaque) {
      BlendNearest(bgr, source.alpha.Row(nearest).data(), columns, behind.Row(line), rgb);
    } else if (same) {
      SwapColors(bgr + 3 * (left - shown.x), static_cast<size_t>(right - left), rgb);
    } else {
      DrawNearest(bgr, columns, rgb);
    }
  }
}

}  // namespace fotomill::desktop
