#include "registry/registry.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <ranges>
#include <set>

#include "core/text.h"
#include "settings/key_table.h"
#include "support/files.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;

TEST(FindFormat, FirstRowThatMatchesWins) {
  constexpr int32_t kNone = kNoFormat;
  const struct {
    const char* name;
    int32_t row;
    // with AllowPluginFormatOverride, which skips disabled rows
    int32_t rowWithPlugins;
  } rows[] = {
      {"a.bmp", 2, 2},
      {"A.BMP", 2, 2},
      {"photo.jpeg", 56, 57},  // JPE comes before JPEG
      {"photo.jfif", 54, 55},
      {"photo.jpe", 56, 57},  // JPE is off, and JPEG has the same first three characters
      {"photo.jpg", 15, 15},
      {"scan.tiff", 32, 32},
      {"sky.fits", 8, 8},
      {"sky.fts", 51, 51},
      {"fax.cals", 42, 42},
      {"x.exe", 7, kNone},
      {"x.mpeg", 65, 65},
      {"x.mpg", 66, 66},
      {"x.avif", 0, 0},  // three characters suffice
      {"x.webm", 36, 36},
      {"x.wbm", 35, 35},
      {"x.we", kNone, kNone},  // a shorter one must match completely
      {"x.bm", kNone, kNone},
      {"x.b", kNone, kNone},
      {"x.bmpx", 2, 2},
      {"x.", kNone, kNone},
      {"x", kNone, kNone},
      {"", kNone, kNone},
      {"bmp", kNone, kNone},
      {".bmp", 2, 2},
      {"a.bmp/x", kNone, kNone},  // the dot belongs to the folder
      {"a.b/x.pcx", 21, 21},
      {"x.pcx.bak", kNone, kNone},
      {"x.clpbrd", kNone, kNone},
      {"x.clp", kNone, kNone},
      {"x.wllppr", 40, 40},
      {"x.b\xc3\xa4p", kNone, kNone},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(FindFormatByName(row.name), row.row);
    LetPluginsOverrideFormats(true);
    EXPECT_EQ(FindFormatByName(row.name), row.rowWithPlugins);
    LetPluginsOverrideFormats(false);
  }
}

TEST(FindFormat, PlugInsAreSearchedAndListedLast) {
  const size_t filter = OpenFileFilter().size(), destinations = DestinationExtensions().size();
  constexpr PluginSource kSource{[](std::string_view name, int32_t parameter) {
                                   return name == "x.heic" && parameter == 5 ? kSpareRow
                                                                             : kNoFormat;
                                 },
                                 [] {
                                   return std::vector<PluginFormatFacts>{
                                       {"HEIC", "", 24, false}, {"QOI", "Quite OK", 24, true}};
                                 },
                                 [] { return std::vector<PluginLibrary>(); }};
  InstallPluginSource(&kSource);
  EXPECT_EQ(FindFormatByName("x.heic", 5), kSpareRow);
  EXPECT_EQ(FindFormatByName("x.heic", 4), kNoFormat);
  EXPECT_EQ(FindFormatByName("x.bmp", 5), 2);
  EXPECT_EQ(OpenFileFilter().size(), filter + 2);
  EXPECT_EQ(OpenFileFilter().back().description, "(QOI) Plugin Quite OK");
  EXPECT_EQ(DestinationExtensions().size(), destinations + 1);
  EXPECT_EQ(DestinationExtensions().back(), "qoi");
  InstallPluginSource(nullptr);
  EXPECT_EQ(FindFormatByName("x.heic", 5), kNoFormat);
  EXPECT_EQ(OpenFileFilter().size(), filter);
}

