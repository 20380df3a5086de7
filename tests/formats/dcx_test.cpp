#include "formats/dcx/dcx.h"

#include <gtest/gtest.h>

#include "formats/pcx/pcx.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

void Put(Bytes& bytes, size_t at, uint32_t value) {
  for (size_t i = 0; i < 4; ++i) bytes[at + i] = static_cast<uint8_t>(value >> (8 * i));
}

// A collection of two pages of 5 x 3 and 9 x 2 pixels; the first page is last in the file.
Bytes Collection() {
  const Bytes first = Encode(PcxWrite, *PatternPicture(5, 3, 8)),
              second = Encode(PcxWrite, *PatternPicture(9, 2, 8));
  Bytes file(16);
  Put(file, 0, 0x3ADE68B1);
  Put(file, 4, static_cast<uint32_t>(16 + second.size()));
  Put(file, 8, 16);
  file.insert(file.end(), second.begin(), second.end());
  file.insert(file.end(), first.begin(), first.end());
  return file;
}

TEST(Dcx, ReadsPagesWithTheirPalettes) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.dcx"), Collection());
  const std::pair<int32_t, int32_t> pages[] = {{0, 5}, {1, 9}};
  for (const auto& [page, width] : pages) {
    const PicturePointer picture = NewPictureRecord(),
                         pattern = PatternPicture(width, page == 0 ? 3 : 2, 8);
    const ReadRequest request{.fileName = folder.Path("a.dcx"), .page = page};
    ASSERT_EQ(DcxInfo(*picture, request), Status::Ok);
    EXPECT_EQ(picture->width, width);
    EXPECT_EQ(picture->pageCount, 2);
    ASSERT_EQ(DcxRead(*picture, request), Status::Ok);
    EXPECT_EQ(PixelText(picture->image), PixelText(pattern->image));
    EXPECT_EQ(picture->palette, pattern->palette);
  }
  for (const int32_t page : {-1, 2}) {
    EXPECT_EQ(DcxRead(*NewPictureRecord(), {.fileName = folder.Path("a.dcx"), .page = page}), Status::NoImages);
  }
}

TEST(Dcx, RejectsInvalidCollections) {
  Bytes behind = Collection(), none = Collection(), other = Collection(), itself = Collection();
  Put(behind, 4, 0xFFFFFFF0);
  Put(none, 4, 0);
  Put(other, 0, 0x3ADE68B2);
  Put(itself, 4, 4);
  const std::tuple<const char*, Bytes, Status> rows[] = {
      {"a page behind the end", behind, Status::FileReadError},
      {"no pages", none, Status::NoImages},
      {"another signature", other, Status::DamagedFile},
      {"a page that is the directory", itself, Status::DamagedFile},
      {"three bytes", Hex("B1 68 DE"), Status::FileReadError},
      {"a full directory without pages behind it", Bytes(4100, 0xB1), Status::DamagedFile},
  };
  for (const auto& [name, file, status] : rows)
    EXPECT_EQ(Decode(DcxRead, file).status, status) << name;
}

}  // namespace
}  // namespace fotomill::test
