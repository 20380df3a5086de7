// Windows animated cursors (ANI), RIFF with form type "ACON", little-endian. Chunks:
//
//   anih   36 bytes, see below
//   rate   4 bytes per step: its duration in 1/60 s; optional
//   seq    4 bytes per step: the index of its picture; optional, default: pictures in file order
//   LIST   of type "fram": a chunk "icon" for each picture, a complete cursor or icon file
//   LIST   of type "INFO": title and author; not used
//
//   offset size  field of anih
//        0    4  36
//        4    4  number of pictures
//        8    4  number of steps
//       12   16  width, height, bits per pixel and planes of pictures without a header
//       28    4  duration of a step in 1/60 s, for files without "rate"
//       32    4  bit 0: the pictures are icon or cursor files; bit 1: there is a "seq" chunk
//
// The reader trusts the chunks rather than the numbers in anih, which may be wrong or missing. An
// animation ends before a step whose picture is missing. Pictures without a header, which no
// program is known to write, are rejected. The writer creates one picture and one step, a cursor
// with a mask. Source: Microsoft, "Multimedia Data Standards Update" (1994).
#include "formats/icon/ani.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "formats/icon/ico.h"
#include "platform/file_view.h"
#include "processing/promote.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint32_t kHeaderSize = 36;
constexpr uint32_t kHasFileHeaders = 1;  // bit of the flags
constexpr uint32_t kUsualRate = 10;      // sixtieths of a second
constexpr uint64_t kListHead = 12;       // "LIST", size, type

struct AniStep {
  size_t picture = 0;
  int32_t delayMs = 0;
};

struct AniFile {
  std::vector<std::span<const uint8_t>> pictures;  // icon files
  std::vector<AniStep> steps;
  bool lacksPictures = false;  // fewer than anih or the steps refer to
};

// The raw chunks of a file.
struct AniChunks {
  std::span<const uint8_t> header, rates, sequence;
  std::vector<std::span<const uint8_t>> pictures;
};

// Lists are descended into rather than skipped: some programs write a wrong size for the one with
// title and author, which would hide the rest of the file.
AniChunks GatherChunks(std::span<const uint8_t> file) {
  AniChunks chunks;
  RiffWalk walk(file);
  RiffPlace chunk;
  bool ofPictures = false;  // whether the current list is one of pictures
  while (walk.Next(chunk)) {
    const auto data = file.subspan(chunk.data, chunk.size);
    if (chunk.name == "anih") chunks.header = data;
    if (chunk.name == "rate") chunks.rates = data;
    if (chunk.name == "seq ") chunks.sequence = data;
    if (chunk.name == "icon" && ofPictures && chunks.pictures.size() < limits.animationFrames)
      chunks.pictures.push_back(data);
    if (chunk.name == "LIST" && chunk.size >= 4) {
      // A list header is as large as a file header, so a walk can start there.
      static_assert(kListHead == kRiffHead);
      ofPictures = ByteReader(data).Match("fram");
      file = file.subspan(chunk.data - 8);
      walk = RiffWalk(file);
    }
  }
  return chunks;
}

int32_t Milliseconds(uint32_t sixtieths) {
  return static_cast<int32_t>(
      std::min<uint64_t>((uint64_t{sixtieths} * 1000 + 30) / 60, INT32_MAX));
}

Status ParseAni(std::span<const uint8_t> file, AniFile& ani) {
  if (!IsRiff(file, "ACON")) return Status::DamagedFile;
  AniChunks chunks = GatherChunks(file);
  ByteReader header(chunks.header), rates(chunks.rates), sequence(chunks.sequence);
  header.Skip(4);
  const uint32_t pictures = header.Le32();
  header.Skip(20);
  const uint32_t told = header.Le32(), flags = header.Le32();
  const uint32_t usual = header.Ok() ? told : kUsualRate;
  if (header.Ok() && (flags & kHasFileHeaders) == 0) return Status::UnsupportedFormat;
  ani.pictures = std::move(chunks.pictures);
  ani.lacksPictures = header.Ok() && ani.pictures.size() < pictures;
  const bool inOrder = chunks.sequence.empty();
  const uint64_t steps = inOrder ? ani.pictures.size() : chunks.sequence.size() / 4;
  for (uint64_t i = 0; i < steps && i < limits.animationFrames; ++i) {
    const uint64_t picture = inOrder ? i : sequence.Le32();
    if (picture >= ani.pictures.size()) {
      ani.lacksPictures = true;
      break;
    }
    const uint32_t rate = rates.Left() >= 4 ? rates.Le32() : usual;
    ani.steps.push_back({static_cast<size_t>(picture), Milliseconds(rate)});
  }
  return ani.steps.empty() ? Status::NoImages : Status::Ok;
}