TEST(FormatLists, FollowTheFlags) {
  const std::vector<int32_t> destinations = DestinationRows();
  EXPECT_EQ(destinations.size(), 35u);
  const std::vector<FilterPair> filter = OpenFileFilter();
  EXPECT_EQ(filter.size(), 1u + 75u);  // all pictures; no clipboard, wallpaper or spare row
  EXPECT_TRUE(filter[0].patterns.starts_with("*.AVI;*.BGA;*.BMP;")) << filter[0].patterns;
  EXPECT_TRUE(filter[0].patterns.ends_with("*.RAR;*.ZIP")) << filter[0].patterns;
  EXPECT_EQ(filter[3].description, "(BMP) Windows bitmap");
  EXPECT_EQ(filter[3].patterns, "*.BMP");
  const struct {
    int32_t row;
    bool destination, formatList, choice;
  } rows[] = {
      {9, false, true, true},     // GIF is animated
      {24, true, true, true},     // so is PNG, but it is saved anyway
      {7, true, true, false},     // EXE is off
      {39, false, false, false},  // clipboard
      {40, false, true, true},    // wallpaper
      {41, false, true, true},    // ANI and all later rows are secondary
      {kSpareRow, false, false, false},
  };
  const std::vector<int32_t> formatList = FormatListRows(), choice = ChoiceRows();
  for (const auto& row : rows) {
    SCOPED_TRACE(row.row);
    EXPECT_EQ(std::ranges::count(destinations, row.row), row.destination);
    EXPECT_EQ(std::ranges::count(formatList, row.row), row.formatList);
    EXPECT_EQ(std::ranges::count(choice, row.row), row.choice);
  }
  EXPECT_EQ(FormatListLine(2), "\xc3\x97\t(BMP) Windows bitmap");
  EXPECT_EQ(FormatListLine(7), " \t(EXE) Self-displaying image");
}

TEST(FormatLists, DestinationsAreOnlyThoseThatCanBeWritten) {
  const std::vector<std::string> extensions = DestinationExtensions();
  EXPECT_FALSE(extensions.empty());
  for (const int32_t row : DestinationRows()) {
    const std::string extension = LowerCase(FormatRow(row).extension.view());
    EXPECT_EQ(std::ranges::count(extensions, extension), CanWrite(FormatRow(row))) << extension;
  }
}

TEST(DescribeFileType, MatchesWholeExtensionsOfEnabledRows) {
  EXPECT_EQ(DescribeFileType("a.bmp"), "(BMP) Windows bitmap");
  EXPECT_EQ(DescribeFileType("a.jpeg"), "(JPEG) Jpeg");
  EXPECT_EQ(DescribeFileType("a.jpe"), "(JPE) JPE file");  // its row is off
  EXPECT_EQ(DescribeFileType("a.tiff"), "(TIFF) TIFF file");
  EXPECT_EQ(DescribeFileType("x.wllppr"), "(WLLPPR) WLLPPR file");
  EXPECT_EQ(DescribeFileType("x.clpbrd"), "(CLPBRD) CLPBRD file");
  EXPECT_EQ(DescribeFileType("x.xyz"), "(XYZ) XYZ file");
  EXPECT_EQ(DescribeFileType("x"), "()  file");
}

TEST(WritePicture, RejectsInOrder) {
  const TemporaryFolder folder;
  const struct {
    const char* name;
    int32_t bits;
    Status status;
  } rows[] = {
      {"x.abc", 24, Status::UnsupportedFormat},      {"x.gif", 24, Status::TooManyColors}, {"x.mac", 8, Status::TooManyColors},
      {"x.cdr", 24, Status::UnsupportedFunction},    {"x.cut", 24, Status::TooManyColors}, {"x.pcx", 24, Status::Ok},
      {"none/x.pcx", 24, Status::ErrorCreatingFile},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(3, 2, row.bits);
    EXPECT_EQ(WritePicture(*picture, folder.Path(row.name), {}), row.status);
  }
  const PicturePointer picture = MakePicture(3, 2, 24);
  EXPECT_EQ(WritePicture(*picture, folder.Path(std::string(300, 'x') + ".pcx"), {}), Status::InvalidDestination);
  EXPECT_FALSE(picture->image.Empty());
  EXPECT_EQ(WritePicture(*NewPictureRecord(), folder.Path("empty.pcx"), {}), Status::EmptyImage);
  EXPECT_THAT(folder.Names(), ElementsAre("x.pcx"));
}

