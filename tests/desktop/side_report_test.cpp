#include <gtest/gtest.h>

#include <numeric>

#include "desktop/models/drawing/histogram.h"
#include "desktop/models/drawing/wrapped_text.h"
#include "desktop/models/info/side_report.h"
#include "picture/packed_image.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "support/files.h"

namespace fotomill::desktop {
namespace {

PicturePointer GrayPicture(int32_t width, int32_t height, uint8_t level) {
  PicturePointer picture = NewPictureRecord();
  EXPECT_EQ(NewPackedImage(width, height, nullptr, 24, picture->image), Status::Ok);
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < 3 * width; ++x) picture->image.Row(y)[static_cast<size_t>(x)] = level;
  }
  picture->width = width;
  picture->height = height;
  picture->bitsPerPixel = 24;
  return picture;
}

FolderItem ItemOf(const test::TemporaryFolder& folder, const std::string& name) {
  const platform::FileFacts facts = platform::FactsOf(folder.Path(name));
  FolderItem item;
  item.name = name;
  item.folder = facts.kind == platform::FileKind::Folder;
  item.size = facts.size;
  item.modified = facts.modified;
  return item;
}

TEST(Histogram, CountsChannelsAndSamplesLargePictures) {
  PicturePointer picture = GrayPicture(4, 2, 10);
  picture->image.Row(0)[2] = 200;  // red of the first pixel
  const Histogram histogram = HistogramOf(picture->image);
  EXPECT_EQ(histogram.red[10], 7u);
  EXPECT_EQ(histogram.red[200], 1u);
  EXPECT_EQ(histogram.green[10], 8u);
  const Histogram large = HistogramOf(GrayPicture(3000, 2000, 10)->image);
  EXPECT_GT(large.blue[10], 1'000'000u);
  EXPECT_LT(large.blue[10], 3'000'000u);
}

TEST(Histogram, DrawsRelativeToTheMostFrequentInnerLevel) {
  Histogram histogram;
  histogram.red[0] = 1'000'000;  // a black border
  histogram.red[64] = 100;
  histogram.green[192] = 25;
  const Shade white{255, 255, 255};
  const RgbImage drawn = HistogramPixels(histogram, 256, 20, white);
  const auto filled = [&](int32_t column) {
    int rows = 0;
    for (int32_t y = 0; y < drawn.height; ++y) {
      const uint8_t* const pixel = drawn.Row(y) + 3 * column;
      rows += pixel[0] != 255 || pixel[1] != 255 || pixel[2] != 255;
    }
    return rows;
  };
  EXPECT_EQ(filled(0), 20);  // cut off
  EXPECT_EQ(filled(64), 20);
  EXPECT_EQ(filled(192), 10);  // square root of a quarter
  EXPECT_EQ(filled(100), 0);
  EXPECT_GT(drawn.Row(19)[3 * 64], drawn.Row(19)[3 * 64 + 1]);  // red
  EXPECT_TRUE(HistogramPixels(histogram, 0, 20, white).Empty());
}

TEST(WrapText, BreaksBetweenWordsOrInsideLongOnes) {
  const auto wrapped = [](std::string_view text) {
    const auto lines = WrapText(text, [](const std::string& line) { return line.size() <= 6; });
    return std::accumulate(lines.begin(), lines.end(), std::string(),
                           [](const auto& all, const auto& line) { return all + line + "|"; });
  };
  struct Case {
    const char *text, *lines;
  };
  constexpr Case kCases[] = {
      {"", "|"},
      {"one two", "one|two|"},
      {"one  to x", "one to|x|"},
      {"abcdefghi jk", "abcdef|ghi jk|"},
      {"a\r\n\nb", "a||b|"},
      {"\u00e4\u00f6\u00fc\u00e4\u00f6", "\u00e4\u00f6\u00fc|\u00e4\u00f6|"},
  };
  for (const Case& row : kCases) EXPECT_EQ(wrapped(row.text), row.lines) << row.text;
  const auto never = [](const std::string&) { return false; };
  EXPECT_EQ(WrapText("\u00e4b", never), (std::vector<std::string>{"\u00e4", "b"}));
}

TEST(SideReport, ShowsPicturesFoldersAndProblems) {
  const test::TemporaryFolder folder;
  const PicturePointer picture = GrayPicture(300, 200, 90);
  constexpr std::string_view kComment = "A gray day \n";
  picture->comment.assign(kComment.begin(), kComment.end());
  ASSERT_EQ(WritePicture(*picture, folder.Path("gray.png"), {}), Status::Ok);
  const auto read = [&](const std::string& name) {
    return ReadSideReport(folder.Path(""), ItemOf(folder, name),
                          {.side = 60, .read = {}, .tags = {}}, {});
  };
  const SideReport whole = read("gray.png");
  EXPECT_EQ(whole.preview.width, 60);
  EXPECT_EQ(whole.preview.height, 40);
  EXPECT_EQ(whole.histogram.red[90], 60'000u);
  EXPECT_EQ(whole.facts.at(1), "300 x 200 pixels, 24 bits");
  EXPECT_EQ(whole.comment, "A gray day");
  EXPECT_EQ(whole.remark, "");
  EXPECT_NE(whole.Text().find("gray.png\n(PNG)"), std::string::npos) << whole.Text();

  ASSERT_TRUE(platform::MakeFolders(folder.Path("sub")));
  test::WriteBytes(folder.Path("sub/wrong.bmp"), test::ReadBytes(folder.Path("gray.png")));
  test::WriteText(folder.Path("empty.gif"), "");
  EXPECT_NE(read("sub/wrong.bmp").remark, "");
  EXPECT_FALSE(read("sub/wrong.bmp").preview.Empty());
  EXPECT_NE(read("empty.gif").remark, "");
  EXPECT_TRUE(read("empty.gif").preview.Empty());
  EXPECT_EQ(read("sub").facts.at(0), "1 file");
}

}  // namespace
}  // namespace fotomill::desktop
