// Photo CD pictures (PCD). For the file layout see pcd_file.cpp.
//
// A file contains one picture in up to five resolutions. The first three are stored directly, the
// larger ones as differences from the next smaller one, doubled. The resolution is selected by
// PhotoCDResolution, and by the requested thumbnail size. Pictures in portrait orientation are
// rotated. The pictures of an overview file are pages. The resolution 6144 x 4096, in separate
// files, is not supported.
#include "formats/photocd/pcd.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <string_view>
#include <utility>

#include "core/byte_reader.h"
#include "formats/photocd/pcd_deltas.h"
#include "formats/photocd/pcd_file.h"
#include "platform/file_view.h"
#include "processing/color/photo_ycc.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kSizeNames[kPcdSizes] = {"Photo CD, Base/16", "Photo CD, Base/4",
                                               "Photo CD, Base", "Photo CD, 4Base",
                                               "Photo CD, 16Base"};

// The resolution selected by the request's options.
int32_t SizeFor(const PcdFile& pcd, const ReadRequest& request) {
  return pcd.overview
             ? 0
             : std::min(pcd.largest, std::clamp(request.options.photoCdSize, 0, kPcdSizes - 1));
}

// A smaller one that suffices for the thumbnail.
int32_t SizeForThumbnail(int32_t size, int32_t side) {
  if (side <= 0) return size;
  int32_t smaller = 0;
  while (smaller < size && PcdWidth(smaller) / 2 < side) ++smaller;
  return smaller;
}

bool Upright(const PcdFile& pcd) { return pcd.turns % 2 == 1; }

void DescribePicture(const PcdFile& pcd, const ReadRequest& request, PictureRecord& picture) {
  const int32_t size = SizeFor(pcd, request);
  picture.typeName.AssignCut(pcd.overview ? "Photo CD, overview" : kSizeNames[size]);
  picture.width = Upright(pcd) ? PcdHeight(size) : PcdWidth(size);
  picture.height = Upright(pcd) ? PcdWidth(size) : PcdHeight(size);
  picture.bitsPerPixel = 24;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  picture.pageCount = pcd.pictures;
  picture.page = request.page;
}

Status OpenPicture(platform::FileView& file, const ReadRequest& request, PcdFile& pcd,
                   PictureRecord& picture) {
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  RETURN_IF_BAD(ParsePcd(file.Bytes(), pcd));
  if (request.page < 0 || request.page >= pcd.pictures) return Status::NoImages;
  DescribePicture(pcd, request, picture);
  return Status::Ok;
}

// Reports progress in rows, over several passes.
class Steps {
 public:
  Steps(const PictureRecord& picture, int32_t passes) : picture_(picture), passes_(passes) {}
  Status Row(int32_t done, int32_t rows) const {
    const int64_t height = picture_.height;
    return picture_.ReportRow(
        static_cast<int32_t>((pass_ + int64_t{done} * height / rows) / passes_));
  }
  void NextPass() { pass_ += picture_.height; }

 private:
  const PictureRecord& picture_;
  int64_t pass_ = 0;
  const int32_t passes_;
};

// Creates the planes of the next resolution from the current ones.
Status AddSize(std::span<const uint8_t> file, uint64_t tables, bool lumaOnly, Steps& steps,
               PcdPlanes& planes, bool& damaged) {
  planes.luma = DoublePcdPlane(planes.luma);
  ByteReader bytes(file);
  bytes.Seek(tables);
  PcdCodes codes;
  if (!codes.Parse(bytes.Peek(kPcdSector), lumaOnly ? 1 : 3)) return Status::DamagedFile;
  bytes.Seek(tables + (lumaOnly ? 1 : 2) * kPcdSector);
  const auto onRow = [&](int32_t rows) { return steps.Row(rows, planes.luma.height); };
  const Status status =
      AddPcdDeltas(bytes.Peek(bytes.Left()), codes, lumaOnly, planes, onRow, damaged);
  steps.NextPass();
  return status;
}

