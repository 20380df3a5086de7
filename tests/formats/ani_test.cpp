#include "formats/icon/ani.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

std::string Hex32(uint32_t value) {
  char text[16];
  std::snprintf(text, sizeof text, "%02X%02X%02X%02X ", value & 255, value >> 8 & 255,
                value >> 16 & 255, value >> 24);
  return text;
}
std::string Chunk(const std::string& name, const std::string& hex) {
  const size_t size = Hex(hex).size();
  return name + Hex32(static_cast<uint32_t>(size)) + hex + (size % 2 != 0 ? " 00 " : " ");
}

const std::string kAnih = "616E6968 ", kRate = "72617465 ", kSeq = "73657120 ", kList = "4C495354 ",
                  kIcon = "69636F6E ";

// A cursor of `width` opaque pixels of one color, one row high.
std::string Cursor(int width, const char* bgr) {
  std::string row;
  for (int i = 0; i < width; ++i) row += bgr;
  while (Hex(row).size() % 4 != 0) row += "00";
  return "0000 0200 0100  01 01 00 00 0500 0700 FFFFFFFF 16000000  28000000 " +
         Hex32(static_cast<uint32_t>(width)) +
         "02000000 0100 1800 00000000 00000000 00000000 00000000 00000000 00000000 " + row +
         " 00000000 ";
}

std::string Header(uint32_t pictures, uint32_t rate, uint32_t flags = 1) {
  return Chunk(kAnih, Hex32(36) + Hex32(pictures) + Hex32(9) + Hex32(0) + Hex32(0) + Hex32(0) +
                          Hex32(0) + Hex32(rate) + Hex32(flags));
}
// Pictures of 2, 1 and 3 pixels: red, green, blue.
const std::string kPictures =
    Chunk(kList, "6672616D " + Chunk(kIcon, Cursor(2, "0000FF")) +
                     Chunk(kIcon, Cursor(1, "00FF00")) + Chunk(kIcon, Cursor(3, "FF0000")));

Bytes File(const std::string& chunks) { return Hex("52494646 FFFFFF7F 41434F4E " + chunks); }

std::string Played(const Bytes& file, Status* end = nullptr) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.ani"), file);
  AnimationPointer animation;
  const Status opened = AniAnimate({.fileName = folder.Path("a.ani")}, animation);
  if (end != nullptr) *end = opened;
  if (opened != Status::Ok) return {};
  std::string text;
  for (const int32_t delay : animation->Delays()) {
    const Status status = animation->Next();
    if (end != nullptr) *end = status;
    if (status != Status::Ok) break;
    text += std::to_string(delay) + ": " + PixelText(animation->Frame().image) + " " +
            PixelText(animation->Frame().alpha) + "\n";
  }
  EXPECT_EQ(animation->Rounds(), 0);
  return text;
}

