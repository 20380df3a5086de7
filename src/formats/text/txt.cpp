// Text files (TXT).
//
// The reader draws the text with the glyphs of fixed_font.h in fixed columns, with a margin around
// it. Pictures are black on white, with InvertTextFiles white on black. Long lines are broken, and
// long texts cut, see text_lines.h.
//
// The writer converts one pixel horizontally and two vertically to a character, since characters
// are about twice as high as wide, by the average brightness of the two pixels. TextCharacterLevels
// has the characters, ordered from the least to the most ink, in UTF-8, or if it is not valid
// UTF-8, in Windows-1252. The byte 0xFF, a blank in DOS character sets, stands for a blank.
// InvertTextFiles reverses the order, for light text on a dark screen. Lines end in line feeds; the
// file is UTF-8.
#include "formats/text/txt.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <vector>

#include "core/byte_writer.h"
#include "core/limits.h"
#include "core/utf8.h"
#include "formats/text/fixed_font.h"
#include "formats/text/text_lines.h"
#include "platform/file_view.h"
#include "processing/palette/two_colors.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kMargin = 8;  // pixels, a whole byte
constexpr char32_t kDosBlank = 0xff, kNoBreak = 0xa0;

Status ReadText(const std::string& fileName, PictureRecord& picture, TextLines& text) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(fileName.c_str(), limits.textScanBytes)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  const bool whole = file.Bytes().size() == file.FileSize();
  if (!ReadTextLines(file.Bytes(), whole, text)) return Status::DamagedFile;
  if (!file.Intact()) return Status::FileReadError;
  return text.columns == 0 ? Status::NoImages : Status::Ok;
}

Status DescribePicture(const ReadRequest& request, PictureRecord& picture, TextLines& text) {
  constexpr const char* kNames[] = {"Text, UTF-8", "Text, UTF-16", "Text, Windows-1252"};
  RETURN_IF_BAD(ReadText(request.fileName, picture, text));
  picture.typeName.AssignCut(kNames[static_cast<size_t>(text.coding)]);
  picture.width = static_cast<int32_t>(text.columns) * kGlyphWidth + 2 * kMargin;
  picture.height = static_cast<int32_t>(text.lines.size()) * kGlyphHeight + 2 * kMargin;
  picture.bitsPerPixel = 1;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, 1);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  picture.palette = BlackAndWhite(true);
  picture.note.AssignCut(text.cutShort ? "The picture shows the beginning of the text." : "");
  return Status::Ok;
}

// Draws a line of text into the rows starting at `top`; `paper` is 0xFF for black on white.
void DrawLine(const std::u32string& line, int32_t top, uint8_t paper, PackedImage& image) {
  for (size_t i = 0; i < line.size(); ++i) {
    const GlyphRows& glyph = GlyphOf(line[i]);
    for (int32_t y = 0; y < kGlyphHeight; ++y)
      image.Row(top + y)[kMargin / 8 + i] = glyph[static_cast<size_t>(y)] ^ paper;
  }
}

Status DrawText(const TextLines& text, uint8_t paper, const PictureRecord& picture,
                PackedImage& image) {
  for (int32_t y = 0; y < image.Height(); ++y)
    std::ranges::fill(image.Row(y).first(static_cast<size_t>(image.Width()) / 8), paper);
  for (size_t i = 0; i < text.lines.size(); ++i) {
    const int32_t top = kMargin + static_cast<int32_t>(i) * kGlyphHeight;
    DrawLine(text.lines[i], top, paper, image);
    for (int32_t y = 0; y < kGlyphHeight; ++y) RETURN_IF_BAD(picture.ReportRow(top + y));
  }
  return Status::Ok;
}

// A character in UTF-8.
std::string Utf8Of(char32_t c) {
  const auto more = [&](int shift) { return static_cast<char>(0x80 | (c >> shift & 0x3f)); };
  if (c < 0x80) return {static_cast<char>(c)};
  if (c < 0x800) return {static_cast<char>(0xc0 | c >> 6), more(0)};
  if (c < 0x10000) return {static_cast<char>(0xe0 | c >> 12), more(6), more(0)};
  return {static_cast<char>(0xf0 | c >> 18), more(12), more(6), more(0)};
}

// The characters of the setting, each in UTF-8.
std::vector<std::string> SplitLevels(std::string_view setting) {
  std::vector<std::string> levels;
  const bool utf8 = IsUtf8(setting);
  while (!setting.empty()) {
    char32_t c = WindowsCharacter(static_cast<uint8_t>(setting.front()));
    if (utf8) {
      c = NextCharacter(setting, c);
    } else {
      setting.remove_prefix(1);
    }
    if (!TakesNoRoom(c)) levels.push_back(Utf8Of(c == kDosBlank || c == kNoBreak ? ' ' : c));
  }
  return levels;
}

// The character for each brightness.
using Characters = std::array<std::string, 256>;

Characters MakeCharacters(const EncodeOptions& encode) {
  std::vector<std::string> levels = SplitLevels(encode.textLevels);
  if (levels.size() < 2) levels = SplitLevels(kTextLevels);
  if (encode.textInverted) std::ranges::reverse(levels);
  Characters characters;
  for (size_t gray = 0; gray < characters.size(); ++gray)
    characters[gray] = levels[(255 - gray) * levels.size() / characters.size()];
  return characters;
}

// The luma of a row, times 256.
void AddLuma(const uint8_t* bgr, std::span<uint32_t> sums) {
  for (uint32_t& sum : sums) {
    sum += 29u * bgr[0] + 150u * bgr[1] + 77u * bgr[2];
    bgr += 3;
  }
}

Status WriteLines(ByteWriter& out, const PictureRecord& picture, const Characters& characters) {
  const PackedImage& image = picture.image;
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(image));
  std::vector<uint32_t> sums(static_cast<size_t>(image.Width()));
  for (int32_t y = 0; y < image.Height() && !out.Failed(); y += 2) {
    const int32_t count = std::min(2, image.Height() - y);
    std::ranges::fill(sums, 0u);
    for (int32_t i = 0; i < count; ++i) {
      RETURN_IF_BAD(picture.ReportRow(y + i));
      AddLuma(rows.Row(y + i), sums);
    }
    for (const uint32_t sum : sums) {
      const std::string& character = characters[sum / (256 * static_cast<uint32_t>(count))];
      std::memcpy(out.Reserve(4), character.data(), character.size());
      out.Used(character.size());
    }
    out.Text("\n");
  }
  return Status::Ok;
}

}  // namespace

Status TxtInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  if (request.signedOnly) return Status::UnsupportedFormat;
  TextLines text;
  return DescribePicture(request, picture, text);
}

Status TxtRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  TextLines text;
  RETURN_IF_BAD(DescribePicture(request, picture, text));
  PackedImage image;
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, 1, image));
  const uint8_t paper = request.options.textInverted ? 0 : 0xff;
  RETURN_IF_BAD(DrawText(text, paper, picture, image));
  picture.image = std::move(image);
  return Status::Ok;
}

Status TxtWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WriteLines(out, picture, MakeCharacters(options.encode)));
  return CommitOutput(out, options);
}

}  // namespace fotomill
