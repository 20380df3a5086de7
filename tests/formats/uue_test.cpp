#include "formats/uuencode/uue.h"

#include <gtest/gtest.h>

#include "core/limits.h"
#include "formats/bmp/bmp.h"
#include "formats/uuencode/uuencode.h"
#include "platform/output_file.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes BytesOf(std::string_view text) { return {text.begin(), text.end()}; }

// A uuencoded file.
std::string Wrapped(const Bytes& bytes, std::string_view name) {
  const TemporaryFolder folder;
  ByteWriter out;
  EXPECT_TRUE(out.Create(folder.Path("text")));
  EncodeUuencoded(bytes, name, out);
  EXPECT_EQ(out.Commit(platform::Existing::Refuse), platform::CommitResult::Done);
  return ReadText(folder.Path("text"));
}

TEST(Uuencode, DecodesLines) {
  const struct {
    const char* name;
    const char* text;
    Status strict, relaxed;
    const char* inner;
    const char* bytes;  // if relaxed
  } rows[] = {
      {"three bytes", "begin 644 a.gif\n#0V%T\n`\nend\n", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"one byte, blanks for 0", "begin 644 a.gif\n!80  \n \nend\n", Status::Ok, Status::Ok, "a.gif", "a"},
      {"other ends of lines", "begin 0644 a.gif\r\n#0V%T\r\n`\r\nend\r\n", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"check characters", "begin 644 a.gif\n#0V%TZ\n`\nend\n", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"a letter before", "From: me\n\nbegin with\nbegin 644 a.gif\n#0V%T\n`\nend\n", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"folders", "begin 644 ../../etc/a b.gif\n#0V%T\n`\nend\n", Status::Ok, Status::Ok, "a b.gif", "Cat"},
      {"folders of Windows", "begin 644 C:\\x\\..\\a.gif\n#0V%T\n`\nend\n", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"a cut line", "begin 644 a.gif\n#0V\n`\nend\n", Status::DamagedFile, Status::Ok, "a.gif", "C`\1"},
      {"text between", "begin 644 a.gif\n-- part 2 --\n\n#0V%T\n`\nend\n", Status::DamagedFile, Status::Ok, "a.gif", "Cat"},
      {"no end", "begin 644 a.gif\n#0V%T\n", Status::FileReadError, Status::Ok, "a.gif", "Cat"},
      {"no last line", "begin 644 a.gif\n#0V%T\nend", Status::Ok, Status::Ok, "a.gif", "Cat"},
      {"cut in the last line", "begin 644 a.gif\n#0V", Status::FileReadError, Status::Ok, "a.gif", ""},
      {"base 64", "begin-base64 644 a.gif\nQ2F0\n====\n", Status::UnsupportedFormat, Status::UnsupportedFormat, "", ""},
      {"no permissions", "begin a.gif\n#0V%T\n`\nend\n", Status::DamagedFile, Status::DamagedFile, "", ""},
      {"nothing", "", Status::DamagedFile, Status::DamagedFile, "", ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    UuencodedFile strict, relaxed;
    EXPECT_EQ(DecodeUuencoded(BytesOf(row.text), false, strict), row.strict);
    EXPECT_EQ(DecodeUuencoded(BytesOf(row.text), true, relaxed), row.relaxed);
    if (row.relaxed != Status::Ok) continue;
    EXPECT_EQ(relaxed.name, row.inner);
    if (row.strict == Status::Ok) {
      EXPECT_EQ(strict.bytes, BytesOf(row.bytes));
      EXPECT_EQ(relaxed.bytes, strict.bytes);
    }
  }
  UuencodedFile cut;
  ASSERT_EQ(DecodeUuencoded(BytesOf("begin 644 a\n#0V\n`\nend\n"), true, cut), Status::Ok);
  EXPECT_EQ(cut.bytes, Hex("43 60 00"));  // missing data are 0
}

// Lines with only a byte count decode to 22 times their size.
TEST(Uuencode, KeepsToTheLimitOfMemory) {
  const Limits saved = limits;
  limits.fileMemoryBytes = 10000;
  std::string text = "begin 644 a\n";
  for (int i = 0; i < 200; ++i) text += "M\n";
  UuencodedFile file;
  EXPECT_EQ(DecodeUuencoded(BytesOf(text), true, file), Status::MemoryAllocationError);
  limits = saved;
}

TEST(Uuencode, EncodesLines) {
  EXPECT_EQ(Wrapped(BytesOf("Cat"), "a.gif"), "begin 644 a.gif\n#0V%T\n`\nend\n");
  EXPECT_EQ(Wrapped(Hex("00 00 00 FF"), "a\n/b"), "begin 644 a__b\n$````_P``\n`\nend\n");
  Bytes long46(46);
  for (size_t i = 0; i < long46.size(); ++i) long46[i] = static_cast<uint8_t>(i * 37);
  const std::string text = Wrapped(long46, "x");
  EXPECT_EQ(text.find('\n', 12) - 12, 61u);  // a line of 45 bytes
  UuencodedFile back;
  ASSERT_EQ(DecodeUuencoded(BytesOf(text), false, back), Status::Ok);
  EXPECT_EQ(back.bytes, long46);
}

TEST(Uue, ReadsTheEmbeddedFileByItsRow) {
  const ScopedSettings scope;
  const PicturePointer picture = PatternPicture(5, 3, 24);
  const Bytes bitmap = Encode(BmpWrite, *picture);
  const Bytes icon =
      Hex("4241 28000000 00000000 0000 0000 424D 1A000000 0000 0000 28000000 0C000000 0100 0100 "
          "0100 1800 010203 00");
  const std::string nested = Wrapped(BytesOf(Wrapped(bitmap, "a.bmp")), "a.uue");
  const struct {
    const char* name;
    std::string text;
    Status status;
    int32_t width;
  } rows[] = {
      {"a bitmap", Wrapped(bitmap, "a.bmp"), Status::Ok, 5},
      {"in a folder that is not followed", "begin 644 /etc/a.bmp" + Wrapped(bitmap, "").substr(10), Status::Ok, 5},
      {"a name that lies", Wrapped(bitmap, "a.gif"), Status::Ok, 5},
      {"a name of OS/2", Wrapped(icon, "a.ico"), Status::Ok, 1},
      {"no extension", Wrapped(bitmap, "picture"), Status::Ok, 5},
      {"a longer extension", Wrapped(BytesOf("text"), "a.txts"), Status::Ok, 4 * 8 + 16},
      {"text within text", nested, Status::UnsupportedFormat, 0},
      {"that says to be something else", Wrapped(BytesOf(Wrapped(bitmap, "a.bmp")), "a"), Status::UnsupportedFormat, 0},
      {"an archive", Wrapped(Hex("504B0304 00000000"), "a.zip"), Status::UnsupportedFormat, 0},
      {"something else", Wrapped(Hex("01 02 03"), "a.xyz"), Status::UnsupportedFormat, 0},
      {"a damaged picture", Wrapped(Hex("474946383961 0000"), "a.gif"), Status::FileReadError, 0},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded described = Describe(UueInfo, BytesOf(row.text)),
                  decoded = Decode(UueRead, BytesOf(row.text));
    if (row.status == Status::FileReadError) {
      EXPECT_NE(decoded.status, Status::Ok);
      continue;
    }
    EXPECT_EQ(described.status, row.status);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(decoded.picture->image.Width(), row.width);
    if (row.status == Status::Ok) {
      EXPECT_EQ(described.picture->width, row.width);
      EXPECT_EQ(described.picture->fileSize, row.text.size());
      EXPECT_TRUE(described.picture->typeName.view().starts_with("UUEncoded "));
    }
  }
  const std::string stray = "begin 644 a.bmp\n\n" + Wrapped(bitmap, "a.bmp").substr(16);
  EXPECT_EQ(Decode(UueRead, BytesOf(stray)).status, Status::DamagedFile);
  settings.RelaxedUUE = 1;
  EXPECT_EQ(Decode(UueRead, BytesOf(stray)).status, Status::Ok);
}

TEST(Uue, ChoosesTheEmbeddedFormat) {
  const TemporaryFolder folder;
  const std::pair<int32_t, const char*> rows[] = {{1, ".gif"}, {8, ".gif"}, {24, ".jpg"}};
  for (const auto& [bits, extension] : rows) {
    const PicturePointer picture = PatternPicture(9, 5, bits);
    picture->fileName.AssignCut(folder.Path("a b.uue"));
    ASSERT_EQ(UueWrite(*picture, {}), Status::Ok);
    EXPECT_EQ(picture->fileName.view(), folder.Path("a b.uue"));
    EXPECT_EQ(picture->lostMetadata != 0, bits < 24);
    EXPECT_TRUE(ReadText(folder.Path("a b.uue")).starts_with(std::string("begin 644 a b") + extension + "\n"));
    const Decoded decoded = Decode(UueRead, ReadBytes(folder.Path("a b.uue")));
    ASSERT_EQ(decoded.status, Status::Ok);
    if (bits < 24) {
      EXPECT_EQ(PixelText(decoded.picture->image), PixelText(picture->image));
    }
  }
}

}  // namespace
}  // namespace fotomill::test
