#include "formats/macpaint/mac.h"

#include <gtest/gtest.h>

#include <ctime>

#include "platform/clock.h"
#include "settings/job_options.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/pictures.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill {
namespace {

using namespace test;
using Bytes = std::vector<uint8_t>;

constexpr size_t kRow = 72, kRows = 720, kHeader = 512, kMacBinary = 128;

Bytes Times(size_t count, uint8_t value) { return Bytes(count, value); }
// A row of 72 different bytes.
Bytes Counting(int first, int step) {
  Bytes row;
  for (size_t i = 0; i < kRow; ++i, first += step) row.push_back(static_cast<uint8_t>(first));
  return row;
}
Bytes Join(std::initializer_list<Bytes> parts) {
  Bytes all;
  for (const Bytes& part : parts) all.insert(all.end(), part.begin(), part.end());
  return all;
}
// Packed rows that are completely white.
Bytes WhiteRows(size_t count) {
  Bytes rows;
  for (; count > 0; --count) rows.insert(rows.end(), {0xB9, 0x00});
  return rows;
}

Status ReadFile(const std::string& path, PictureRecord& picture) {
  RETURN_IF_BAD(MacInfo(picture, {.fileName = path}));
  return MacRead(picture, {.fileName = path});
}

TEST(Mac, PacksRows) {
  const struct {
    const char* name;
    Bytes row, packed;
  } rows[] = {
      {"equal throughout", Times(72, 0x00), Hex("B9 FF")},
      {"a pair is a run, a single byte is not", Join({Hex("01 01 02"), Times(69, 0x03)}), Hex("FF FE  00 FD  BC FC")},
      {"literals in one block, also up to the end", Join({Times(68, 0xF0), Hex("00 01 02 03")}), Hex("BD 0F  03 FF FE FD FC")},
      {"the last two equal", Join({Times(70, 0x10), Hex("00 00")}), Hex("BB EF  FF FF")},
      {"nothing equal", Counting(0x00, 1), Join({Hex("47"), Counting(0xFF, -1)})},
  };
  const TemporaryFolder folder;
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(576, 1, 1, {row.row});
    ASSERT_TRUE(picture->fileName.Assign(folder.Path("row.mac")));
    ASSERT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::Ok);
    const Bytes written = ReadBytes(folder.Path("row.mac"));
    EXPECT_EQ(Bytes(written.begin() + kHeader, written.end()), Join({row.packed, WhiteRows(719)}));
  }
}

TEST(Mac, UnpacksRowsOneByOne) {
  const struct {
    const char* name;
    Bytes packed;
    Status status;
    Bytes row;
  } rows[] = {
      {"run and literals", Hex("BC 00  02 01 02 03"), Status::Ok, Join({Times(69, 0xFF), Hex("FE FD FC")})},
      {"no-run first in the row", Hex("80  B9 0F"), Status::Ok, Times(72, 0xF0)},
      {"no-run twice first in the row", Hex("80 80  B9 0F"), Status::Ok, Times(72, 0xF0)},
      {"no-run behind a run", Hex("FF 00  80  BB 00"), Status::FileReadError, {}},
      {"no-run behind literals", Hex("00 11  80  BA 00"), Status::FileReadError, {}},
      {"run beyond the row", Hex("FF 00  B9 00"), Status::FileReadError, {}},
      {"longest run", Hex("81 00"), Status::FileReadError, {}},
      {"literals beyond the row", Join({Hex("BB 00  02 01 02 03")}), Status::FileReadError, {}},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("row.mac");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteBytes(path, Join({Times(kHeader, 0), row.packed, WhiteRows(719)}));
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(ReadFile(path, *picture), row.status);
    ASSERT_EQ(picture->image.Empty(), row.status != Status::Ok);
    if (row.status == Status::Ok) {
      EXPECT_EQ(RowOf(picture->image, 0), row.row);
      EXPECT_EQ(RowOf(picture->image, 719), Times(72, 0xFF));
    }
  }
}