TEST(WritePicture, KeepsTheSourceNameAndFlattensUnsupportedAlpha) {
  const TemporaryFolder folder;
  // Blue, green, red of 100, 150, 200 at alpha 0, 1, 128 and 255, on a background of red 10, green
  // 20, blue 30.
  const PicturePointer picture =
      MakePicture(4, 1, 24, {{100, 150, 200, 100, 150, 200, 100, 150, 200, 100, 150, 200}});
  ASSERT_EQ(NewAlphaPlane(4, 1, picture->alpha), Status::Ok);
  const uint8_t alphas[] = {0, 1, 128, 255};
  std::ranges::copy(alphas, picture->alpha.Row(0).begin());
  picture->alphaFlags = kHasAlpha | kFlattenOnBackground;
  picture->background = 0x1e140a;
  ASSERT_TRUE(picture->fileName.Assign("source.bmp"));

  ASSERT_EQ(WritePicture(*picture, folder.Path("keeps.bmp"), {}), Status::Ok);
  EXPECT_FALSE(picture->alpha.Empty());
  EXPECT_EQ(picture->workName.view(), "source.bmp");
  EXPECT_EQ(picture->fileName.view(), folder.Path("keeps.bmp"));

  ASSERT_EQ(WritePicture(*picture, folder.Path("flat.pcx"), {}), Status::Ok);
  EXPECT_TRUE(picture->alpha.Empty());
  EXPECT_THAT(RowOf(picture->image, 0), ElementsAre(30, 20, 10, 30, 21, 11, 65, 85, 105, 100, 150, 200));
}

TEST(WritePicture, FlatteningAPalettePictureMayMakeItTooDeep) {
  const TemporaryFolder folder;
  std::vector<uint8_t> grays(512);
  for (size_t i = 0; i < grays.size(); ++i) grays[i] = static_cast<uint8_t>(i);
  for (const uint8_t alpha : {uint8_t{255}, uint8_t{100}}) {
    SCOPED_TRACE(+alpha);
    const PicturePointer picture = MakePicture(512, 1, 8, {grays});
    ASSERT_EQ(NewAlphaPlane(512, 1, picture->alpha), Status::Ok);
    for (size_t x = 0; x < 512; ++x) picture->alpha.Row(0)[x] = x < 256 ? 255 : alpha;
    picture->alphaFlags = kHasAlpha | kFlattenOnBackground;
    // grays blended with red are no longer gray: twice as many colors
    picture->background = 0x0000ff;
    const Status status = WritePicture(*picture, folder.Path("x.fit"), {});
    EXPECT_EQ(status, Status::Ok);
    EXPECT_EQ(picture->bitsPerPixel, alpha == 255 ? 8 : 24);
    EXPECT_EQ(WritePicture(*picture, folder.Path("x.rle"), {}) == Status::TooManyColors, alpha != 255);
  }
}

TEST(LoadPicture, NoRecordWithoutAPicture) {
  const TemporaryFolder folder;
  WriteText(folder.Path("x.bmp"), "BM");
  PicturePointer picture = NewPictureRecord();
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("x.abc")}, picture), Status::UnsupportedFormat);
  EXPECT_EQ(picture, nullptr);
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("none.bmp")}, picture), Status::FileOpenError);
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("x.png")}, picture) == Status::Ok, false);
  EXPECT_NE(LoadPicture({.fileName = folder.Path("x.bmp")}, picture), Status::Ok);
  EXPECT_EQ(picture, nullptr);
  EXPECT_EQ(ReadPicture({}, *NewPictureRecord()), Status::UnsupportedFormat);
}