// Facts, and with `decode` the pixels, of a step's picture: the best entry of its icon.
Status LoadStep(const AniFile& ani, const ReadRequest& request, bool decode,
                PictureRecord& picture) {
  const auto step = static_cast<size_t>(request.page);
  if (request.page < 0 || step >= ani.steps.size()) return Status::NoImages;
  ReadRequest best;
  best.options = request.options;
  const auto icon = ani.pictures[ani.steps[step].picture];
  RETURN_IF_BAD(decode ? DecodeIcon(icon, best, picture) : DescribeIcon(icon, best, picture));
  picture.typeName.AssignCut("Windows animated cursor");
  picture.pageCount = static_cast<int32_t>(ani.steps.size());
  picture.warning.Clear();
  if (ani.lacksPictures) picture.warning.AssignCut(TrLater("The file ends early."));
  return Status::Ok;
}

class AniAnimation final : public Animation {
 public:
  Status Open(const ReadRequest& request) {
    options_ = request.options;
    if (!file_.Open(request.fileName)) return Status::FileOpenError;
    RETURN_IF_BAD(ParseAni(file_.Bytes(), ani_));
    for (const AniStep& step : ani_.steps) delays_.push_back(step.delayMs);
    rounds_ = 0;
    const PicturePointer first = NewPictureRecord();
    if (first == nullptr) return Status::MemoryAllocationError;
    RETURN_IF_BAD(LoadStep(ani_, {.options = options_}, false, *first));
    width_ = first->width;
    height_ = first->height;
    return CheckPackedSize(width_, height_, 24);
  }

 private:
  Status Compose(size_t frame) override {
    const PicturePointer picture = NewPictureRecord();
    if (picture == nullptr) return Status::MemoryAllocationError;
    const ReadRequest request{.page = static_cast<int32_t>(frame), .options = options_};
    RETURN_IF_BAD(LoadStep(ani_, request, true, *picture));
    RETURN_IF_BAD(PromoteToAlpha(*picture));
    RETURN_IF_BAD(NewCanvas(width_, height_, canvas_));
    const auto columns = static_cast<size_t>(std::min(width_, picture->image.Width()));
    for (int32_t y = 0; y < std::min(height_, picture->image.Height()); ++y) {
      std::ranges::copy(picture->image.Row(y).first(3 * columns), canvas_.image.Row(y).begin());
      std::ranges::copy(picture->alpha.Row(y).first(columns), canvas_.alpha.Row(y).begin());
    }
    return file_.Intact() ? Status::Ok : Status::FileReadError;
  }

  platform::FileView file_;
  ReadOptions options_;
  AniFile ani_;
  int32_t width_ = 0, height_ = 0;  // of the canvas
};

Status Load(PictureRecord& picture, const ReadRequest& request, bool decode) {
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  AniFile ani;
  RETURN_IF_BAD(ParseAni(file.Bytes(), ani));
  RETURN_IF_BAD(LoadStep(ani, request, decode, picture));
  if (file.Intact()) return Status::Ok;
  picture.image.Free();
  picture.alpha.Free();
  return Status::FileReadError;
}

void BeginChunk(ByteWriter& out, std::string_view name, uint32_t size) {
  out.Text(name);
  out.Le32(size);
}

}  // namespace

Status AniInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  return Load(picture, request, false);
}

Status AniRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  return Load(picture, request, true);
}

Status AniAnimate(const ReadRequest& request, AnimationPointer& animation) {
  auto opened = std::make_unique<AniAnimation>();
  RETURN_IF_BAD(opened->Open(request));
  animation = std::move(opened);
  return Status::Ok;
}

Status AniWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  BeginChunk(out, "RIFF", 0);
  out.Text("ACON");
  BeginChunk(out, "anih", kHeaderSize);
  out.Le32(kHeaderSize);
  out.Le32(1);  // picture
  out.Le32(1);  // step
  out.Zeros(16);
  out.Le32(kUsualRate);
  out.Le32(kHasFileHeaders);
  const uint64_t list = out.Position();
  BeginChunk(out, "LIST", 0);
  out.Text("fram");
  const uint64_t icon = out.Position();
  BeginChunk(out, "icon", 0);
  RETURN_IF_BAD(EncodeCursor(picture, out));
  const auto sizeFrom = [&](uint64_t chunk) {
    return static_cast<uint32_t>(out.Position() - chunk - 8);
  };
  out.PatchLe32(icon + 4, sizeFrom(icon));
  out.Zeros(sizeFrom(icon) % 2);
  out.PatchLe32(list + 4, sizeFrom(list));
  out.PatchLe32(4, sizeFrom(0));
  return CommitOutput(out, options);
}

}  // namespace fotomill
