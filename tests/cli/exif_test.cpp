#include <gmock/gmock.h>

#include <nlohmann/json.hpp>
#include <utility>

#include "core/limits.h"
#include "support/command_line.h"
#include "support/exif_blocks.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using testing::HasSubstr;

CommandResult Exif(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "exif");
  return RunCommand(arguments);
}

constexpr char kBlockText[] =
    "DIRECTORY IFD 0\n"
    "    Image input equipment manufacturer\tAcme\n"
    "    Orientation of image\tBottom Left\n"
    "    Exif tag\t126\n"
    "    GPS tag\t176\n"
    "    Unknown (50341)\t1 2 3 4\n"
    "DIRECTORY IFD 1\n"
    "    Compression scheme\tJPEG\n"
    "    Offset to JPEG SOI\t122\n"
    "    Bytes of JPEG data\t4\n"
    "DIRECTORY EXIF\n"
    "    Exposure time\t0.017\n"
    "    Exif version\t0220\n"
    "    Flash\tFire: Y Return: X Mode: A Function: P Redeye: N\n"
    "DIRECTORY GPS\n"
    "    GPS tag version\t2.2.0.0\n"
    "    North or South latitude\tSouth\n";

class ExifCommand : public testing::Test {
 protected:
  ExifCommand() { WriteBytes(picture, LittleEndianBlock()); }
  const TemporaryFolder folder;
  const ScopedSettings saved;  // commands load them
  const ScopedEnvironment data{"FOTOMILL_DATA", folder.Path("data")};
  const std::string picture = folder.Path("picture.tif");
};

TEST_F(ExifCommand, PrintsTheLinesOfTheViewer) {
  const CommandResult result = Exif({picture});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, kBlockText);
  EXPECT_EQ(Exif({picture, picture}).out, picture + "\n" + kBlockText + picture + "\n" + kBlockText);
  const uint32_t usual = std::exchange(limits.exifEntries, 3);
  EXPECT_THAT(Exif({picture}).err, HasSubstr("picture.tif: Not all EXIF entries are shown."));
  limits.exifEntries = usual;
}

TEST_F(ExifCommand, ShowsTypesWhenAsked) {
  const std::string lines = Exif({picture, "--set", "ExifShowTypes=1"}).out;
  EXPECT_THAT(lines, HasSubstr("    Orientation of image [SHORT]\tBottom Left\n"));
  EXPECT_THAT(lines, HasSubstr("    Unknown (50341) [UNDEFINED]\t1 2 3 4\n"));
}

TEST_F(ExifCommand, EscapesValues) {
  BlockBuilder blocks;
  const uint32_t text = blocks.Bytes(Hex("61 0A 1B 5B 6D 7F C3A9 C285 E9 00"));
  blocks.Patch32(4, blocks.Directory({{0x010e, 2, 11, text}}));
  WriteBytes(picture, blocks.block);
  EXPECT_EQ(Exif({picture}).out, "DIRECTORY IFD 0\n    Image title\ta\\n\\x1B[m\\x7F\xC3\xA9\\xC2\\x85\\xE9\n");
  const auto json = nlohmann::json::parse(Exif({"--json", picture}).out);
  EXPECT_EQ(json[0]["directories"][0]["entries"][0]["text"], "a\n\x1B[m\x7F\xC3\xA9\xC2\x85\xEF\xBF\xBD");
}

TEST_F(ExifCommand, PrintsJson) {
  WriteText(folder.Path("without.bmp"), "BM");
  WriteBytes(folder.Path("refused.tif"), Hex("4949 2B00 08000000"));
  const CommandResult result = Exif({"--json", picture, folder.Path("without.bmp"),
                                     folder.Path("refused.tif"), folder.Path("missing.jpg")});
  EXPECT_EQ(result.status, 1);
  const auto json = nlohmann::json::parse(result.out);
  ASSERT_EQ(json.size(), 4u);
  EXPECT_EQ(json[0]["file"], picture);
  EXPECT_EQ(json[0]["status"], 0);
  EXPECT_EQ(json[0]["message"], "Ok");
  ASSERT_EQ(json[0]["directories"].size(), 4u);
  EXPECT_EQ(json[0]["directories"][2]["label"], "EXIF");
  EXPECT_EQ(
      json[0]["directories"][0]["entries"][1],
      nlohmann::json::parse(R"({"tag": 274, "name": "Orientation of image", "type": 3, "count": 1,
                                      "text": "Bottom Left"})"));
  EXPECT_EQ(json[1]["status"], 0);
  EXPECT_EQ(json[1]["directories"], nlohmann::json::array());
  EXPECT_EQ(json[2]["status"], 2);
  EXPECT_EQ(json[2]["message"], "Damaged file.");
  EXPECT_EQ(json[3]["status"], 1);
  EXPECT_THAT(result.err, HasSubstr("missing.jpg: File open error."));
}

