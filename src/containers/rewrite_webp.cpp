// Metadata requires a VP8X chunk, which is added to files with a single chunk: flags (4 bytes),
// width and height minus one (3 bytes each).
// Source: RFC 9649, sections 2.5 to 2.7; RFC 6386, section 9.1.
#include <algorithm>

#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint8_t kExifFlag = 0x08, kXmpFlag = 0x04, kAlphaFlag = 0x10;
constexpr uint64_t kExtendedSize = 10;

void PutLittle(std::vector<uint8_t>& bytes, uint64_t number, int count) {
  for (int i = 0; i < count; ++i) bytes.push_back(static_cast<uint8_t>(number >> 8 * i));
}

std::vector<uint8_t> Chunk(std::string_view name, std::span<const uint8_t> head,
                           std::span<const uint8_t> block) {
  std::vector<uint8_t> bytes(name.begin(), name.end());
  PutLittle(bytes, head.size() + block.size(), 4);
  bytes.insert(bytes.end(), head.begin(), head.end());
  bytes.insert(bytes.end(), block.begin(), block.end());
  if (bytes.size() % 2 != 0) bytes.push_back(0);
  return bytes;
}

// The VP8X chunk for a file with a single chunk; empty if that is invalid.
std::vector<uint8_t> Extended(const RiffPlace& chunk, std::span<const uint8_t> data) {
  ByteReader bytes(data);
  uint32_t width = 0, height = 0;
  uint8_t flags = 0;
  if (chunk.name == "VP8L") {
    if (bytes.U8() != 0x2F) return {};
    const uint32_t bits = bytes.Le32();
    width = (bits & 0x3FFF) + 1;
    height = (bits >> 14 & 0x3FFF) + 1;
    if ((bits >> 28 & 1) != 0) flags = kAlphaFlag;
  } else {
    bytes.Skip(3);
    if (!bytes.Match("\x9D\x01\x2A")) return {};
    width = bytes.Le16() & 0x3FFF;
    height = bytes.Le16() & 0x3FFF;
  }
  if (!bytes.Ok() || width == 0 || height == 0) return {};
  std::vector<uint8_t> made = {flags, 0, 0, 0};
  PutLittle(made, width - 1, 3);
  PutLittle(made, height - 1, 3);
  return Chunk("VP8X", {}, made);
}

// A chunk of the file.
struct Part {
  std::string_view name;
  std::span<const uint8_t> whole, data;
};

Status Split(std::span<const uint8_t> file, std::vector<Part>& parts, uint64_t& end) {
  if (!IsRiff(file, "WEBP")) return Status::DamagedFile;
  ByteReader header(file.subspan(4));
  const uint64_t size = 8 + uint64_t{header.Le32()};
  if (size > file.size()) return Status::FileReadError;
  end = kRiffHead;
  RiffWalk walk(file.first(size));
  for (RiffPlace chunk; walk.Next(chunk);) {
    ByteReader length(file.subspan(chunk.data - 4));
    if (length.Le32() != chunk.size) return Status::FileReadError;  // the file is truncated
    end = std::min(chunk.data + chunk.size + chunk.size % 2, size);
    parts.push_back({chunk.name, file.subspan(chunk.data - 8, end - chunk.data + 8),
                     file.subspan(chunk.data, chunk.size)});
  }
  return parts.empty() ? Status::DamagedFile : Status::Ok;
}

bool IsPixels(std::string_view name) {
  return name == "VP8 " || name == "VP8L" || name == "ANMF" || name == "ALPH";
}

struct Wanted {
  const std::optional<std::vector<uint8_t>>& block;
  std::string_view name;
  uint8_t flag;
  bool there = false, done = false;
};

class WebpRewrite {
 public:
  WebpRewrite(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
              std::string& reason)
      : file_(file),
        made_(made),
        reason_(reason),
        wanted_{{blocks.exif, "EXIF", kExifFlag}, {blocks.xmp, "XMP ", kXmpFlag}} {}

