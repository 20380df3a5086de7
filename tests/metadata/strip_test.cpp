#include "metadata/edit/strip.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <string>
#include <string_view>

#include "containers/directory_edit.h"
#include "containers/jpeg_extended_xmp.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "containers/png_chunks.h"
#include "core/md5.h"
#include "core/text.h"
#include "formats/png/png_raw_profile.h"
#include "metadata/xmp/xmp_edit.h"

namespace fotomill::test {
namespace {

// Little-endian TIFF structures, as text.
std::string Number(uint64_t number, size_t size) {
  std::string bytes;
  for (size_t i = 0; i < size; ++i) bytes.push_back(static_cast<char>(number >> 8 * i));
  return bytes;
}

struct Field {
  uint16_t tag, type;
  uint32_t count, value;
};

std::string Directory(std::initializer_list<Field> fields, uint32_t next = 0) {
  std::string bytes = Number(fields.size(), 2);
  for (const Field& field : fields)
    bytes += Number(field.tag, 2) + Number(field.type, 2) + Number(field.count, 4) +
             Number(field.value, 4);
  return bytes + Number(next, 4);
}

// A structure whose first directory has one entry, so that what follows it is at offset 26.
std::string Block(const Field& field, const std::string& rest) {
  return "II*" + Number(0, 1) + Number(8, 4) + Directory({field}) + rest;
}
constexpr uint32_t kBehind = 26;

std::string Exif(const std::string& block) {
  const size_t size = 8 + block.size();
  return std::string("\xFF\xE1") + static_cast<char>(size >> 8) + static_cast<char>(size & 0xFF) +
         std::string("Exif\0\0", 6) + block;
}

std::string Jpeg(const std::string& head, const std::string& behind) {
  return "\xFF\xD8" + head + std::string("\xFF\xDA\0\2x\xFF\xD9", 7) + behind;
}

struct Stripped {
  Status status = Status::Ok;
  std::string bytes, reason;
};
Stripped Strip(const std::string& text, bool placesOnly) {
  const std::vector<uint8_t> file(text.begin(), text.end());
  Stripped result;
  FilePieces made;
  result.status = placesOnly ? StripPlaces(file, made, result.reason)
                             : StripPicture(file, kKeepUsually, made, result.reason);
  const std::vector<uint8_t> bytes = made.Joined();
  result.bytes.assign(bytes.begin(), bytes.end());
  return result;
}

constexpr std::string_view kSecret = "SECRETPLACEXSECRETPLACEY";

TEST(Strip, ErasesPlacesWhereverTheyAre) {
  const std::string secret(kSecret);
  // latitude and longitude that share their value
  const std::string shared =
      Block({0x8825, 4, 1, kBehind},
            Directory({{2, 5, 3, kBehind + 30}, {4, 5, 3, kBehind + 30}}) + secret);
  // the second of two pages has a place
  const std::string page =
      Directory({{0x8825, 4, 1, kBehind + 18}}) + Directory({{2, 5, 3, kBehind + 36}}) + secret;
  const std::string pages =
      "II*" + Number(0, 1) + Number(8, 4) + Directory({{0x0100, 3, 1, 1}}, kBehind) + page;
  // an XMP packet that the second page has
  const std::string xmp = " exif:GPSLatitude=\"" + secret + "\" ";
  const std::string packet =
      "II*" + Number(0, 1) + Number(8, 4) + Directory({{0x0100, 3, 1, 1}}, kBehind) +
      Directory({{700, 1, static_cast<uint32_t>(xmp.size()), kBehind + 18}}) + xmp;
  const struct {
    const char* name;
    std::string file;
  } rows[] = {{"shared", Jpeg(Exif(shared), "")},
              {"behind the picture", Jpeg("", Exif(shared))},
              {"two pages", pages},
              {"XMP of a page", packet}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Stripped stripped = Strip(row.file, true);
    EXPECT_EQ(stripped.status, Status::Ok) << stripped.reason;
    EXPECT_EQ(stripped.bytes.size(), row.file.size());
    EXPECT_EQ(stripped.bytes.find("PLACE"), std::string::npos);
  }
}

TEST(Strip, FindsPlacesInXmp) {
  const struct {
    const char *packet, *blanked;
  } rows[] = {
      {"<a exif:GPSLatitude='1' b='2'/>", "<a                      b='2'/>"},
      {"<a drone-dji:GpsLatitude = \"1\"/>", "<a                            />"},
      {"<e:GPSAltitude>1</e:GPSAltitude>x", "                                x"},
      {"<a xmlns:gps='u' b='exif:GPS c'/>", nullptr},
      {"<b>the exif:GPSLatitude of</b><a b='2'/>", nullptr},
      {"<a e:GPSx", nullptr},
      {"<a xmlns:p='http://ns.adobe.com/photoshop/1.0/' p:City='C'><p:State>S</p:State></a>",
       "<a xmlns:p='http://ns.adobe.com/photoshop/1.0/'           >                    </a>"},
      {"<a xmlns:p='urn:other' p:City='C'/>", nullptr},
  };
  for (const auto& row : rows) {
    std::string packet = row.packet;
    std::vector<uint8_t> bytes(packet.begin(), packet.end());
    EXPECT_EQ(BlankXmpPlaces(bytes), row.blanked != nullptr) << packet;
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()),
              row.blanked != nullptr ? row.blanked : packet);
  }
}

