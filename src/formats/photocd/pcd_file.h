#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"

namespace fotomill {

// Where the parts of a Photo CD file are. The layout is described in pcd_file.cpp.

inline constexpr uint64_t kPcdSector = 2048;
inline constexpr uint64_t kPcdHeader = 1 * kPcdSector;    // of the image's facts
inline constexpr uint64_t kPcdDeltas = 384 * kPcdSector;  // all that comes after the plain sizes

// The sizes of one picture, each twice the one before along both edges.
inline constexpr int32_t kPcdPlainSizes = 3, kPcdSizes = 5;
constexpr int32_t PcdWidth(int32_t size) { return 192 << size; }
constexpr int32_t PcdHeight(int32_t size) { return 128 << size; }
constexpr uint64_t PcdPlainBytes(int32_t size) {
  return static_cast<uint64_t>(PcdWidth(size)) * static_cast<uint64_t>(PcdHeight(size)) * 3 / 2;
}

struct PcdFile {
  bool overview = false;
  int32_t pictures = 1;   // of an overview
  int32_t turns = 0;      // quarter turns to the left that set the picture upright
  int32_t largest = 0;    // the largest of the sizes that is there
  uint64_t tables16 = 0;  // offset of the largest size's code tables

  // Where the samples of a plain size begin.
  uint64_t Plain(int32_t size, int32_t picture) const;
};

// Ok; DamagedFile, FileReadError when not even the smallest size is there, NoImages.
Status ParsePcd(std::span<const uint8_t> file, PcdFile& pcd);

}  // namespace fotomill
