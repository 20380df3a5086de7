// Amiga interchange files (IFF) with an interleaved bitmap (ILBM) or a packed one (PBM),
// big-endian.
//
//   "FORM", size of the rest (4), "ILBM" or "PBM ", then chunks: name (4), size (4), data padded to
//   an even length
//
//   BMHD  width, height (2 each), origin (4), planes, masking (0 none, 1 a mask plane, 2
//         transparent color, 3 lasso), compression (0 none, 1 ByteRun1), padding, transparent color
//         (2), pixel aspect x and y, page size (4)
//   CMAP  colors: red, green, blue
//   CAMG  screen mode (4): 0x800 hold and modify (HAM), 0x80 extra half-bright (EHB)
//   GRAB  hot spot of a brush: x, y (2 each)
//   DPI   resolution: x, y (2 each)
//   ANNO, AUTH, NAME, "(c) "  texts
//   BODY  ILBM: for each row its planes, ceil(width / 16) x 2 bytes each, and the mask's; PBM: rows
//         padded to an even size
//
// Up to 8 planes are palette indices; 24 and 32 are the bits of red, green, blue (alpha), lowest
// first. HAM with 6 planes modifies 4 bits, with 8 planes 6 bits, which are replicated to fill a
// byte. EHB has 32 colors and the same at half brightness. Mask and transparent color become alpha.
// 4-bit colors, which old programs stored in the high half of a byte, are scaled to 8 bits. Six
// planes without a screen mode are HAM with up to 16 colors, EHB with up to 32.
//
// The writer creates ILBM with 1, 4, 8 or 24 planes, or PBM for palette pictures with CreateIffPBM,
// with ByteRun1 unless CreateIffCompressed is off. Source: J. Morrison, "EA IFF 85: Standard for
// Interchange Format Files" and "ILBM: IFF Interleaved Bitmap" (Electronic Arts, 1985, 1986);
// "Amiga ROM Kernel Reference Manual: Devices", 3rd edition (1991).
#include "formats/amiga/iff.h"

#include <algorithm>
#include <vector>

#include "core/byte_reader.h"
#include "core/pack_bits.h"
#include "formats/amiga/iff_planes.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint32_t kHamMode = 0x800, kHalfBriteMode = 0x80;
constexpr uint8_t kMaskPlane = 1, kTransparentColor = 2;
constexpr uint64_t kBestRatio = 64;  // ByteRun1 packs at best 128 bytes into 2

struct IffFile {
  bool packed = false;  // PBM: one byte per pixel
  int32_t width = 0, height = 0;
  int32_t planes = 0;
  uint8_t masking = 0, compression = 0;
  uint16_t transparent = 0;
  uint8_t aspectX = 0, aspectY = 0;
  uint32_t mode = 0;
  bool hasMode = false, hasHeader = false, changesColors = false;
  std::span<const uint8_t> colors, body;
  bool hasBody = false;
  double dpiX = 0, dpiY = 0;
  int32_t handleX = 0, handleY = 0;
  std::span<const uint8_t> text;

  bool Ham() const {
    if (packed || planes < 5 || planes > 8) return false;
    return hasMode ? (mode & kHamMode) != 0 : planes == 6 && colors.size() <= size_t{3} * 16;
  }
  bool HalfBrite() const {
    if (packed || planes != 6 || Ham()) return false;
    return hasMode ? (mode & kHalfBriteMode) != 0 : colors.size() <= size_t{3} * 32;
  }
  bool Deep() const { return planes > 8; }
  bool Alpha() const {
    return masking == kMaskPlane || planes == 32 ||
           (masking == kTransparentColor && !Deep() && !Ham());
  }
  int32_t BitsPerPixel() const { return Deep() || Ham() ? 24 : planes; }

  size_t PlaneSize() const {
    const auto pixels = static_cast<size_t>(width);
    return packed ? (pixels + 1) / 2 * 2 : (pixels + 15) / 16 * 2;
  }
  // Number of stored planes per row; a PBM row counts as one.
  size_t StoredPlanes() const {
    return (packed ? 1 : static_cast<size_t>(planes)) + (masking == kMaskPlane ? 1 : 0);
  }
};