TEST_F(ExifCommand, ExtractsTheThumbnailWithoutReplacingAnything) {
  const std::string out = folder.Path("small.jpg");
  EXPECT_EQ(Exif({picture, "--thumbnail", out}).status, 0);
  EXPECT_EQ(ReadBytes(out), Hex("FFD8 FFD9"));
  const CommandResult stream = Exif({picture, "--thumbnail", "-"});
  EXPECT_EQ(stream.out, std::string("\xFF\xD8\xFF\xD9"));
  EXPECT_THAT(stream.err, HasSubstr("One file was processed."));
  EXPECT_EQ(RunCommand({"exif", picture, "--thumbnail", "-"}, {.output = true}).status, 2);
  WriteText(out, "mine");
  const CommandResult refused = Exif({picture, "--thumbnail", out});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("small.jpg: Error creating file."));
  EXPECT_EQ(ReadText(out), "mine");
  EXPECT_EQ(Exif({picture, "--thumbnail", out, "--overwrite", "replace"}).status, 0);
  EXPECT_EQ(ReadBytes(out), Hex("FFD8 FFD9"));
  EXPECT_EQ(Exif({picture, "--thumbnail", picture, "--overwrite", "replace"}).status, 2);
  EXPECT_EQ(ReadBytes(picture), LittleEndianBlock());
  EXPECT_EQ(Exif({picture, picture, "--thumbnail", folder.Path("other.jpg")}).status, 2);
  EXPECT_EQ(Exif({picture, "--thumbnail", folder.Path("none/other.jpg")}).status, 1);
  EXPECT_EQ(Exif({picture, "--thumbnail", ""}).status, 2);
  BlockBuilder plain;
  plain.Directory({{0x0100, 3, 1, 1}});
  WriteBytes(picture, plain.block);
  const CommandResult none = Exif({picture, "--thumbnail", folder.Path("other.jpg")});
  EXPECT_EQ(none.status, 1);
  EXPECT_THAT(none.err, HasSubstr("picture.tif: No images in this document."));
  EXPECT_EQ(folder.Names(), (std::vector<std::string>{"picture.tif", "small.jpg"}));
}

TEST_F(ExifCommand, MeasuresDistances) {
  const std::string kilometers = "ExifDistinceUnits=1";
  EXPECT_EQ(Exif({"--distance", "45,9", "46,9"}).out, "69.045 miles\n");
  EXPECT_EQ(Exif({"--distance", "45,9", "46,9", "--set", kilometers}).out, "111.125 kilometers\n");
  EXPECT_EQ(Exif({"--set", kilometers, "--distance", "-33.5,-70.25", "-34.5,-70.25"}).out, "111.125 kilometers\n");
  EXPECT_EQ(Exif({"--distance", "-.5,0", "+.5,0"}).out, "69.045 miles\n");
  EXPECT_EQ(Exif({picture, "--distance", "45,9", "46,9"}).out, std::string(kBlockText) + "69.045 miles\n");
  EXPECT_EQ(Exif({"--distance", "-45,9", "-46,9", picture}).out, std::string(kBlockText) + "69.045 miles\n");
  const auto json = nlohmann::json::parse(
      Exif({"--json", "--set", kilometers, "--distance", "45,9", "46,9"}).out);
  EXPECT_NEAR(json[0]["distance"], 111.125, 0.001);
  EXPECT_EQ(json[0]["unit"], "kilometers");
  for (const char* bad :
       {"", "45", "45,", ",9", "45,9,1", "45 9", "91,0", "nan,0", "1e400,0", "0,361", "45,9x"}) {
    SCOPED_TRACE(bad);
    const CommandResult result = Exif({"--distance", bad, "46,9"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.out, "");
  }
  EXPECT_EQ(Exif({"--distance", "45,9"}).status, 2);
  EXPECT_EQ(Exif({}).status, 2);
}

}  // namespace
}  // namespace fotomill::test