TEST(Mac, FindsTheStartOfTheRows) {
  Bytes macBinary = Times(kMacBinary, 0);
  std::copy_n("PNTG", 4, macBinary.begin() + 65);
  Bytes nonZero = macBinary;
  nonZero[0] = 1;
  const Bytes black = Hex("B9 FF");
  const struct {
    const char* name;
    Bytes front;
  } rows[] = {
      {"bare rows, the first byte is not zero", {}},
      {"behind the header", Times(kHeader, 0)},
      {"behind both headers", Join({macBinary, Times(kHeader, 0xEE)})},
      {"the type field counts more than the first byte", Join({nonZero, Times(kHeader, 0xEE)})},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("begin.mac");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteBytes(path, Join({row.front, black, WhiteRows(719)}));
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(ReadFile(path, *picture), Status::Ok);
    EXPECT_EQ(RowOf(picture->image, 0), Times(72, 0x00));
    EXPECT_EQ(RowOf(picture->image, 1), Times(72, 0xFF));
  }
}

TEST(Mac, MacBinaryHeaderIsTheSameInEveryTimeZone) {
  const ScopedSettings scoped;
  settings.CreateMacbinaryHeader = 1;
  platform::FixNow(1000000000);
  const std::string name = "My photo.mac-FotomillProfessional 0.00";
  const Bytes behindName =
      Hex("50 4E 54 47  4D 50 4E 54       # 65: PNTG MPNT\n"
          "00 00 00 00 00 00 00 00 00 00\n"
          "00 00 0D 40                    # 83: everything behind this header, 512 + 720 x 4\n"
          "00 00 00 00\n"
          "B7 C0 42 40  B7 C0 42 40       # 91: 1000000000 + 2082830400, twice\n");
  const TemporaryFolder folder;
  const std::string path = folder.Path("MY Photo.MAC");
  for (const char* zone : {"UTC0", "JST-9", "PST8PDT"}) {
    SCOPED_TRACE(zone);
    const ScopedEnvironment timeZone("TZ", zone);
    tzset();
    const PicturePointer picture = MakePicture(8, 720, 1);
    ASSERT_TRUE(picture->fileName.Assign(path));
    ASSERT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::Ok);
    const Bytes written = ReadBytes(path);
    ASSERT_EQ(written.size(), 128u + 512 + 720 * 4);
    EXPECT_EQ(Bytes(written.begin(), written.begin() + 2), Hex("00 26"));  // version, name length
    EXPECT_EQ(std::string(written.begin() + 2, written.begin() + 2 + 38), name);
    EXPECT_EQ(Bytes(written.begin() + 40, written.begin() + 65), Times(25, 0));
    EXPECT_EQ(Bytes(written.begin() + 65, written.begin() + 128), Join({behindName, Times(29, 0)}));
    Bytes header = Times(kHeader, 0);
    header[3] = header[131] = header[259] = header[387] = 2;
    EXPECT_EQ(Bytes(written.begin() + 128, written.begin() + 640), header);
    const PicturePointer again = NewPictureRecord();
    ASSERT_EQ(ReadFile(path, *again), Status::Ok);
    EXPECT_EQ(again->typeName.view(), name);
    EXPECT_EQ(again->imageBytes, 51840u);
    EXPECT_EQ(again->fileSize, written.size());
  }
  tzset();
  platform::FixNow(-1);
}

TEST(Mac, NamesAreCutTo63) {
  const ScopedSettings scoped;
  settings.CreateMacbinaryHeader = 1;
  const TemporaryFolder folder;
  const std::string name(90, 'a'), path = folder.Path(name + ".mac");
  const PicturePointer picture = MakePicture(8, 8, 1);
  ASSERT_TRUE(picture->fileName.Assign(path));
  ASSERT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::Ok);
  Bytes written = ReadBytes(path);
  EXPECT_EQ(written[1], 63);
  EXPECT_EQ(std::string(written.begin() + 65, written.begin() + 69), "PNTG");
  written[1] = 255;  // beyond the size of the field
  WriteBytes(path, written);
  ASSERT_EQ(MacInfo(*picture, {.fileName = path}), Status::Ok);
  EXPECT_EQ(picture->typeName.view(), "A" + std::string(62, 'a'));
}

