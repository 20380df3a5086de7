// EXIF is stored in an eXIf chunk, XMP in an iTXt chunk with the keyword "XML:com.adobe.xmp",
// without compression, language or translated keyword. Older programs store the same in text chunks
// with the keyword "Raw profile type NAME".
// Source: W3C, "Portable Network Graphics (PNG) Specification (Third Edition)", 2025, sections
// 11.3.2.6 and 11.3.3.4; XMP specification part 3, section 1.1.5.
#include <zlib.h>

#include <algorithm>
#include <functional>

#include "containers/metadata_rewrite.h"
#include "containers/png_chunks.h"

namespace fotomill {

namespace {

constexpr std::string_view kExif = "eXIf", kText = "iTXt";
constexpr std::string_view kXmpHead("XML:com.adobe.xmp\0\0\0\0\0", 22);
constexpr std::string_view kXmpKeyword("XML:com.adobe.xmp\0", 18);
constexpr std::string_view kRawXmp("Raw profile type xmp\0", 21);

bool StartsWith(std::span<const uint8_t> bytes, std::string_view text) {
  return bytes.size() >= text.size() && TextOf(bytes.first(text.size())) == text;
}

std::vector<uint8_t> Chunk(std::string_view type, std::string_view head,
                           std::span<const uint8_t> block) {
  const size_t size = head.size() + block.size();
  std::vector<uint8_t> bytes(8 + size + 4);
  const auto put = [&](size_t at, uint64_t number) {
    for (size_t i = 0; i < 4; ++i) bytes[at + i] = static_cast<uint8_t>(number >> (24 - 8 * i));
  };
  put(0, size);
  auto place = std::ranges::copy(type, bytes.begin() + 4).out;
  std::ranges::copy(block, std::ranges::copy(head, place).out);
  put(8 + size, crc32(0, bytes.data() + 4, static_cast<uInt>(4 + size)));
  return bytes;
}

bool IsText(const PngPlace& chunk) {
  return chunk.type == kText || chunk.type == "tEXt" || chunk.type == "zTXt";
}
// In any of its forms, also compressed.
bool IsXmp(const PngPlace& chunk, std::span<const uint8_t> data) {
  if (chunk.type == kText && StartsWith(data, kXmpKeyword)) return true;
  return IsText(chunk) && StartsWith(data, kRawXmp);
}

// One kind of block to be written.
struct Wanted {
  const std::optional<std::vector<uint8_t>>& block;
  // whether an old chunk is of this kind
  std::function<bool(const PngPlace& chunk, std::span<const uint8_t> data)> is;
  std::string_view type, head;  // of the new chunk
  bool adds = true;             // if there is none
  bool there = false, done = false;
  bool Is(const PngPlace& chunk, std::span<const uint8_t> file) const {
    return is(chunk, file.subspan(chunk.data, chunk.size));
  }
};

}  // namespace

Status FindPngMetadata(std::span<const uint8_t> file, MetadataViews& views) {
  views = {};
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.End() > file.size()) return Status::FileReadError;
    const auto data = file.subspan(chunk.data, chunk.size);
    if (chunk.type == kExif && views.exif.empty()) views.exif = data;
    if (chunk.type == kText && views.xmp.empty() && StartsWith(data, kXmpHead))
      views.xmp = data.subspan(kXmpHead.size());
  }
  return walk.Outcome();
}

std::vector<uint8_t> MakePngChunk(std::string_view type, std::span<const uint8_t> data) {
  return Chunk(type, {}, data);
}
std::vector<uint8_t> MakePngXmpChunk(std::span<const uint8_t> packet) {
  return Chunk(kText, kXmpHead, packet);
}

Status RewritePng(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string&) {
  std::string_view keyword;  // of the text with IPTC
  if (blocks.iptc) keyword = TextOf(*blocks.iptc).substr(0, TextOf(*blocks.iptc).find('\0') + 1);
  const auto isExif = [](const PngPlace& chunk, std::span<const uint8_t>) {
    return chunk.type == kExif;
  };
  const auto isIptc = [keyword](const PngPlace& chunk, std::span<const uint8_t> data) {
    return IsText(chunk) && !keyword.empty() && StartsWith(data, keyword);
  };
  Wanted wanted[] = {{blocks.exif, isExif, kExif, {}},
                     {blocks.xmp, IsXmp, kText, kXmpHead},
                     {blocks.iptc, isIptc, "zTXt", {}, false}};
  made.Clear();
  uint64_t end = kPngSignature.size();
  {
    PngWalk walk(file);
    for (PngPlace chunk; walk.Next(chunk);) {
      if (chunk.End() > file.size()) return Status::FileReadError;
      for (Wanted& one : wanted) one.there = one.there || one.Is(chunk, file);
    }
    RETURN_IF_BAD(walk.Outcome());
  }
  made.Keep(file.first(end));
  const auto add = [&](Wanted& one) {
    if (!one.done && !one.block->empty()) made.Add(Chunk(one.type, one.head, *one.block));
    one.done = true;
  };
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    end = chunk.End();
    const bool pixels = chunk.type == "IDAT" || chunk.type == "IEND";
    Wanted* replaced = nullptr;
    for (Wanted& one : wanted) {
      if (!one.block) continue;
      if (pixels && !one.there && one.adds) add(one);
      if (one.Is(chunk, file)) replaced = &one;
    }
    if (replaced != nullptr) {
      add(*replaced);
    } else {
      made.Keep(file.subspan(chunk.data - 8, end - chunk.data + 8));
    }
  }
  made.Keep(file.subspan(end));
  return Status::Ok;
}

}  // namespace fotomill
