#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// Samples of one component, row by row.
struct PcdPlane {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> samples;

  // Allocates the plane, in samples.
  void Make(int32_t planeWidth, int32_t planeHeight) {
    width = planeWidth;
    height = planeHeight;
    samples.resize(static_cast<size_t>(width) * static_cast<size_t>(height));
  }
  // Row y from the top, `width` samples.
  uint8_t* Row(int32_t y) {
    return samples.data() + static_cast<size_t>(y) * static_cast<size_t>(width);
  }
  const uint8_t* Row(int32_t y) const {
    return samples.data() + static_cast<size_t>(y) * static_cast<size_t>(width);
  }
};

// Luma, and two chroma planes of a half or a quarter of its size.
struct PcdPlanes {
  PcdPlane luma;
  std::array<PcdPlane, 2> chroma;
};

// Reads directly stored samples of a picture of width x height, in the order described in
// pcd_file.cpp. `data` must contain all of them.
void ReadPlainPlanes(std::span<const uint8_t> data, int32_t width, int32_t height,
                     PcdPlanes& planes);

// A row of twice the width: the average of `row` and `next`, the one below it, with interpolated
// samples in between. If both are the same row, it is only doubled horizontally.
void DoublePcdRow(const uint8_t* row, const uint8_t* next, int32_t width, uint8_t* doubled);
// Row `y` of a plane of twice the width and height.
void DoubledPcdRow(const PcdPlane& plane, int32_t y, uint8_t* doubled);
// The plane at twice the width and height.
PcdPlane DoublePcdPlane(const PcdPlane& plane);

}  // namespace fotomill
