#include "metadata/edit/picture_edit.h"

#include <gmock/gmock.h>

#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/strip.h"
#include "metadata/exif/exif_names.h"
#include "support/exif_blocks.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::ElementsAreArray;
using Bytes = std::vector<uint8_t>;

std::vector<std::string> LinesOf(const Bytes& block) {
  CollectedLines sink;
  WalkExif(block, &sink);
  return sink.lines;
}

// A change in user syntax; without a value the tag is removed.
DirectoryChange Typed(std::string_view name, const char* text) {
  DirectoryChange change;
  change.tag = FindExifTagByName(name).value_or(0xffff);
  change.place = PlaceOfExifTag(change.tag);
  if (text == nullptr) return change;
  std::string reason;
  change.entry.emplace();
  EXPECT_TRUE(ParseExifInput(change.tag, text, *change.entry, reason)) << name << ": " << reason;
  return change;
}

Status Edit(const Bytes& file, const ExifChanges& changes, Bytes& made, std::string& reason) {
  FilePieces pieces;
  bool changed = false;
  const Status status = EditPictureExif(
      file, [&](const ExifDirectories&, std::string&) { return changes; }, pieces, changed, reason);
  made = changed ? pieces.Joined() : file;
  return status;
}

Bytes Edited(const Bytes& file, const ExifChanges& changes) {
  Bytes made;
  std::string reason;
  EXPECT_EQ(Edit(file, changes, made, reason), Status::Ok) << reason;
  return made;
}

// The lines of a block without those that start with a name.
std::vector<std::string> Without(std::vector<std::string> lines, std::string_view name) {
  std::erase_if(lines, [&](const std::string& line) { return line.starts_with(name); });
  return lines;
}

TEST(PictureEdit, ChangesWhatIsAskedFor) {
  const struct {
    const char *tag, *text, *line;  // the resulting line of the block; null: none
  } rows[] = {
      {"Make", "Acm", "Image input equipment manufacturer=Acm"},    // fits in place
      {"Make", "Acm5", "Image input equipment manufacturer=Acm5"},  // fits exactly
      {"Make", "A", "Image input equipment manufacturer=A"},        // fits in the entry
      {"Make", "Acme Cameras", "Image input equipment manufacturer=Acme Cameras"},
      {"Make", nullptr, nullptr},
      {"Orientation", "Top Left", "Orientation of image=Top Left"},
      {"Orientation", nullptr, nullptr},
      {"Artist", "Ann", "Person who created the image=Ann"},
      {"Artist", "Ann Lee", "Person who created the image=Ann Lee"},
      {"Exposure time", "1/125", "Exposure time=0.008"},
      {"Exposure time", nullptr, nullptr},
      {"F number", "2.8", "F number=2.800"},
      {"ISO", "400", "ISO speed rating=400"},
      {"Flash", "Fire: N Return: D Mode: F Function: N Redeye: Y",
       "Flash=Fire: N Return: D Mode: F Function: N Redeye: Y"},
      {"User comments", "hello", "User comments=hello"},
      {"GPSLatitudeRef", "north", "North or South latitude=North"},
      {"Latitude", "45.5", "Latitude=45.000 30.000 0.000"},
      {"Altitude", "12.25", "Altitude=12.250"},
  };
  for (const Bytes& block : {BigEndianBlock(), LittleEndianBlock()}) {
    for (const auto& row : rows) {
      SCOPED_TRACE(std::string(row.tag) + "=" + (row.text == nullptr ? "" : row.text));
      const Bytes made = Edited(block, {Typed(row.tag, row.text)});
      const auto lines = LinesOf(made);
      if (row.line != nullptr) {
        EXPECT_THAT(lines, Contains(row.line));
      }
      const std::string name(ExifTagName(*FindExifTagByName(row.tag)));
      // pointers to moved directories are lines, too
      const auto rest = [&](const Bytes& of) {
        return Without(Without(Without(LinesOf(of), name + "="), "Exif tag="), "GPS tag=");
      };
      EXPECT_EQ(rest(made), rest(block));
      // the thumbnail and its directory are not moved
      EXPECT_TRUE(std::equal(block.begin() + 0x50, block.begin() + 0x7E, made.begin() + 0x50));
      EXPECT_EQ(Edited(made, {Typed(row.tag, row.text)}), made);
    }
  }
}