void TakeHeader(ByteReader& bytes, IffFile& file) {
  file.width = bytes.Be16();
  file.height = bytes.Be16();
  bytes.Skip(4);
  file.planes = bytes.U8();
  file.masking = bytes.U8();
  file.compression = bytes.U8();
  bytes.Skip(1);
  file.transparent = bytes.Be16();
  file.aspectX = bytes.U8();
  file.aspectY = bytes.U8();
  file.hasHeader = bytes.Ok();
}

void TakeChunk(std::string_view name, std::span<const uint8_t> data, IffFile& file) {
  ByteReader bytes(data);
  if (name == "BMHD") {
    TakeHeader(bytes, file);
  } else if (name == "CMAP") {
    file.colors = data.first(std::min<size_t>(data.size() / 3, 256) * 3);
  } else if (name == "CAMG" && data.size() >= 4) {
    file.mode = bytes.Be32();
    file.hasMode = true;
  } else if (name == "GRAB" && data.size() >= 4) {
    file.handleX = static_cast<int16_t>(bytes.Be16());
    file.handleY = static_cast<int16_t>(bytes.Be16());
  } else if (name == "DPI " && data.size() >= 4) {
    file.dpiX = bytes.Be16();
    file.dpiY = bytes.Be16();
  } else if (name == "PCHG" || name == "SHAM" || name == "CTBL") {
    file.changesColors = true;
  } else if (name == "ANNO" ||
             ((name == "NAME" || name == "AUTH" || name == "(c) ") && file.text.empty())) {
    file.text = data;
  }
}

Status CheckFacts(const IffFile& file) {
  if (!file.hasHeader) return file.hasBody ? Status::DamagedFile : Status::FileReadError;
  if (!file.hasBody) return Status::NoImages;
  if (file.width < 1 || file.height < 1) return Status::DamagedFile;
  if (file.compression > 1) return Status::UnsupportedFormat;
  if (file.packed) return file.planes == 8 ? Status::Ok : Status::UnsupportedFormat;
  const bool known =
      (file.planes >= 1 && file.planes <= 8) || file.planes == 24 || file.planes == 32;
  return known ? Status::Ok : Status::UnsupportedFormat;
}

Status ParseFile(std::span<const uint8_t> data, IffFile& file) {
  ByteReader bytes(data);
  if (!bytes.Match("FORM")) return data.size() < 4 ? Status::FileReadError : Status::DamagedFile;
  bytes.Skip(4);
  file.packed = bytes.Match("PBM ");
  if (!file.packed && !bytes.Match("ILBM"))
    return data.size() < 12 ? Status::FileReadError : Status::UnsupportedFormat;
  while (bytes.Left() >= 8 && !file.hasBody) {
    const auto name = bytes.Take(4);
    const uint64_t size = bytes.Be32();
    const std::string_view text(reinterpret_cast<const char*>(name.data()), name.size());
    file.hasBody = text == "BODY";
    const auto chunk = bytes.Take(std::min(size, bytes.Left()));
    if (file.hasBody) {
      file.body = chunk;
    } else if (chunk.size() == size) {
      TakeChunk(text, chunk, file);
    }
    if (size % 2 != 0 && bytes.Left() > 0) bytes.Skip(1);
  }
  return CheckFacts(file);
}

void SetPalette(const IffFile& file, Palette& palette) {
  palette = {};
  const size_t levels = file.Deep() ? 0 : (size_t{1} << file.planes) - 1;
  if (file.colors.empty() && levels > 0) {
    for (size_t i = 0; i < 3 * (levels + 1); ++i)
      palette[i] = static_cast<uint8_t>(i / 3 * 255 / levels);
    return;
  }
  std::ranges::copy(file.colors, palette.begin());
  const bool fourBits =
      std::ranges::all_of(palette, [](uint8_t value) { return (value & 15) == 0; });
  for (size_t i = 0; i < palette.size() && fourBits; ++i)
    palette[i] = static_cast<uint8_t>(palette[i] | palette[i] >> 4);
  if (!file.HalfBrite()) return;
  for (size_t i = 0; i < size_t{3} * 32; ++i) palette[3 * 32 + i] = palette[i] / 2;
}

