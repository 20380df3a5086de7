#include "picture/packed_image.h"

#include <gtest/gtest.h>

#include "core/limits.h"

namespace fotomill {
namespace {

TEST(PackedImage, StrideAndSizeDependOnDepth) {
  struct Row {
    const char* name;
    int32_t width, height, bitsPerPixel;
    int32_t bits;
    uint64_t stride, size;
  };
  const Row rows[] = {
      {"1 bit, one pixel over a word", 33, 2, 1, 1, 8, 40 + 8 + 16},
      {"3 bits become 4", 3, 1, 3, 4, 4, 40 + 64 + 4},
      {"6 bits become 8", 5, 2, 6, 8, 8, 40 + 1024 + 16},
      {"24 bits have no color table", 1, 3, 24, 24, 4, 40 + 12},
      {"32 bits are held as 24", 1, 1, 32, 24, 4, 40 + 4},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    PackedImage image;
    ASSERT_EQ(NewPackedImage(row.width, row.height, nullptr, row.bitsPerPixel, image), Status::Ok);
    EXPECT_EQ(image.Bits(), row.bits);
    EXPECT_EQ(image.Stride(), row.stride);
    EXPECT_EQ(image.Bytes().size(), row.size);
  }
}

TEST(PackedImage, RejectsHugePictures) {
  PackedImage image;
  EXPECT_EQ(NewPackedImage(0, 5, nullptr, 8, image), Status::DamagedFile);
  EXPECT_EQ(NewPackedImage(5, -1, nullptr, 8, image), Status::DamagedFile);
  EXPECT_EQ(NewPackedImage(INT32_MAX, INT32_MAX, nullptr, 24, image), Status::MemoryAllocationError);
  EXPECT_TRUE(image.Empty());
}

}  // namespace
}  // namespace fotomill
