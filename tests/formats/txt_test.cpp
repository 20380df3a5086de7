#include "formats/text/txt.h"

#include <gtest/gtest.h>

#include "formats/text/fixed_font.h"
#include "formats/text/text_lines.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;
using Lines = std::vector<std::u32string>;

Bytes BytesOf(std::string_view text) { return {text.begin(), text.end()}; }
std::string TextOf(const Bytes& bytes) { return {bytes.begin(), bytes.end()}; }

TEST(Txt, SplitsLines) {
  const struct {
    const char* name;
    std::string text;
    TextCoding coding;
    Lines lines;
  } rows[] = {
      {"ends of three systems", "a\nb\r\nc\rd", TextCoding::Utf8, {U"a", U"b", U"c", U"d"}},
      {"empty lines", "\n\n\ra\n\n", TextCoding::Utf8, {U"", U"", U"", U"a", U""}},
      {"pages", "a\fb", TextCoding::Utf8, {U"a", U"b"}},
      {"tabs", "a\tb\t\tc\n\t", TextCoding::Utf8, {U"a       b               c", U"        "}},
      {"UTF-8 with its mark", "\xef\xbb\xbf\xc3\xa4\xe2\x82\xac", TextCoding::Utf8, {U"\u00e4\u20ac"}},
      {"Windows-1252", "\xe4\x80\x9f\x81", TextCoding::Windows1252, {U"\u00e4\u20ac\u0178\ufffd"}},
      {"UTF-16, little-endian", std::string("\xff\xfe" "a\0\xac\x20\x3d\xd8\x00\xde\x00\xd8z\0", 14), TextCoding::Utf16,
       {U"a\u20ac\U0001F600\ufffdz"}},
      {"UTF-16, big-endian", std::string("\xfe\xff\0a\x20\xac", 6), TextCoding::Utf16, {U"a\u20ac"}},
      {"marks and controls", "a\xcc\x88\x07\xe2\x80\x8b\x62", TextCoding::Utf8, {U"ab"}},
      {"nothing", "", TextCoding::Utf8, {}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    TextLines text;
    ASSERT_TRUE(ReadTextLines(BytesOf(row.text), true, text));
    EXPECT_EQ(text.coding, row.coding);
    EXPECT_EQ(text.lines, row.lines);
    EXPECT_FALSE(text.cutShort);
  }
  TextLines text;
  EXPECT_FALSE(ReadTextLines(BytesOf(std::string("a\0b", 3)), true, text));
}

TEST(Txt, BreaksLongLinesAndCutsLongTexts) {
  TextLines text;
  ASSERT_TRUE(ReadTextLines(BytesOf(std::string(501, 'a') + "\n" + std::string(500, 'b')), true, text));
  ASSERT_EQ(text.lines.size(), 3u);
  EXPECT_EQ(text.lines[1], U"a");
  EXPECT_EQ(text.columns, 500u);
  EXPECT_FALSE(text.cutShort);
  TextLines most, more, part;
  ASSERT_TRUE(ReadTextLines(Bytes(5000, '\n'), true, most));
  EXPECT_FALSE(most.cutShort);
  ASSERT_TRUE(ReadTextLines(Bytes(5001, '\n'), true, more));
  EXPECT_TRUE(more.cutShort);
  EXPECT_EQ(more.lines.size(), 5000u);
  ASSERT_TRUE(ReadTextLines(BytesOf("a\xe2\x82"), false, part));  // cut within a character
  EXPECT_EQ(part.coding, TextCoding::Utf8);
  EXPECT_TRUE(part.cutShort);
}

TEST(Txt, DrawsGlyphs) {
  const ScopedSettings scope;
  const Decoded decoded = Decode(TxtRead, BytesOf("\n A"));
  ASSERT_EQ(decoded.status, Status::Ok);
  const PackedImage& image = decoded.picture->image;
  EXPECT_EQ(image.Width(), 2 * 8 + 16);
  EXPECT_EQ(image.Height(), 2 * 13 + 16);
  const GlyphRows& glyph = GlyphOf('A');
  EXPECT_EQ(glyph[7], 0x7e);  // the bar of the letter
  for (int32_t y = 0; y < image.Height(); ++y) {
    const int32_t inLine = y - 8 - 13;
    const bool drawn = inLine >= 0 && inLine < 13;
    EXPECT_EQ(image.Row(y)[0], 0xff);
    EXPECT_EQ(image.Row(y)[2], drawn ? glyph[static_cast<size_t>(inLine)] ^ 0xff : 0xff) << y;
  }
  settings.InvertTextFiles = 1;
  const Decoded inverted = Decode(TxtRead, BytesOf("\n A"));
  EXPECT_EQ(inverted.picture->image.Row(8 + 13 + 7)[2], 0x7e);
  EXPECT_EQ(inverted.picture->image.Row(0)[0], 0);
  EXPECT_EQ(GlyphOf(0x4e00), GlyphOf(0xfffd));
  EXPECT_EQ(Decode(TxtRead, {}).status, Status::NoImages);
  EXPECT_EQ(Decode(TxtRead, BytesOf("\n\n")).status, Status::NoImages);
  EXPECT_EQ(Decode(TxtRead, Hex("89 50 4E 47 00")).status, Status::DamagedFile);
  EXPECT_EQ(Decode(TxtRead, Bytes(5001, '\n')).status, Status::NoImages);
  EXPECT_FALSE(Decode(TxtRead, Bytes(501 * 5000, 'x')).picture->note.empty());
}

TEST(Txt, WritesBrightnessAsCharacters) {
  const ScopedSettings scope;
  // White to black in 15 steps in two rows, then one white row.
  const PicturePointer picture = PatternPicture(15, 3, 24);
  for (int32_t x = 0; x < 15; ++x) {
    const int32_t gray = 255 - x * 255 / 14;
    for (int32_t y = 0; y < 3; ++y)
      SetPixel(picture->image, x, y, y < 2 ? gray * 0x10101 : 0xffffff);
  }
  EXPECT_EQ(TextOf(Encode(TxtWrite, *picture)), " .:-+|=%o#&XOB@\n               \n");
  settings.InvertTextFiles = 1;
  EXPECT_EQ(TextOf(Encode(TxtWrite, *picture)), "@BOX&#o%=|+-:. \n@@@@@@@@@@@@@@@\n");
  settings.InvertTextFiles = 0;
  const std::pair<const char*, const char*> levels[] = {
      {" \xe2\x96\x91\xe2\x96\x88", "     \xe2\x96\x91\xe2\x96\x91\xe2\x96\x91\xe2\x96\x91\xe2\x96\x91\xe2\x96\x88\xe2\x96\x88\xe2\x96\x88\xe2\x96\x88\xe2\x96\x88"},
      {"\xff\x80", "        \xe2\x82\xac\xe2\x82\xac\xe2\x82\xac\xe2\x82\xac\xe2\x82\xac\xe2\x82\xac\xe2\x82\xac"},
      {"\xc3\xbf#", "        #######"},  // a blank, as stored by other tools
      {"", " .:-+|=%o#&XOB@"},
      {"x", " .:-+|=%o#&XOB@"},
      {"\t\n", " .:-+|=%o#&XOB@"},
  };
  for (const auto& [setting, line] : levels) {
    settings.TextCharacterLevels = std::string_view(setting);
    const std::string text = TextOf(Encode(TxtWrite, *picture));
    EXPECT_EQ(text.substr(0, text.find('\n')), line) << setting;
  }
}

TEST(Txt, TwoPixelsShareACharacter) {
  const ScopedSettings scope;
  settings.TextCharacterLevels = std::string_view("0123456789");
  const PicturePointer picture = PatternPicture(3, 2, 1);
  const int32_t white[] = {1, 1, 0, 0, 1, 0};  // white above black, white, black
  for (int32_t i = 0; i < 6; ++i) SetPixel(picture->image, i % 3, i / 3, white[i]);
  EXPECT_EQ(TextOf(Encode(TxtWrite, *picture)), "509\n");
}

}  // namespace
}  // namespace fotomill::test
