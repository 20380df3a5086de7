#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"

namespace fotomill {

// Positions of the parts of a Photo CD file. For the layout see pcd_file.cpp.

inline constexpr uint64_t kPcdSector = 2048;              // bytes
inline constexpr uint64_t kPcdHeader = 1 * kPcdSector;    // image information
inline constexpr uint64_t kPcdDeltas = 384 * kPcdSector;  // everything after the direct resolutions

// The resolutions of a picture, each twice the previous one along both edges.
inline constexpr int32_t kPcdPlainSizes = 3, kPcdSizes = 5;
// Pixels of size 0, 1, ..., before rotation.
constexpr int32_t PcdWidth(int32_t size) { return 192 << size; }
constexpr int32_t PcdHeight(int32_t size) { return 128 << size; }  // pixels
// Bytes of a directly stored size: luma, and two chroma planes with a quarter of its samples.
constexpr uint64_t PcdPlainBytes(int32_t size) {
  return static_cast<uint64_t>(PcdWidth(size)) * static_cast<uint64_t>(PcdHeight(size)) * 3 / 2;
}

// The parsed headers of a file.
struct PcdFile {
  bool overview = false;
  int32_t pictures = 1;   // of an overview
  int32_t turns = 0;      // 90-degree rotations to the left that make the picture upright
  int32_t largest = 0;    // the largest available resolution
  uint64_t tables16 = 0;  // offset of the code tables of the largest resolution

  // Offset of the samples of a directly stored resolution.
  uint64_t Plain(int32_t size, int32_t picture) const;
};

// Ok; DamagedFile, FileReadError if even the smallest resolution is truncated, NoImages.
Status ParsePcd(std::span<const uint8_t> file, PcdFile& pcd);

}  // namespace fotomill
