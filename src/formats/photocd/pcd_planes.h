#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// Samples of one kind, row after row.
struct PcdPlane {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> samples;

  void Make(int32_t planeWidth, int32_t planeHeight) {
    width = planeWidth;
    height = planeHeight;
    samples.resize(static_cast<size_t>(width) * static_cast<size_t>(height));
  }
  uint8_t* Row(int32_t y) {
    return samples.data() + static_cast<size_t>(y) * static_cast<size_t>(width);
  }
  const uint8_t* Row(int32_t y) const {
    return samples.data() + static_cast<size_t>(y) * static_cast<size_t>(width);
  }
};

// Luma and two chromas of half its size, or of a quarter.
struct PcdPlanes {
  PcdPlane luma;
  std::array<PcdPlane, 2> chroma;
};

// Takes the samples of a picture of width x height that are stored plainly, in the order told in
// pcd_file.cpp. `data` holds them all.
void ReadPlainPlanes(std::span<const uint8_t> data, int32_t width, int32_t height,
                     PcdPlanes& planes);

// A row of twice the samples: those of `row` and `next`, the one below it, mixed half and half, and
// means between them. With the same row twice, it is that row doubled.
void DoublePcdRow(const uint8_t* row, const uint8_t* next, int32_t width, uint8_t* doubled);
// Row `y` of a plane of twice the width and height.
void DoubledPcdRow(const PcdPlane& plane, int32_t y, uint8_t* doubled);
// The plane in twice the width and height.
PcdPlane DoublePcdPlane(const PcdPlane& plane);

}  // namespace fotomill