TEST(PictureEdit, OldValuesAreNoLongerThere) {
  const Bytes acme = {'A', 'c', 'm', 'e'};
  for (const char* text : {static_cast<const char*>(nullptr), "X", "Nobody", "Nobody at all"}) {
    const Bytes made = Edited(LittleEndianBlock(), {Typed("Make", text)});
    EXPECT_EQ(std::search(made.begin(), made.end(), acme.begin(), acme.end()), made.end());
  }
  // A value shared with another entry is kept.
  BlockBuilder blocks;
  const uint32_t shared = 8 + 2 + 2 * 12 + 4;
  blocks.Directory({{0x010e, 2, 6, shared}, {0x013b, 2, 6, shared}});
  EXPECT_EQ(blocks.Bytes({'s', 'h', 'a', 'r', 'e', 0}), shared);
  const Bytes made = Edited(blocks.block, {Typed("Artist", "someone else")});
  EXPECT_THAT(LinesOf(made), ElementsAre("DIRECTORY IFD 0", "Image title=share",
                                         "Person who created the image=someone else"));
}

TEST(PictureEdit, DirectoriesComeAndGo) {
  BlockBuilder blocks;
  blocks.Directory({{0x0112, 3, 1, 6}});
  const Bytes more = Edited(blocks.block, {Typed("ISO", "200"), Typed("Altitude", "5")});
  EXPECT_THAT(Without(Without(LinesOf(more), "Exif tag"), "GPS tag="),
              ElementsAre("DIRECTORY IFD 0", "Orientation of image=Right Top", "DIRECTORY EXIF",
                          "ISO speed rating=200", "Exif version=0230", "DIRECTORY GPS",
                          "GPS tag version=2.3.0.0", "Altitude=5.000"));
  DirectoryChange version = Typed("ISO", nullptr);
  version.tag = 0x9000;
  const Bytes less = Edited(more, {Typed("ISO", nullptr), version, Typed("Altitude", nullptr)});
  EXPECT_THAT(Without(LinesOf(less), "GPS tag="),
              ElementsAre("DIRECTORY IFD 0", "Orientation of image=Right Top", "DIRECTORY GPS",
                          "GPS tag version=2.3.0.0"));
}

TEST(PictureEdit, RefusesWhatCannotBeKept) {
  BlockBuilder beyond;
  beyond.Directory({{0x010e, 2, 60, 0x1000}});
  BlockBuilder cut;
  cut.Directory({{0x010e, 2, 4, 0}, {0x010f, 2, 4, 0}});
  cut.block.resize(cut.block.size() - 10);
  BlockBuilder pointer;
  pointer.Directory({{0x8769, 4, 1, 0x2000}});
  const struct {
    const char* name;
    const Bytes& block;
    ExifChanges changes;
    Status status;
  } rows[] = {
      {"grows into what is pointed to",
       beyond.block,
       {Typed("Artist", "Ann Lee")},
       Status::UnsuitableImage},
      {"directory cut short", cut.block, {Typed("Artist", nullptr)}, Status::DamagedFile},
      {"EXIF directory outside", pointer.block, {Typed("ISO", "100")}, Status::DamagedFile},
      {"no picture", Hex("00010203040506070809"), {Typed("ISO", "100")}, Status::UnsupportedFormat},
      {"no directory", Hex("49492A00 FF000000"), {Typed("ISO", "100")}, Status::DamagedFile},
      {"JPEG cut short", Hex("FFD8FFE1"), {Typed("ISO", "100")}, Status::FileReadError},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    Bytes made;
    std::string reason;
    EXPECT_EQ(Edit(row.block, row.changes, made, reason), row.status);
    EXPECT_EQ(made, row.block);
  }
  EXPECT_THAT(LinesOf(Edited(pointer.block, {Typed("Artist", "Ann")})),
              Contains("Person who created the image=Ann"));  // in another directory
}

// The number of entries has 16 bits: one more than these would be stored as none.
TEST(PictureEdit, FullDirectoriesAreRefused) {
  Bytes block = Hex("49492A0008000000 FFFF");
  for (uint32_t i = 0; i < 0xFFFF; ++i) {
    const Bytes entry = Hex("00E0 0100 01000000 00000000");
    block.insert(block.end(), entry.begin(), entry.end());
  }
  block.resize(block.size() + 4);
  Bytes made;
  std::string reason;
  EXPECT_EQ(Edit(block, {Typed("Artist", "someone")}, made, reason), Status::DamagedFile);
  EXPECT_NE(reason, "");
  EXPECT_EQ(made, block);
}

Bytes Jpeg(const Bytes& block,
           std::string_view others = "FFE0 0010 4A46494600 010100 0001 0001 0000") {
  Bytes file = Hex("FFD8"), more = Hex(others);
  file.insert(file.end(), more.begin(), more.end());
  if (!block.empty()) {
    const size_t length = 8 + block.size();
    file.insert(file.end(), {0xFF, 0xE1, static_cast<uint8_t>(length >> 8),
                             static_cast<uint8_t>(length), 'E', 'x', 'i', 'f', 0, 0});
    file.insert(file.end(), block.begin(), block.end());
  }
  more = Hex("FFFE 0005 616263 FFDA 0002 1234 FFD9 AABB");
  file.insert(file.end(), more.begin(), more.end());
  return file;
}

