#include "formats/drhalo/halo_palette.h"

#include <algorithm>
#include <string_view>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "picture/write_options.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 40, kColorSize = 6, kBlockSize = 512;
constexpr uint64_t kFileSize = 4 * kBlockSize;    // of 256 colors
constexpr uint64_t kMostBytes = 64 * kBlockSize;  // maximum size of a palette file
constexpr std::string_view kMagic = "AH", kName = "Dr. Halo";
constexpr uint16_t kVersion = 0xE3, kType = 10, kHighest = 255;

// The actual offset of a color that would start at `offset`.
constexpr uint64_t ColorOffset(uint64_t offset) {
  return kBlockSize - offset % kBlockSize < kColorSize ? (offset / kBlockSize + 1) * kBlockSize
                                                       : offset;
}

uint8_t Scale(uint16_t value, uint16_t highest) {
  return static_cast<uint8_t>((std::min(value, highest) * 255u + highest / 2) / highest);
}

bool ParsePalette(std::span<const uint8_t> file, Palette& palette) {
  ByteReader bytes(file);
  const bool magic = bytes.Match(kMagic);
  bytes.Seek(12);
  const uint16_t highestIndex = bytes.Le16();
  uint16_t highest[3];
  for (uint16_t& value : highest) value = bytes.Le16();
  bytes.Seek(kHeaderSize);
  const bool sound = magic && bytes.Ok() && highestIndex < 256 &&
                     std::ranges::all_of(highest, [](uint16_t value) { return value > 0; });
  if (!sound) return false;
  Palette read{};
  for (size_t i = 0; i <= highestIndex; ++i) {
    bytes.Seek(ColorOffset(bytes.Position()));
    for (size_t c = 0; c < 3; ++c) read[3 * i + c] = Scale(bytes.Le16(), highest[c]);
  }
  if (bytes.Ok()) palette = read;
  return bytes.Ok();
}

bool IsUpperCase(std::string_view extension) {
  return std::ranges::none_of(extension, [](char c) { return c >= 'a' && c <= 'z'; }) &&
         !extension.empty();
}

std::string WithExtension(const std::string& pictureName, std::string_view extension) {
  platform::PathParts parts = platform::SplitPath(pictureName);
  parts.extension = extension;
  return platform::JoinPath(parts);
}

void WriteColors(ByteWriter& out, const Palette& palette) {
  out.Text(kMagic);
  out.Le16(kVersion);
  out.Le16(static_cast<uint16_t>(kFileSize - kHeaderSize));
  out.Le16(kType);
  out.Le32(0);
  for (int i = 0; i < 4; ++i) out.Le16(kHighest);  // for the index and three colors
  out.Text(kName);
  out.Zeros(kHeaderSize - out.Position());
  for (size_t i = 0; i < palette.size(); i += 3) {
    out.Zeros(ColorOffset(out.Position()) - out.Position());
    for (size_t c = 0; c < 3; ++c) out.Le16(palette[i + c]);
  }
  out.Zeros(kFileSize - out.Position());
}

}  // namespace

std::string HaloPaletteName(const std::string& pictureName) {
  const bool upper = IsUpperCase(platform::ExtensionOf(pictureName));
  return WithExtension(pictureName, upper ? ".PAL" : ".pal");
}

HaloPaletteResult ReadHaloPalette(const std::string& pictureName, Palette& palette) {
  const std::string names[] = {HaloPaletteName(pictureName), WithExtension(pictureName, ".pal"),
                               WithExtension(pictureName, ".PAL"),
                               WithExtension(pictureName, ".Pal")};
  for (const std::string& name : names) {
    platform::FileView file;
    if (!file.OpenHead(name.c_str(), kMostBytes)) continue;
    return ParsePalette(file.Bytes(), palette) && file.Intact() ? HaloPaletteResult::Read
                                                                : HaloPaletteResult::Damaged;
  }
  return HaloPaletteResult::Missing;
}

Status HaloPaletteFile::Write(const std::string& path, const Palette& palette,
                              platform::Existing existing) {
  std::string previous;
  const auto found = platform::ReadWholeFile(path, kMostBytes, previous);
  const bool replaces = found == platform::ReadResult::Done && previous.starts_with(kMagic) &&
                        existing == platform::Existing::Replace;
  if (!replaces && found != platform::ReadResult::Missing) return Status::ErrorCreatingFile;
  ByteWriter out;
  if (!out.Create(path)) return Status::ErrorCreatingFile;
  WriteColors(out, palette);
  RETURN_IF_BAD(CommitStatus(
      out.Commit(replaces ? platform::Existing::Replace : platform::Existing::Refuse)));
  path_ = path;
  previous_ = std::move(previous);
  return Status::Ok;
}

HaloPaletteFile::~HaloPaletteFile() {
  if (path_.empty()) return;
  if (previous_.empty()) {
    (void)platform::DeleteFile(path_);
  } else {
    (void)platform::WriteWholeFile(path_, previous_);
  }
}

}  // namespace fotomill