  Status Run() {
    uint64_t end = 0;
    RETURN_IF_BAD(Split(file_, parts_, end));
    for (Wanted& wanted : wanted_) {
      wanted.there = std::ranges::find(parts_, wanted.name, &Part::name) != parts_.end();
    }
    made_.Clear();
    if (parts_[0].name != "VP8X" && Adds()) {
      std::vector<uint8_t> extended = Extended({.name = parts_[0].name}, parts_[0].data);
      if (extended.empty()) return Status::DamagedFile;
      extended[8] |= Flags(0);
      Push(std::move(extended));
    }
    for (size_t i = 0; i < parts_.size(); ++i) Add(i);
    for (Wanted& wanted : wanted_) Put(wanted, {});
    return Finish(end);
  }

 private:
  bool Adds() const {
    return std::ranges::any_of(wanted_,
                               [](const Wanted& w) { return w.block && !w.block->empty(); });
  }
  uint8_t Flags(uint8_t flags) const {
    for (const Wanted& wanted : wanted_) {
      if (!wanted.block) continue;
      flags &= static_cast<uint8_t>(~wanted.flag);
      if (!wanted.block->empty()) flags |= wanted.flag;
    }
    return flags;
  }
  void Push(std::vector<uint8_t> bytes) {
    size_ += bytes.size();
    body_.Add(std::move(bytes));
  }
  void Keep(std::span<const uint8_t> bytes) {
    size_ += bytes.size();
    body_.Keep(bytes);
  }
  // Writes a block at its position, once.
  void Put(Wanted& wanted, std::span<const uint8_t> head) {
    if (wanted.done || !wanted.block || wanted.block->empty()) return;
    Push(Chunk(wanted.name, head, *wanted.block));
    wanted.done = true;
  }

  void Add(size_t i) {
    const Part& part = parts_[i];
    if (i == 0 && part.name == "VP8X" && !part.data.empty()) {
      std::vector<uint8_t> bytes(part.whole.begin(), part.whole.end());
      bytes[8] = Flags(bytes[8]);
      return Push(std::move(bytes));
    }
    for (Wanted& wanted : wanted_) {
      if (part.name != wanted.name || !wanted.block) continue;
      const bool headed = wanted.flag == kExifFlag && ByteReader(part.data).Match(kExifHead);
      return Put(wanted, headed ? part.data.first(kExifHead.size()) : part.data.first(0));
    }
    Keep(part.whole);
    if (part.whole.size() % 2 != 0) Push({0});  // the last chunk of a file may lack padding
    // new blocks follow the pixels, EXIF before XMP
    const bool last =
        IsPixels(part.name) && (i + 1 == parts_.size() || !IsPixels(parts_[i + 1].name));
    for (Wanted& wanted : wanted_) {
      const bool afterExif = wanted.flag == kXmpFlag && wanted_[0].there;
      if (last && !wanted.there && !afterExif) Put(wanted, {});
    }
  }

  Status Finish(uint64_t end) {
    const uint64_t size = kRiffHead - 8 + size_;
    if (size > UINT32_MAX) {
      reason_ = Tr("A file of this kind cannot be larger than 4 GB.");
      return Status::UnsuitableImage;
    }
    std::vector<uint8_t> head(file_.begin(), file_.begin() + 4);
    PutLittle(head, size, 4);
    head.insert(head.end(), file_.begin() + 8, file_.begin() + kRiffHead);
    made_.Add(std::move(head));
    made_.Append(std::move(body_));
    made_.Keep(file_.subspan(end));
    return Status::Ok;
  }

  const std::span<const uint8_t> file_;
  FilePieces& made_;
  FilePieces body_;
  std::string& reason_;
  Wanted wanted_[2];
  std::vector<Part> parts_;
  uint64_t size_ = 0;  // of the chunks
};

}  // namespace

Status FindWebpMetadata(std::span<const uint8_t> file, MetadataViews& views) {
  views = {};
  std::vector<Part> parts;
  uint64_t end = 0;
  RETURN_IF_BAD(Split(file, parts, end));
  for (const Part& part : parts) {
    if (part.name == "EXIF" && views.exif.empty()) views.exif = part.data;
    if (part.name == "XMP " && views.xmp.empty()) views.xmp = part.data;
  }
  if (ByteReader(views.exif).Match(kExifHead)) views.exif = views.exif.subspan(kExifHead.size());
  return Status::Ok;
}

Status RewriteWebp(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason) {
  return WebpRewrite(file, blocks, made, reason).Run();
}

}  // namespace fotomill