TEST(PictureEdit, JpegKeepsItsSegments) {
  const Bytes added = Edited(Jpeg({}), {Typed("Artist", "A")});
  EXPECT_THAT(added, ElementsAreArray(
                         Jpeg(Hex("49492A00 08000000 0100 3B01 0200 02000000 41000000 00000000"))));
  EXPECT_EQ(Edited(added, {Typed("Artist", nullptr)}), Jpeg({}));  // EXIF is removed completely
  // An index of further pictures has offsets relative to itself, so nothing before them may grow.
  const char* const index = "FFE2 0008 4D504600 0000";
  Bytes made;
  std::string reason;
  EXPECT_EQ(Edit(Jpeg(LittleEndianBlock(), index), {Typed("Make", "Acme Cameras")}, made, reason),
            Status::UnsuitableImage);
  EXPECT_FALSE(reason.empty());
  EXPECT_NE(Edited(Jpeg(LittleEndianBlock(), index), {Typed("Make", "Acmo")}),
            Jpeg(LittleEndianBlock(), index));
  Bytes large = LittleEndianBlock();
  large.resize(65500);
  EXPECT_EQ(Edit(Jpeg(large), {Typed("Make", "A manufacturer with a long name")}, made, reason),
            Status::UnsuitableImage);
}

TEST(PictureEdit, MakerNotesAndThumbnailsAreNeverKept) {
  BlockBuilder blocks;
  const uint32_t first = blocks.Directory({{0x010f, 2, 4, 0x00656d41}, {0x8769, 4, 1, 0}});
  const uint32_t exif =
      blocks.Directory({{0x8827, 3, 1, 100}, {0x927c, 7, 12, 0}, {0xa001, 3, 1, 1}});
  blocks.Patch32(first + 2 + 12 + 8, exif);
  blocks.Patch32(exif + 2 + 12 + 8,
                 blocks.Bytes({'M', 'a', 'k', 'e', 'r', 's', 'e', 'c', 'r', 'e', 't', 0}));
  FilePieces made;
  std::string reason;
  for (const Bytes& file : {Jpeg(blocks.block), blocks.block, Jpeg(LittleEndianBlock())}) {
    ASSERT_EQ(StripPicture(file, kKeepExif | kKeepGps, made, reason), Status::Ok);
    const Bytes bytes = made.Joined();
    const std::string text(bytes.begin(), bytes.end());
    EXPECT_EQ(text.find("secret"), std::string::npos);
    EXPECT_EQ(text.find("\xFF\xD8\xFF\xD9"), std::string::npos);
  }
}

TEST(PictureEdit, SharedDirectoriesAreCopied) {
  BlockBuilder blocks;
  const uint32_t first = blocks.Directory({{0x8769, 4, 1, 0}, {0x8825, 4, 1, 0}});
  const uint32_t shared = blocks.Directory({{0x0001, 2, 2, 'N'}, {0x8827, 3, 1, 100}});
  blocks.Patch32(first + 2 + 8, shared);
  blocks.Patch32(first + 2 + 12 + 8, shared);
  const Bytes made = Edited(blocks.block, {Typed("ISO", "200"), Typed("GPSLatitudeRef", "S")});
  EXPECT_THAT(Without(Without(LinesOf(made), "GPS tag="), "Exif tag"),
              ElementsAre("DIRECTORY IFD 0", "DIRECTORY EXIF", "North or South latitude=North",
                          "ISO speed rating=200", "DIRECTORY GPS", "North or South latitude=South",
                          "ISO speed rating=100"));
}

TEST(PictureEdit, ADirectoryMayEndWithTheFile) {
  BlockBuilder blocks;
  const uint32_t first = blocks.Directory({{0x0100, 4, 1, 1}, {0x8769, 4, 1, 0}});
  blocks.Patch32(first + 2 + 12 + 8, blocks.Directory({{0x8827, 3, 1, 100}}));
  blocks.block.resize(blocks.block.size() - 4);  // no link
  FilePieces made;
  std::string reason;
  ASSERT_EQ(StripPicture(blocks.block, kKeepUsually, made, reason), Status::Ok);
  EXPECT_LT(made.Joined().size(), blocks.block.size());
}