std::string App(uint8_t marker, const std::string& data) {
  const size_t size = 2 + data.size();
  return std::string("\xFF") + static_cast<char>(marker) + static_cast<char>(size >> 8) +
         static_cast<char>(size & 0xFF) + data;
}
std::string Md5(const std::string& text) {
  std::string digest = Md5Text({reinterpret_cast<const uint8_t*>(text.data()), text.size()});
  return UpperCase(digest);
}
std::string Extended(const std::string& digest, const std::string& packet, size_t from,
                     size_t end) {
  const auto number = [](uint32_t value) {
    return std::string{0, 0, static_cast<char>(value >> 8), static_cast<char>(value)};
  };
  return App(0xE1, std::string(kExtendedXmpHead) + digest +
                       number(static_cast<uint32_t>(packet.size())) +
                       number(static_cast<uint32_t>(from)) + packet.substr(from, end - from));
}

TEST(Strip, SplitPacketsAreOne) {
  const std::string packet = "<a e:GPSLatitude='PLACE' b='2'/>",
                    blank = "<a                       b='2'/>";
  const auto file = [](const std::string& content) {
    const std::string digest = Md5(content);
    return Jpeg(App(0xE1, std::string(kXmpHead) + "<x n:HasExtendedXMP='" + digest + "'/>") +
                    Extended(digest, content, 12, content.size()) +
                    Extended(digest, content, 0, 12),
                "");
  };
  const Stripped stripped = Strip(file(packet), true);
  EXPECT_EQ(stripped.status, Status::Ok) << stripped.reason;
  EXPECT_EQ(stripped.bytes, file(blank));
  // what is kept is complete
  FilePieces made;
  std::string reason;
  const std::string text = file(packet);
  const std::vector<uint8_t> bytes(text.begin(), text.end());
  ASSERT_EQ(StripPicture(bytes, kKeepXmp, made, reason), Status::Ok);
  EXPECT_TRUE(made.Are(bytes));
}

TEST(Strip, SplitExifIsOne) {
  // a GPS directory whose only value is in the second segment
  const std::string block = Block({0x8825, 4, 1, kBehind},
                                  Directory({{0x0002, 2, 5, 60}}) + std::string(16, 'x') + "PLACE");
  const std::string file = Jpeg(App(0xE1, std::string(kExifHead) + block.substr(0, 50)) +
                                    App(0xE1, std::string(kExifHead) + block.substr(50)),
                                "");
  const Stripped stripped = Strip(file, true);
  EXPECT_EQ(stripped.status, Status::Ok) << stripped.reason;
  EXPECT_EQ(stripped.bytes.size(), file.size());
  EXPECT_EQ(stripped.bytes.find("PLACE"), std::string::npos);
}