TEST(Mac, PutsThePictureOnAWhitePage) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("page.mac");
  for (const int32_t width : {1, 7, 8, 33, 570, 575, 576, 577, 1000}) {
    for (const int32_t height : {1, 719, 720, 721}) {
      SCOPED_TRACE(std::to_string(width) + " x " + std::to_string(height));
      const PicturePointer picture = MakePicture(width, height, 1);  // black, including padding
      ASSERT_TRUE(picture->fileName.Assign(path));
      ASSERT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::Ok);
      const PicturePointer again = NewPictureRecord();
      ASSERT_EQ(ReadFile(path, *again), Status::Ok);
      const int32_t right = std::min(width, 576), bottom = std::min(height, 720);
      EXPECT_EQ(again->image.PixelAt(right - 1, bottom - 1), 0);
      for (int32_t y = bottom; y < 720; ++y) ASSERT_EQ(RowOf(again->image, y), Times(kRow, 0xFF));
      size_t white = 0;
      for (int32_t x = 0; x < 576; ++x) white += static_cast<size_t>(again->image.PixelAt(x, 0));
      EXPECT_EQ(white, static_cast<size_t>(576 - right));
    }
  }
}

TEST(Mac, RejectsInvalidFiles) {
  const TemporaryFolder folder;
  const PicturePointer picture = MakePicture(8, 8, 8);
  EXPECT_EQ(MacInfo(*picture, {.fileName = folder.Path("none.mac"), .signedOnly = true}), Status::UnsupportedFormat);
  EXPECT_EQ(MacInfo(*picture, {.fileName = folder.Path("none.mac")}), Status::FileOpenError);
  EXPECT_EQ(MacInfo(*picture, {.fileName = folder.Path()}), Status::FileOpenError);
  ASSERT_TRUE(picture->fileName.Assign(folder.Path("deep.mac")));
  EXPECT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::TooManyColors);
  const PicturePointer flat = MakePicture(8, 8, 1);
  ASSERT_TRUE(flat->fileName.Assign(folder.Path("none/flat.mac")));
  EXPECT_EQ(MacWrite(*flat, {}), Status::ErrorCreatingFile);
  EXPECT_TRUE(folder.Names().empty());
}

// Compared with netpbm, in both directions.
TEST(Mac, AgreesWithNetpbm) {
  if (!HasProgram("macptopbm") || !HasProgram("pbmtomacp"))
    GTEST_SKIP() << "netpbm is not installed";
  const TemporaryFolder folder;
  const std::string ours = folder.Path("ours.mac"), theirs = folder.Path("theirs.mac"),
                    seen = folder.Path("seen.pbm");
  std::vector<Bytes> rows;
  for (uint32_t y = 0; y < kRows; ++y)
    rows.push_back(Join({RandomBytes(y % 73, y), Times(kRow - y % 73, uint8_t(y))}));
  const PicturePointer picture = MakePicture(576, 720, 1, rows);
  ASSERT_TRUE(picture->fileName.Assign(ours));
  const ScopedSettings scoped;
  for (const int32_t macBinary : {0, 1}) {
    SCOPED_TRACE(macBinary);
    settings.CreateMacbinaryHeader = macBinary;
    ASSERT_EQ(MacWrite(*picture, {.encode = EncodeOptionsFromSettings()}), Status::Ok);
    ASSERT_TRUE(RunShell("macptopbm " + ours + " > " + seen));
    const PnmPicture pnm = ReadPnm(seen);
    ASSERT_EQ(pnm.values.size(), size_t{576 * 720});
    for (size_t i = 0; i < pnm.values.size(); ++i) {
      ASSERT_EQ(pnm.values[i], 1 - picture->image.PixelAt(int32_t(i % 576), int32_t(i / 576))) << i;
    }
    ASSERT_TRUE(RunShell("pbmtomacp -norle " + seen + " > " + theirs) || RunShell("pbmtomacp " + seen + " > " + theirs));
    const PicturePointer again = NewPictureRecord();
    ASSERT_EQ(ReadFile(theirs, *again), Status::Ok);
    EXPECT_EQ(RowsOf(again->image), RowsOf(picture->image));
  }
}

}  // namespace
}  // namespace fotomill