TEST(PictureEdit, ReadsWhatPeopleType) {
  const struct {
    const char *tag, *text;
    const char* value;  // little-endian; null: rejected
  } rows[] = {
      {"Orientation", "6", "0600"},
      {"Orientation", "right TOP", "0600"},
      {"Orientation", "0", nullptr},
      {"Orientation", "Sideways", nullptr},
      {"ISO", "32768", nullptr},
      {"ISO", "1.5", nullptr},
      {"ISO", "100 200", nullptr},
      {"Exposure time", "1/250", "01000000 FA000000"},
      {"Exposure time", "-1", nullptr},
      {"Exposure time", "1/0", nullptr},
      {"Exposure bias", "-0.33", "DFFFFFFF 64000000"},
      {"Exposure bias", "-99.991", nullptr},
      {"Lens focal length", "0.5", nullptr},
      {"Subject distance", "infinity", "FFFFFFFF 01000000"},
      {"Lens specification", "24 70 2.8 4",
       "18000000 01000000 46000000 01000000 1C000000 0A000000 04000000 01000000"},
      {"Lens specification",
       "Focal length minimum: 24 Focal length maximum: 70 F-stop minimum: 2.8 F-stop maximum: 4 ",
       "18000000 01000000 46000000 01000000 1C000000 0A000000 04000000 01000000"},
      {"Lens specification", "24 70", nullptr},
      {"Subject area", "Circular area X: 10 Y: 20 R: 5", "0A00 1400 0500"},
      {"Subject area", "1", nullptr},
      {"Latitude", "90.1", nullptr},
      {"Latitude", "45 60 0", nullptr},
      {"GPS time", "23:59:60", nullptr},
      {"GPS time", "01:02:03.5", "01000000 01000000 02000000 01000000 23000000 0A000000"},
      {"GPS date", "2024-02-30", nullptr},
      {"GPS date", "2024-02-29", "323032343A30323A323900"},
      {"DateTimeOriginal", "2024-05-31T14:03:00", "323032343A30353A33312031343A30333A303000"},
      {"DateTimeOriginal", "yesterday", nullptr},
      {"SubSecTime", "x", nullptr},
      {"Metering mode", "Other", "FF00"},
      {"Color space information", "Uncalibrated", "FFFF"},
      {"Unit of X and Y resolution", "Centimeters", "0300"},
      {"GPS measurement mode", "3-dimensional measurement", "3300"},
      {"Reference for distance to destination", "k", "4B00"},
      {"Reference for distance to destination", "True", nullptr},
      {"File source", "Digital still camera", "03"},
      {"Flash", "127", "7F00"},
      {"Flash", "128", nullptr},
      {"Flash", "Fire: Q Return: X Mode: A Function: P Redeye: N", nullptr},
      {"User comments", "\xC3\xA4", "554E49434F444500 FFFE E400"},
      {"Artist", "", nullptr},
      {"Artist", "\xFF", nullptr},
      {"Artist", "a\x01", nullptr},
      {"Image width", "10", nullptr},
      {"Manufacturer notes", "x", nullptr},
      {"Exif version", "0230", nullptr},
      {"0xC4A5", "x", nullptr},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(std::string(row.tag) + "=" + row.text);
    ExifEntry entry;
    std::string reason;
    const bool taken =
        ParseExifInput(FindExifTagByName(row.tag).value_or(0), row.text, entry, reason);
    EXPECT_EQ(taken, row.value != nullptr);
    EXPECT_EQ(reason.empty(), taken);
    if (taken && row.value != nullptr) {
      EXPECT_THAT(entry.value, ElementsAreArray(Hex(row.value)));
    }
  }
}

TEST(PictureEdit, TimesAreThoseOfTheCalendar) {
  for (const char* text : {"0000:01:01 00:00:00", "1969:12:31 23:59:59", "1970:01:01 00:00:00",
                           "2024:02:29 12:34:56", "9999:12:31 23:59:59"}) {
    const auto time = ParseExifTime(text);
    ASSERT_TRUE(time) << text;
    EXPECT_EQ(ExifTimeText(*time), text);
  }
  for (const char* text :
       {"2023:02:29 00:00:00", "2024:01:01", "2024:01:01 24:00:00", "", "2024:01:01 00:00:00Z"})
    EXPECT_FALSE(ParseExifTime(text)) << text;
  EXPECT_EQ(ParseTimeShift("+1:30:00"), 5400);
  EXPECT_EQ(ParseTimeShift("-100:05"), -360300);
  for (const char* text :
       {"1:30", "+1", "+1:60", "+1:30:", "+-1:30", "+1:30:00x", "+999999999999:00"})
    EXPECT_FALSE(ParseTimeShift(text)) << text;
}

}  // namespace
}  // namespace fotomill::test
