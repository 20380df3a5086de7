#include "processing/palette/dither.h"

#include <algorithm>
#include <cstdlib>

#include "processing/color/nearest_color.h"

namespace fotomill {

namespace {

// Bayer matrix: the order, from 0, in which the pixels of a square of `size` x `size` (2, 4 or 8)
// turn white.
constexpr int32_t PatternOrder(int32_t size, int32_t x, int32_t y) {
  int32_t order = 0;
  for (int32_t bit = 0; 1 << bit < size; ++bit) {
    const int32_t across = x >> bit & 1, down = y >> bit & 1;
    order = order << 2 | (across ^ down) << 1 | down;
  }
  return order;
}
static_assert(PatternOrder(8, 0, 0) == 0 && PatternOrder(8, 1, 0) == 32 &&
              PatternOrder(8, 0, 1) == 48 && PatternOrder(8, 1, 1) == 16);
static_assert(PatternOrder(2, 1, 0) == 2 && PatternOrder(2, 0, 1) == 3 &&
              PatternOrder(2, 1, 1) == 1);

// Number of columns for which a pattern row is precomputed.
constexpr int32_t kColumns = 8;

constexpr int32_t Clamp(int32_t value) { return std::clamp(value, 0, 255); }

}  // namespace

void MapRow(const uint8_t* bgr, int32_t width, NearestColor& nearest, uint8_t* indices) {
  for (int32_t x = 0; x < width; ++x, bgr += 3) indices[x] = nearest.Find(bgr[0], bgr[1], bgr[2]);
}

void OrderRow(const uint8_t* bgr, int32_t width, int32_t y, int32_t size, int32_t spread,
              NearestColor& nearest, uint8_t* indices) {
  const int32_t places = size * size;
  int32_t offsets[kColumns];
  for (int32_t i = 0; i < kColumns; ++i)
    offsets[i] = (2 * PatternOrder(size, i, y) - (places - 1)) * spread / (2 * places);
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    const int32_t offset = offsets[x & 7];
    indices[x] =
        nearest.Find(Clamp(bgr[0] + offset), Clamp(bgr[1] + offset), Clamp(bgr[2] + offset));
  }
}

void OrderGrayRow(const uint8_t* gray, int32_t width, int32_t y, int32_t size, uint8_t* indices) {
  // The pattern's shades, one more than it has elements, are evenly spaced from black to white: 0
  // is never white, 255 always is.
  int32_t limits[kColumns];
  for (int32_t i = 0; i < kColumns; ++i)
    limits[i] = (2 * PatternOrder(size, i, y) + 1) * 255 / (2 * size * size) + 1;
  for (int32_t x = 0; x < width; ++x) indices[x] = gray[x] >= limits[x & 7];
}

void CutGrayRow(const uint8_t* gray, int32_t width, int32_t threshold, uint8_t* indices) {
  for (int32_t x = 0; x < width; ++x) indices[x] = gray[x] >= threshold;
}

Status ErrorDiffuser::Open(int32_t width, bool serpentine, int32_t handedOn) {
  const uint64_t bytes = 3 * (static_cast<uint64_t>(width) + 2) * sizeof(int32_t);
  if (!errors_.Allocate(bytes)) return Status::MemoryAllocationError;
  below_ = errors_.Items<int32_t>().data() + 3;
  width_ = width;
  serpentine_ = serpentine;
  handedOn_ = handedOn;
  backwards_ = false;
  return Status::Ok;
}

void ErrorDiffuser::Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices) {
  backwards_ ? DiffuseRow<-1>(bgr, nearest, indices) : DiffuseRow<1>(bgr, nearest, indices);
  backwards_ = serpentine_ && !backwards_;
}

void ErrorDiffuser::GrayRow(const uint8_t* gray, uint8_t* indices) {
  backwards_ ? DiffuseGrayRow<-1>(gray, indices) : DiffuseGrayRow<1>(gray, indices);
  backwards_ = serpentine_ && !backwards_;
}

// A pixel's error is diffused by 7/16 ahead, and by 3/16, 5/16 and 1/16 down: below the previous
// pixel, below itself and below the next. The error from above is read before the current row
// overwrites its position.
template <int step>
void ErrorDiffuser::DiffuseRow(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices) {
  int32_t ahead[3] = {}, belowLast[3] = {}, belowHere[3] = {};
  int32_t x = step > 0 ? 0 : width_ - 1;
  for (int32_t left = width_; left > 0; --left, x += step) {
    int32_t* below = below_ + 3 * static_cast<std::ptrdiff_t>(x);
    int32_t wanted[3];
    for (int c = 0; c < 3; ++c)
      wanted[c] =
          Clamp(bgr[3 * static_cast<std::ptrdiff_t>(x) + c] + ((ahead[c] + below[c] + 128) >> 8));
    const uint8_t index = nearest.Find(wanted[0], wanted[1], wanted[2]);
    indices[x] = index;
    const int16_t* color = nearest.ColorOf(index);
    for (int c = 0; c < 3; ++c) {
      const int32_t error = handedOn_ * (wanted[c] - color[c]);
      ahead[c] = 7 * error;
      below[c - 3 * step] = belowLast[c] + 3 * error;
      belowLast[c] = belowHere[c] + 5 * error;
      belowHere[c] = error;
    }
  }
  for (int c = 0; c < 3; ++c) below_[3 * static_cast<std::ptrdiff_t>(x - step) + c] = belowLast[c];
}

template <int step>
void ErrorDiffuser::DiffuseGrayRow(const uint8_t* gray, uint8_t* indices) {
  int32_t ahead = 0, belowLast = 0, belowHere = 0;
  int32_t x = step > 0 ? 0 : width_ - 1;
  for (int32_t left = width_; left > 0; --left, x += step) {
    const int32_t wanted = gray[x] + ((ahead + below_[x] + 128) >> 8);
    const bool white = wanted >= 128;
    indices[x] = white;
    const int32_t error = handedOn_ * (wanted - (white ? 255 : 0));
    ahead = 7 * error;
    below_[x - step] = belowLast + 3 * error;
    belowLast = belowHere + 5 * error;
    belowHere = error;
  }
  below_[x - step] = belowLast;
}

}  // namespace fotomill