// The planes of a resolution: luma, and chroma of half the width and height.
Status ReadPlanes(std::span<const uint8_t> file, const PcdFile& pcd, int32_t size, int32_t picture,
                  Steps& steps, PcdPlanes& planes, bool& damaged) {
  const int32_t plain = std::min(size, kPcdPlainSizes - 1);
  ByteReader bytes(file);
  bytes.Seek(pcd.Plain(plain, picture));
  const auto data = bytes.Take(PcdPlainBytes(plain));
  if (!bytes.Ok()) return Status::FileReadError;
  ReadPlainPlanes(data, PcdWidth(plain), PcdHeight(plain), planes);
  if (size == plain) return Status::Ok;
  for (PcdPlane& chroma : planes.chroma) chroma = DoublePcdPlane(chroma);
  RETURN_IF_BAD(AddSize(file, kPcdDeltas + 4 * kPcdSector, true, steps, planes, damaged));
  if (size == kPcdPlainSizes) return Status::Ok;
  for (PcdPlane& chroma : planes.chroma) chroma = DoublePcdPlane(chroma);
  return AddSize(file, pcd.tables16, false, steps, planes, damaged);
}

// Writes rows `y` and following of a picture to an image rotated to the left.
class TurnedRows {
 public:
  static constexpr int32_t kBand = 16;

  TurnedRows(int32_t turns, PackedImage& image) : turns_(turns), image_(image) {}
  // `bgr` has `count` rows, at most kBand, of `width` pixels.
  void Put(const uint8_t* bgr, int32_t y, int32_t count, int32_t width) {
    if (turns_ % 2 == 1) {
      for (int32_t x = 0; x < width; ++x) PutColumn(bgr, y, count, width, x);
      return;
    }
    for (int32_t i = 0; i < count; ++i) {
      const uint8_t* row = bgr + 3 * static_cast<size_t>(i) * static_cast<size_t>(width);
      if (turns_ == 0) {
        std::memcpy(image_.Row(y + i).data(), row, 3 * static_cast<size_t>(width));
        continue;
      }
      uint8_t* target =
          image_.Row(image_.Height() - 1 - y - i).data() + 3 * static_cast<size_t>(width);
      for (int32_t x = 0; x < width; ++x)
        std::memcpy(target -= 3, row + 3 * static_cast<size_t>(x), 3);
    }
  }

 private:
  void PutColumn(const uint8_t* bgr, int32_t y, int32_t count, int32_t width, int32_t x) {
    const bool left = turns_ == 1;
    uint8_t* const row = image_.Row(left ? width - 1 - x : x).data();
    for (int32_t i = 0; i < count; ++i) {
      const int32_t column = left ? y + i : image_.Width() - 1 - y - i;
      const uint8_t* pixel =
          bgr + 3 * (static_cast<size_t>(i) * static_cast<size_t>(width) + static_cast<size_t>(x));
      std::memcpy(row + 3 * static_cast<size_t>(column), pixel, 3);
    }
  }

  const int32_t turns_;
  PackedImage& image_;
};

Status ConvertPlanes(const PcdPlanes& planes, int32_t turns, const Steps& steps,
                     PackedImage& image) {
  const int32_t width = planes.luma.width, height = planes.luma.height;
  const auto count = static_cast<size_t>(width);
  std::vector<uint8_t> chroma(2 * count), band(3 * count * TurnedRows::kBand);
  TurnedRows rows(turns, image);
  for (int32_t y = 0; y < height; ++y) {
    const int32_t inBand = y % TurnedRows::kBand;
    DoubledPcdRow(planes.chroma[0], y, chroma.data());
    DoubledPcdRow(planes.chroma[1], y, chroma.data() + count);
    PhotoYccToColors(planes.luma.Row(y), chroma.data(), chroma.data() + count, count,
                     &band[3 * count * static_cast<size_t>(inBand)]);
    if (inBand == TurnedRows::kBand - 1 || y == height - 1)
      rows.Put(band.data(), y - inBand, inBand + 1, width);
    RETURN_IF_BAD(steps.Row(y, height));
  }
  return Status::Ok;
}