const char* KindName(const IffFile& file) {
  if (file.packed) return "Amiga PBM";
  if (file.Ham()) return file.planes > 6 ? "Amiga HAM8" : "Amiga HAM6";
  if (file.HalfBrite()) return "Amiga ILBM, half-bright";
  return file.Deep() ? "Amiga ILBM, true color" : "Amiga ILBM";
}

void DescribePicture(const IffFile& file, PictureRecord& picture) {
  picture.typeName.AssignCut(KindName(file));
  picture.width = file.width;
  picture.height = file.height;
  picture.bitsPerPixel = file.BitsPerPixel();
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (file.Alpha() ? kHasAlpha : 0));
  picture.metadata.dpiX = file.dpiX;
  picture.metadata.dpiY = file.dpiY;
  const auto textEnd = std::ranges::find(file.text, uint8_t{0});
  picture.comment.assign(file.text.begin(), textEnd);
  if (picture.bitsPerPixel == 24) {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  } else {
    SetPalette(file, picture.palette);
  }
  if (file.changesColors)
    picture.warning.AssignCut(TrLater("Colors that change from row to row are not shown."));
}

// Packs one-byte indices to the image's depth.
void PackIndices(std::span<const uint8_t> pixels, int32_t bits, std::span<uint8_t> row) {
  if (bits == 8) {
    std::ranges::copy(pixels, row.begin());
    return;
  }
  const size_t perByte = 8 / static_cast<size_t>(bits);
  std::ranges::fill(row, uint8_t{0});
  for (size_t x = 0; x < pixels.size(); ++x) {
    const size_t shift = 8 - static_cast<size_t>(bits) * (x % perByte + 1);
    row[x / perByte] = static_cast<uint8_t>(row[x / perByte] | pixels[x] << shift);
  }
}

// Converts stored rows to rows of the picture.
class RowMaker {
 public:
  explicit RowMaker(const IffFile& file)
      : file_(file), planeSize_(file.PlaneSize()), pixels_(4 * static_cast<size_t>(file.width)) {
    if (file.Ham()) SetPalette(file, hamColors_);
  }

  void Make(std::span<const uint8_t> stored, int32_t bits, std::span<uint8_t> row,
            std::span<uint8_t> alpha) {
    const auto width = static_cast<size_t>(file_.width);
    std::span<const uint8_t> pixels = stored;
    if (!file_.packed) {
      for (int32_t first = 0; first < file_.planes; first += 8) {
        const auto plane = static_cast<size_t>(first);
        MergeIffPlanes(&stored[plane * planeSize_], planeSize_, std::min(8, file_.planes - first),
                       Bytes(plane / 8));
      }
      pixels = pixels_;
    }
    pixels = pixels.first(width);
    if (file_.Deep()) {
      MergeColors(Bytes(2).data(), Bytes(1).data(), Bytes(0).data(), width, row.data());
    } else if (file_.Ham()) {
      DecodeHam(pixels, file_.planes, hamColors_.data(), row.data());
    } else {
      PackIndices(pixels, bits, row);
    }
    if (!alpha.empty()) MakeAlpha(stored, pixels, alpha);
  }

 private:
  std::span<uint8_t> Bytes(size_t index) {
    const auto width = static_cast<size_t>(file_.width);
    return std::span(pixels_).subspan(index * width, width);
  }