// A picture of 3 x 2 pixels with the extension of another format.
TEST(LoadPicture, OpensWrongExtensionsByContents) {
  const TemporaryFolder folder;
  const auto write = [&](const char* extension, const std::string& name) {
    const PicturePointer picture = MakePicture(3, 2, 8);
    const std::string made = folder.Path(std::string("made.") + extension);
    ASSERT_EQ(WritePicture(*picture, made, {}), Status::Ok);
    WriteBytes(folder.Path(name), ReadBytes(made));
  };
  const struct {
    const char* made;
    const char* name;
    IdentifyOptions identify;
    Status status;
    const char* row = "";
  } rows[] = {
      {"jpg", "photo.png", {}, Status::Ok, "JPG"},
      {"jpg", "photo.avi", {}, Status::Ok, "JPG"},  // the named row has no codec
      {"png", "photo.hrz", {}, Status::Ok, "PNG"},  // the named row returns another status
      {"gif", "noextension", {}, Status::Ok, "GIF"},
      {"tif", "photo.xyz", {}, Status::Ok, "TIF"},
      {"bmp", "photo.dib", {}, Status::Ok, "DIB"},  // the right extension: the named row reads it
      {"jpg", "photo.png", {.on = false}, Status::DamagedFile},
      {"jpg", "photo.png", {.exceptions = "EXE;PNGX;;pNg"}, Status::DamagedFile},
      {"jpg", "photo.png", {.exceptions = "PN;PNGX;"}, Status::Ok, "JPG"},
      {"jpg", "photo.scr", {}, Status::UnsupportedFunction},
      {"jpg", "photo.png", {.mostSide = 2}, Status::DamagedFile},
      {"jpg", "photo.png", {.mostSide = 3}, Status::Ok, "JPG"},
      {"png", "photo.png", {.mostSide = 2}, Status::Ok, "PNG"},  // applies to wrong ones only
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    write(row.made, row.name);
    const ReadRequest request{.fileName = folder.Path(row.name),
                              .options = {.identify = row.identify}};
    PicturePointer picture;
    EXPECT_EQ(LoadPicture(request, picture), row.status);
    ASSERT_EQ(picture != nullptr, row.status == Status::Ok);
    if (picture == nullptr) continue;
    EXPECT_EQ(picture->image.Width(), 3);
    EXPECT_EQ(FormatRow(picture->formatIndex).extension.view(), row.row);
    EXPECT_EQ(OpenedByContents(*picture), picture->formatIndex != FindFormatByName(row.name));
  }
}

TEST(LoadPicture, UnknownContentsKeepTheStatusOfTheName) {
  const TemporaryFolder folder;
  WriteText(folder.Path("cut.png"), "\xff\xd8\xff");
  WriteText(folder.Path("photo.pcx"), std::string("\0\0\0\x1c", 4) + "ftypavif....");
  WriteText(folder.Path("x.abc"), std::string("\0\0\0\x1c", 4) + "ftypavif....");
  PicturePointer picture;
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("cut.png")}, picture), Status::DamagedFile);
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("photo.pcx")}, picture), Status::DamagedFile);
  EXPECT_EQ(LoadPicture({.fileName = folder.Path("x.abc")}, picture), Status::UnsupportedFormat);
}

// Assumptions about rows made by loops and codecs.
TEST(Registry, RowsAreConsistent) {
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    SCOPED_TRACE(i);
    if (i == kSpareRow) continue;
    EXPECT_TRUE(row.info != nullptr && row.read != nullptr && row.write != nullptr);
    EXPECT_TRUE(row.maxBits == 1 || row.maxBits == 8 || row.maxBits == 24);
    EXPECT_EQ((row.flags & FMT_SECONDARY) != 0, i >= 41);
    EXPECT_EQ((row.flags & FMT_MULTI) != 0, (row.flags & FMT_PAGES) != 0 || i == 0 || i == 36 || i == 41 || i == 48 || i == 49);
    EXPECT_EQ(CanRead(row) && CanWrite(row), WhyNot(row).empty());
    EXPECT_TRUE(row.present == nullptr || !row.whyNot.empty()) << "nothing says what is missing";
    EXPECT_FALSE(row.description.empty()) << row.extension.view() << " has neither a codec nor facts in the table";
  }
}

TEST(Registry, HasEveryRowOfTheFamilies) {
  std::set<std::string_view> seen;
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    EXPECT_FALSE(family.empty());
    for (const FormatEntry& row : family) {
      SCOPED_TRACE(row.extension.view());
      EXPECT_TRUE(seen.insert(row.extension.view()).second) << "two families have this row";
      const auto same = [&](int32_t index) {
        return FormatRow(index).info == row.info &&
               FormatRow(index).extension.view() == row.extension.view();
      };
      EXPECT_TRUE(std::ranges::any_of(std::views::iota(0, formatCount), same)) << "the registry has no place for it";
    }
  }
}

TEST(Registry, SettingsOfFormatsAreKeys) {
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    for (const FormatSetting& setting : codec->keys)
      EXPECT_NE(FindKey(setting.key), nullptr) << setting.key;
  }
}

}  // namespace
}  // namespace fotomill::test