TEST(Strip, PlacesInIptcAreBlankAndDigestsRight) {
  const auto file = [](const std::string& city, bool right) {
    const std::string iptc = std::string("\x1C\2\x5A\0", 4) + "\5" + city;
    const std::string data(iptc), digest = right ? Md5(iptc) : std::string(32, '0');
    std::string bytes;
    for (size_t i = 0; i < 32; i += 2)
      bytes.push_back(static_cast<char>(std::stoi(digest.substr(i, 2), nullptr, 16)));
    return Jpeg(App(0xED, std::string(kPhotoshopHead) + std::string("8BIM\4\4\0\0\0\0\0\x0A", 12) +
                              data + std::string("8BIM\4\x25\0\0\0\0\0\x10", 12) + bytes),
                "");
  };
  for (const bool right : {true, false})
    EXPECT_EQ(Strip(file("PLACE", right), true).bytes, file("     ", right)) << right;
}

TEST(Strip, DoesNotPassOverOtherEncodings) {
  const std::string packet("<\0a\0 \0e\0:\0G\0P\0S\0=\0'\0'\0/\0>\0", 26);
  EXPECT_EQ(Strip(Jpeg(App(0xE1, std::string(kXmpHead) + packet), ""), true).status,
            Status::UnsuitableImage);
}

std::string PngFile(
    std::initializer_list<std::pair<std::string_view, std::vector<uint8_t>>> chunks) {
  std::string file(kPngSignature);
  for (const auto& [type, data] : chunks) {
    const std::vector<uint8_t> chunk = MakePngChunk(type, data);
    file.append(chunk.begin(), chunk.end());
  }
  return file;
}

TEST(Strip, RawProfilesOfPngFiles) {
  const auto bytes = [](const std::string& text) {
    return std::vector<uint8_t>(text.begin(), text.end());
  };
  const std::string xmp = "<a e:GPSLatitude='PLACE' b='2'/>", keyword = "Raw profile type ";
  const std::string exif =
      std::string(kExifHead) +
      Block({0x8825, 4, 1, kBehind}, Directory({{0x0002, 2, 5, 44}}) + "PLACE");
  const std::string iptc = std::string("\x1C\2\x5A\0\5", 5) + "PLACE";
  const struct {
    const char* name;
    std::string content;
  } rows[] = {{"exif", exif}, {"xmp", xmp}, {"iptc", iptc}, {"APP1", exif}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::vector<uint8_t> old = MakePngRawProfile(keyword + row.name, bytes(row.content));
    const Stripped stripped = Strip(PngFile({{"IHDR", {}}, {"zTXt", old}, {"IEND", {}}}), true);
    ASSERT_EQ(stripped.status, Status::Ok) << stripped.reason;
    const std::vector<uint8_t> made = bytes(stripped.bytes);
    PngChunks chunks(made);
    PngChunk chunk;
    while (chunks.Next(chunk) && chunk.type != "zTXt") continue;
    const std::vector<uint8_t> left = ReadPngRawProfile(chunk);
    EXPECT_EQ(left.size(), row.content.size());
    EXPECT_EQ(std::ranges::search(left, std::string_view("PLACE")).size(), 0u);
    EXPECT_NE(left, bytes(row.content));
  }
  const std::vector<uint8_t> damaged = bytes(keyword + std::string("exif\0\0x", 7));
  EXPECT_EQ(Strip(PngFile({{"IHDR", {}}, {"zTXt", damaged}, {"IEND", {}}}), true).status,
            Status::UnsuitableImage);
}

TEST(Strip, DoubledTagsBecomeOne) {
  const std::string text = "II*" + Number(0, 1) + Number(8, 4) +
                           Directory({{0x013B, 2, 8, 38}, {0x013B, 2, 8, 46}}) +
                           std::string("Before1\0Before2", 16);
  const std::vector<uint8_t> file(text.begin(), text.end());
  const DirectoryChange change{ExifPlace::First, 0x013B,
                               ExifEntry{0x013B, 2, 4, {'N', 'e', 'w', 0}}};
  DirectoryEdit edit;
  std::string reason;
  ASSERT_EQ(EditDirectories(file, {&change, 1}, edit, reason), Status::Ok) << reason;
  const std::vector<uint8_t> made = EditedBlock(file, std::move(edit));
  const std::string bytes(made.begin(), made.end());
  EXPECT_EQ(bytes.substr(8, 2), Number(1, 2));
  EXPECT_EQ(bytes.find("Before"), std::string::npos);
}