  void MakeAlpha(std::span<const uint8_t> stored, std::span<const uint8_t> pixels,
                 std::span<uint8_t> alpha) {
    if (file_.masking == kMaskPlane) {
      MergeIffPlanes(&stored[(file_.StoredPlanes() - 1) * planeSize_], planeSize_, 1, alpha);
      for (uint8_t& value : alpha) value = value != 0 ? 255 : 0;
    } else if (file_.planes == 32) {
      std::ranges::copy(Bytes(3), alpha.begin());
    } else {
      for (size_t x = 0; x < alpha.size(); ++x) alpha[x] = pixels[x] == file_.transparent ? 0 : 255;
    }
  }

  const IffFile& file_;
  const size_t planeSize_;
  std::vector<uint8_t> pixels_;  // one row of indices, or of each color
  Palette hamColors_{};
};

Status ReadRows(const IffFile& file, const PictureRecord& picture, PackedImage& image,
                PackedImage& alpha) {
  const size_t rowSize = file.StoredPlanes() * file.PlaneSize();
  std::vector<uint8_t> unpacked(file.compression == 0 ? 0 : rowSize);
  std::span<const uint8_t> body = file.body;
  RowMaker maker(file);
  for (int32_t y = 0; y < file.height; ++y) {
    std::span<const uint8_t> row = unpacked;
    if (file.compression != 0) {
      if (!UnpackBits(body, unpacked)) return Status::FileReadError;
    } else {
      if (body.size() < rowSize) return Status::FileReadError;
      row = body.first(rowSize);
      body = body.subspan(rowSize);
    }
    const auto opacity =
        alpha.Empty() ? std::span<uint8_t>() : alpha.Row(y).first(static_cast<size_t>(file.width));
    maker.Make(row, image.Bits(), image.Row(y), opacity);
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

Status OpenPicture(platform::FileView& view, const std::string& name, IffFile& file,
                   PictureRecord& picture) {
  if (!view.Open(name)) return Status::FileOpenError;
  picture.fileSize = view.FileSize();
  RETURN_IF_BAD(ParseFile(view.Bytes(), file));
  DescribePicture(file, picture);
  return Status::Ok;
}

}  // namespace

Status IffInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  picture.warning.Clear();
  platform::FileView view;
  IffFile file;
  return OpenPicture(view, request.fileName, file, picture);
}

Status IffRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  picture.warning.Clear();
  platform::FileView view;
  IffFile file;
  RETURN_IF_BAD(OpenPicture(view, request.fileName, file, picture));
  const uint64_t least =
      file.StoredPlanes() * file.PlaneSize() * static_cast<uint64_t>(file.height);
  if (file.body.size() < (file.compression == 0 ? least : least / kBestRatio))
    return Status::FileReadError;
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(file.width, file.height, &picture.palette, picture.bitsPerPixel, image));
  if (file.Alpha()) RETURN_IF_BAD(NewAlphaPlane(file.width, file.height, alpha));
  RETURN_IF_BAD(ReadRows(file, picture, image, alpha));
  if (!view.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status IffDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView view;
  IffFile file;
  RETURN_IF_BAD(OpenPicture(view, picture.fileName.c_str(), file, picture));
  constexpr const char* kMasks[] = {"none", "a plane", "a color", "lasso"};
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("       Planes: %d", file.planes);
  lines.AddFormat("  Compression: %s", file.compression == 0 ? "none" : "ByteRun1");
  lines.AddFormat("         Mask: %s",
                  file.masking < std::size(kMasks) ? kMasks[file.masking] : "unknown");
  lines.AddFormat("       Colors: %zu", file.colors.size() / 3);
  if (file.hasMode) lines.AddFormat("  Screen mode: 0x%X", file.mode);
  if (file.aspectX > 0)
    lines.AddFormat(" Pixel aspect: %u:%u", unsigned{file.aspectX}, unsigned{file.aspectY});
  if (file.handleX != 0 || file.handleY != 0)
    lines.AddFormat("       Handle: %d, %d", file.handleX, file.handleY);
  if (file.changesColors) lines.Add("       Colors change from row to row");
  return Status::Ok;
}

}  // namespace fotomill
