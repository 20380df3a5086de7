#include "formats/photocd/pcd_planes.h"

#include <algorithm>

namespace fotomill {

void ReadPlainPlanes(std::span<const uint8_t> data, int32_t width, int32_t height,
                     PcdPlanes& planes) {
  planes.luma.Make(width, height);
  for (PcdPlane& chroma : planes.chroma) chroma.Make(width / 2, height / 2);
  const auto whole = static_cast<size_t>(width), half = whole / 2;
  const uint8_t* at = data.data();
  for (int32_t y = 0; y < height / 2; ++y) {
    std::copy_n(at, 2 * whole, planes.luma.Row(2 * y));
    std::copy_n(at + 2 * whole, half, planes.chroma[0].Row(y));
    std::copy_n(at + 2 * whole + half, half, planes.chroma[1].Row(y));
    at += 3 * whole;
  }
}

void DoublePcdRow(const uint8_t* row, const uint8_t* next, int32_t width, uint8_t* doubled) {
  const auto last = static_cast<size_t>(width - 1);
  for (size_t x = 0; x < last; ++x) {
    const int32_t here = row[x] + next[x];
    doubled[2 * x] = static_cast<uint8_t>((here + 1) >> 1);
    doubled[2 * x + 1] = static_cast<uint8_t>((here + row[x + 1] + next[x + 1] + 2) >> 2);
  }
  doubled[2 * last] = doubled[2 * last + 1] =
      static_cast<uint8_t>((row[last] + next[last] + 1) >> 1);
}

void DoubledPcdRow(const PcdPlane& plane, int32_t y, uint8_t* doubled) {
  const uint8_t* row = plane.Row(y / 2);
  const bool between = y % 2 == 1 && y / 2 + 1 < plane.height;
  DoublePcdRow(row, between ? plane.Row(y / 2 + 1) : row, plane.width, doubled);
}

PcdPlane DoublePcdPlane(const PcdPlane& plane) {
  PcdPlane doubled;
  doubled.Make(2 * plane.width, 2 * plane.height);
  for (int32_t y = 0; y < doubled.height; ++y) DoubledPcdRow(plane, y, doubled.Row(y));
  return doubled;
}

}  // namespace fotomill