TEST(Strip, OtherUsersKeepTheirBytes) {
  // the image title shares its last bytes with the value that goes
  const std::string file = "II*" + Number(0, 1) + Number(8, 4) +
                           Directory({{0x010E, 2, 12, 8 + 30 + 18 + 12}, {0x8825, 4, 1, 8 + 30}}) +
                           Directory({{2, 5, 3, 8 + 30 + 18}}) + std::string(kSecret);
  const Stripped stripped = Strip(file, true);
  EXPECT_EQ(stripped.status, Status::Ok) << stripped.reason;
  EXPECT_EQ(stripped.bytes.find("SECRETPLACEX"), std::string::npos);
  EXPECT_NE(stripped.bytes.find("SECRETPLACEY"), std::string::npos);
}

TEST(Strip, SurvivesNestedStructures) {
  // EXIF within a value of EXIF that goes, behind the picture
  const std::string inner = Exif(
      Block({0x8825, 4, 1, kBehind}, Directory({{2, 5, 3, kBehind + 18}}) + std::string(kSecret)));
  const std::string outer = Exif(
      Block({0x8825, 4, 1, kBehind},
            Directory({{0x1B, 7, static_cast<uint32_t>(inner.size()), kBehind + 18}}) + inner));
  const Stripped nested = Strip(Jpeg("", outer), true);
  EXPECT_EQ(nested.status, Status::Ok) << nested.reason;
  EXPECT_EQ(nested.bytes.find("PLACE"), std::string::npos);

  // a GPS directory that leads to itself
  const std::string loop =
      Block({0x8825, 4, 1, kBehind}, Directory({{0x8825, 4, 1, kBehind}, {1, 2, 2, 'N'}}));
  EXPECT_EQ(Strip(loop, true).status, Status::UnsuitableImage);

  // XMP that covers the directory leading to the GPS directory
  std::string covered =
      "II*" + Number(0, 1) + Number(8, 4) + Directory({{700, 1, 100, 8}, {0x8825, 4, 1, 38}}) +
      Directory({{2, 5, 3, 56}}) + std::string(kSecret) + " exif:GPSLatitude=\"1\"";
  covered.resize(140);
  EXPECT_EQ(Strip(covered, true).status, Status::UnsuitableImage);
}

TEST(Strip, DirectoriesMayEndWithTheFile) {
  const std::string file = Block({0x8769, 4, 1, kBehind}, Directory({{0x9000, 7, 4, 0x30333230}}));
  const Stripped stripped = Strip(file.substr(0, file.size() - 4), false);
  EXPECT_EQ(stripped.status, Status::Ok) << stripped.reason;
  EXPECT_EQ(stripped.bytes.find("0230"), std::string::npos);
}

TEST(Strip, LeavesCameraRawPicturesAlone) {
  const std::string cr2 =
      "II*" + Number(0, 1) + Number(16, 4) + "CR" + Number(2, 6) + Directory({{0x0100, 3, 1, 1}});
  const struct {
    const char* name;
    std::string file;
  } rows[] = {
      {"DNG", Block({50706, 1, 4, 0x0401}, "")},
      {"color filters", Block({0x0106, 3, 1, 32803}, "")},
      {"in a subdirectory", Block({330, 4, 1, kBehind}, Directory({{0x0106, 3, 1, 32803}}))},
      {"CR2", cr2},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Stripped stripped = Strip(row.file, false);
    EXPECT_EQ(stripped.status, Status::UnsuitableImage);
    EXPECT_NE(stripped.reason, "");
  }
  EXPECT_EQ(Strip(Block({0x0106, 3, 1, 2}, ""), false).status, Status::Ok);
}

}  // namespace
}  // namespace fotomill::test