// Text in a field of fixed length, padded with blanks, zeros or FF bytes.
std::string Field(std::span<const uint8_t> file, uint64_t offset, uint64_t length) {
  ByteReader bytes(file);
  bytes.Seek(kPcdHeader + offset);
  std::string text;
  for (const uint8_t byte : bytes.Take(length)) {
    if (byte == 0 || byte == 0xFF) break;
    text += static_cast<char>(byte);
  }
  text.erase(text.find_last_not_of(' ') + 1);
  return text;
}

struct DetailField {
  const char* label;
  uint64_t offset, length;
};
constexpr DetailField kDetailFields[] = {
    {"      Product: ", 22, 20}, {"Scanner maker: ", 42, 20},  {"      Scanner: ", 62, 16},
    {"       Serial: ", 90, 20}, {"  Workstation: ", 112, 20}, {"Photofinisher: ", 165, 60},
};
constexpr const char* kMedia[] = {
    "color negative",
    "color reversal",
    "color hard copy",
    "thermal hard copy",
    "black and white negative",
    "black and white reversal",
    "black and white hard copy",
    "internegative",
    "synthetic image",
    "chromogenic",
};

}  // namespace

Status PcdInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  PcdFile pcd;
  return OpenPicture(file, request, pcd, picture);
}

Status PcdRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  picture.warning.Clear();
  platform::FileView file;
  PcdFile pcd;
  RETURN_IF_BAD(OpenPicture(file, request, pcd, picture));
  const int32_t whole = SizeFor(pcd, request),
                size = SizeForThumbnail(whole, request.thumbnailSide);
  PcdPlanes planes;
  Steps steps(picture, 1 + std::max(0, size - kPcdPlainSizes + 1));
  bool damaged = false;
  RETURN_IF_BAD(ReadPlanes(file.Bytes(), pcd, size, picture.page, steps, planes, damaged));
  PackedImage image;
  const int32_t width = PcdWidth(size), height = PcdHeight(size);
  RETURN_IF_BAD(NewPackedImage(Upright(pcd) ? height : width, Upright(pcd) ? width : height,
                               &picture.palette, 24, image));
  RETURN_IF_BAD(ConvertPlanes(planes, pcd.turns, steps, image));
  if (!file.Intact()) return Status::FileReadError;
  if (damaged) picture.warning.AssignCut(TrLater("Some rows are damaged and less sharp."));
  picture.reduction = 1 << (whole - size);
  picture.image = std::move(image);
  return Status::Ok;
}

Status PcdDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView view;
  PcdFile pcd;
  if (!view.Open(picture.fileName.c_str())) return Status::FileOpenError;
  const auto file = view.Bytes();
  RETURN_IF_BAD(ParsePcd(file, pcd));
  DetailLines& lines = picture.detailLines;
  if (pcd.overview) {
    lines.AddFormat("     Pictures: %d", pcd.pictures);
    return Status::Ok;
  }
  lines.AddFormat("      Largest: %d x %d", PcdWidth(pcd.largest), PcdHeight(pcd.largest));
  constexpr const char* kTurns[] = {"none", "90 degrees left", "180 degrees", "90 degrees right"};
  lines.AddFormat("     Rotation: %s", kTurns[pcd.turns]);
  for (const DetailField& field : kDetailFields) {
    const std::string text = Field(file, field.offset, field.length);
    if (!text.empty()) lines.Add(field.label + text);
  }
  const uint8_t medium = file[kPcdHeader + 21];
  if (medium < std::size(kMedia)) lines.AddFormat("       Medium: %s", kMedia[medium]);
  return Status::Ok;
}

}  // namespace fotomill