TEST(Ani, PlaysStepsAccordingToTheChunks) {
  const struct {
    const char* name;
    std::string chunks;
    const char* played;
  } rows[] = {
      {"in their order, at the header's rate", Header(3, 6) + kPictures,
       "100: FF0000 FF0000 255 255\n100: 00FF00 000000 255 0\n100: 0000FF 0000FF 255 255\n"},
      {"rates", Chunk(kRate, Hex32(1) + Hex32(60) + Hex32(10)) + Header(3, 6) + kPictures,
       "17: FF0000 FF0000 255 255\n1000: 00FF00 000000 255 0\n167: 0000FF 0000FF 255 255\n"},
      {"too few rates", Header(3, 6) + Chunk(kRate, Hex32(60)) + kPictures,
       "1000: FF0000 FF0000 255 255\n100: 00FF00 000000 255 0\n100: 0000FF 0000FF 255 255\n"},
      {"a sequence behind the pictures; the first step decides about the size",
       Header(3, 60) + kPictures + Chunk(kSeq, Hex32(1) + Hex32(0) + Hex32(1) + Hex32(2)),
       "1000: 00FF00 255\n1000: FF0000 255\n1000: 00FF00 255\n1000: 0000FF 255\n"},
      {"a step without a picture ends it", Header(3, 60) + kPictures + Chunk(kSeq, Hex32(1) + Hex32(3) + Hex32(0)), "1000: 00FF00 255\n"},
      {"a list of texts that claims two bytes too many",
       kList + Hex32(16) + "494E464F 494E414D" + Hex32(2) + "4100 " + Header(3, 6) + kPictures,
       "100: FF0000 FF0000 255 255\n100: 00FF00 000000 255 0\n100: 0000FF 0000FF 255 255\n"},
      {"no header", kPictures, "167: FF0000 FF0000 255 255\n167: 00FF00 000000 255 0\n167: 0000FF 0000FF 255 255\n"},
      {"a rate beyond all bounds", Header(3, 0xFFFFFFFF) + Chunk(kSeq, Hex32(1)) + kPictures, "2147483647: 00FF00 255\n"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(Played(File(row.chunks)), row.played);
  }
}

TEST(Ani, PagesAreSteps) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.ani"),
             File(Header(3, 6) + Chunk(kSeq, Hex32(2) + Hex32(0)) + kPictures));
  const std::pair<int32_t, int32_t> pages[] = {{0, 3}, {1, 2}};
  for (const auto& [page, width] : pages) {
    const PicturePointer picture = NewPictureRecord();
    const ReadRequest request{.fileName = folder.Path("a.ani"), .page = page};
    ASSERT_EQ(AniInfo(*picture, request), Status::Ok);
    EXPECT_EQ(picture->width, width);
    EXPECT_EQ(picture->pageCount, 2);
    EXPECT_EQ(picture->hotSpotX, 5);
    EXPECT_EQ(picture->hotSpotY, 7);
    EXPECT_EQ(picture->typeName.view(), "Windows animated cursor");
    ASSERT_EQ(AniRead(*picture, request), Status::Ok);
    EXPECT_EQ(picture->image.Width(), width);
    EXPECT_TRUE(picture->warning.empty());
  }
  for (const int32_t page : {-1, 2}) {
    EXPECT_EQ(AniRead(*NewPictureRecord(), {.fileName = folder.Path("a.ani"), .page = page}), Status::NoImages);
  }
}

TEST(Ani, ReportsMissingParts) {
  const std::tuple<const char*, std::string, Status, bool> rows[] = {
      {"a picture less than the header has", Header(4, 6) + kPictures, Status::Ok, true},
      {"a step to no picture", Header(3, 6) + Chunk(kSeq, Hex32(0) + Hex32(9)) + kPictures, Status::Ok, true},
      {"all there", Header(3, 6) + kPictures, Status::Ok, false},
      {"no pictures", Header(3, 6), Status::NoImages, false},
      {"no step that can be shown", Header(3, 6) + Chunk(kSeq, Hex32(9)) + kPictures, Status::NoImages, false},
      {"pictures without headers", Header(3, 6, 2) + kPictures, Status::UnsupportedFormat, false},
      {"a picture that is no icon", Chunk(kList, "6672616D " + Chunk(kIcon, "474946383961")), Status::DamagedFile, false},
      {"a picture that ends early", Chunk(kList, "6672616D " + Chunk(kIcon, Cursor(2, "0000FF")).substr(0, 150)), Status::FileReadError, false},
      {"pictures of another list", Chunk(kList, "494E464F " + Chunk(kIcon, Cursor(2, "0000FF"))), Status::NoImages, false},
  };
  for (const auto& [name, chunks, status, warns] : rows) {
    const Decoded decoded = Decode(AniRead, File(chunks));
    EXPECT_EQ(decoded.status, status) << name;
    EXPECT_EQ(!decoded.picture->warning.empty(), warns) << name;
  }
  EXPECT_EQ(Decode(AniRead, Hex("52494646 FFFFFF7F 57454250")).status, Status::DamagedFile);
}

TEST(Ani, WritesCompleteChunks) {
  const PicturePointer picture = PatternPicture(3, 2, 24);
  picture->hotSpotX = 2;
  picture->hotSpotY = 1;
  const Bytes file = Encode(AniWrite, *picture);
  // anih of one picture and one step at ten sixtieths, then the list with one cursor
  const Bytes head = Hex(
      "52494646 A2000000 41434F4E  616E6968 24000000  24000000 01000000 01000000 00000000 00000000 00000000 00000000"
      "0A000000 01000000  4C495354 6A000000 6672616D  69636F6E 5E000000"
      "0000 0200 0100  03 02 00 00 0200 0100 48000000 16000000  28000000 03000000 04000000 0100 1800");
  ASSERT_GT(file.size(), head.size());
  EXPECT_EQ(Bytes(file.begin(), file.begin() + static_cast<std::ptrdiff_t>(head.size())), head);
  EXPECT_EQ(file.size(), 0xA2u + 8);
}

}  // namespace
}  // namespace fotomill::test
