// Macintosh pictures (PICT): the bitmaps in them. For the file layout see pict_file.cpp.
//
// A single bitmap is shown by itself, with its own palette or in 24 bits. Several are drawn at
// their positions in the frame, scaled as specified. Lines, shapes and text are ignored; the
// details report how many there were. The fourth component of pixels is not used as alpha, as most
// programs leave it undefined.
#include "formats/pict/pict.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "formats/jpeg/jpeg_library.h"
#include "formats/pict/pict_file.h"
#include "formats/pict/pict_rows.h"
#include "platform/file_view.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint64_t kMostOverdraw = 64;  // total area of the bitmaps, relative to the picture's

// The stored rectangle to draw; the whole bitmap if the picture does not specify a valid one.
Rectangle Shown(const PictPixels& pixels) {
  const Rectangle& all = pixels.bounds;
  const Rectangle& part = pixels.source;
  const bool inside =
      part.x >= all.x && part.y >= all.y && part.x + part.width <= all.x + all.width &&
      part.y + part.height <= all.y + all.height && part.width > 0 && part.height > 0;
  return inside ? part : all;
}

// The output: a single bitmap, or a canvas with several.
struct View {
  int32_t width = 0, height = 0, bits = 24;
  bool canvas = false;
};

Status ChooseView(const PictFile& pict, View& view) {
  if (pict.pixels.empty()) {
    if (pict.unsupported > 0) return Status::UnsupportedFormat;
    return pict.cutShort ? Status::FileReadError : Status::NoImages;
  }
  const PictPixels& first = pict.pixels.front();
  view.canvas = pict.pixels.size() > 1 && pict.frame.width > 0 && pict.frame.height > 0;
  if (view.canvas) {
    view.width = pict.frame.width;
    view.height = pict.frame.height;
  } else if (first.jpeg) {
    view.width = first.target.width;
    view.height = first.target.height;
  } else {
    view.width = Shown(first).width;
    view.height = Shown(first).height;
    if (first.Indexed() && Shown(first).x == first.bounds.x) view.bits = first.bits;
  }
  return view.width < 1 || view.height < 1 ? Status::DamagedFile : Status::Ok;
}

const char* KindName(const PictPixels& pixels) {
  if (pixels.jpeg) return "Macintosh PICT, QuickTime JPEG";
  if (pixels.Indexed())
    return pixels.inverted ? "Macintosh PICT, bitmap" : "Macintosh PICT, indexed";
  return "Macintosh PICT, direct pixels";
}

void DescribePicture(const PictFile& pict, const View& view, PictureRecord& picture) {
  picture.typeName.AssignCut(KindName(pict.pixels.front()));
  picture.width = view.width;
  picture.height = view.height;
  picture.bitsPerPixel = view.bits;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  if (view.bits == 24) {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  } else {
    picture.palette = PictRowDecoder(pict.pixels.front()).Colormap();
  }
  picture.simplified = pict.drawings > 0;
  picture.warning.Clear();
  if (pict.drawings > 0)
    picture.warning.AssignCut(TrLater("Lines, shapes and text of the drawing are not shown."));
  if (pict.cutShort) picture.warning.AssignCut(TrLater("The file ends early."));
}

void StoreIndices(std::span<const uint8_t> indices, int32_t bits, int32_t width,
                  std::span<uint8_t> row) {
  if (bits == 2) {  // the picture has 4 bits
    for (size_t x = 0; x < static_cast<size_t>(width); ++x) {
      const auto value = static_cast<uint8_t>(indices[x / 4] >> (6 - 2 * (x % 4)) & 3);
      row[x / 2] = static_cast<uint8_t>(row[x / 2] | value << (x % 2 == 0 ? 4 : 0));
    }
    return;
  }
  const size_t pixelBits = static_cast<size_t>(width) * static_cast<size_t>(bits);
  std::copy_n(indices.begin(), (pixelBits + 7) / 8, row.begin());
}

Status ReadPiece(const PictPixels& pixels, const View& view, const PictureRecord& picture,
                 PackedImage& image) {
  const Rectangle shown = Shown(pixels);
  PictRowDecoder rows(pixels);
  for (int32_t y = 0; y < shown.y - pixels.bounds.y; ++y) RETURN_IF_BAD(rows.Next());
  for (int32_t y = 0; y < shown.height; ++y) {
    RETURN_IF_BAD(rows.Next());
    if (view.bits < 24) {
      StoreIndices(rows.Indices(), view.bits, view.width, image.Row(y));
    } else {
      const auto first = 3 * static_cast<size_t>(shown.x - pixels.bounds.x);
      std::ranges::copy(rows.Colors().subspan(first, 3 * static_cast<size_t>(shown.width)),
                        image.Row(y).begin());
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// Draws row `y` of `height`, three bytes per pixel, at its position on the canvas.
void DrawRow(std::span<const uint8_t> bgr, int32_t y, int32_t height, const Rectangle& target,
             PackedImage& canvas) {
  const auto width = static_cast<int64_t>(bgr.size() / 3);
  const int64_t firstRow = target.y + int64_t{target.height} * y / height;
  const int64_t endRow = target.y + int64_t{target.height} * (y + 1) / height;
  const int64_t firstColumn = std::max(target.x, 0),
                endColumn = std::min(target.x + target.width, canvas.Width());
  for (int64_t row = std::max<int64_t>(firstRow, 0);
       row < std::min<int64_t>(endRow, canvas.Height()); ++row) {
    uint8_t* const place = canvas.Row(static_cast<int32_t>(row)).data();
    for (int64_t x = firstColumn; x < endColumn; ++x) {
      std::memcpy(place + 3 * x,
                  &bgr[static_cast<size_t>(3 * ((x - target.x) * width / target.width))], 3);
    }
  }
}

// Passes the rows of a JPEG file to `draw`: blue, green, red, the row number, and the
// number of rows.
template <typename Draw>
Status ReadJpeg(std::span<const uint8_t> file, Draw draw) {
  JpegReader reader;
  RETURN_IF_BAD(ReadJpegHeader(reader, file));
  jpeg_decompress_struct& info = reader.info;
  if (info.num_components != 1 && info.num_components != 3) return Status::UnsupportedFormat;
  if (info.image_width > INT16_MAX || info.image_height > INT16_MAX) return Status::DamagedFile;
  const uint64_t pixels = PackedRowBytes(static_cast<int32_t>(info.image_width),
                                         static_cast<int32_t>(info.image_height), 24);
  RETURN_IF_BAD(CheckFileMemory(JpegCoefficientBytes(reader, false) + pixels));
  std::vector<uint8_t> row(size_t{3} * info.image_width);
  const bool read = Guarded(reader.errors, [&] {
    info.out_color_space = JCS_EXT_BGR;
    jpeg_start_decompress(&info);
    while (info.output_scanline < info.output_height) {
      const auto y = static_cast<int32_t>(info.output_scanline);
      JSAMPROW target = row.data();
      jpeg_read_scanlines(&info, &target, 1);
      draw(std::span<const uint8_t>(row), y, static_cast<int32_t>(info.output_height));
    }
  });
  if (!read) return reader.Failure();
  return reader.errors.cutShort && reader.errors.endMissing ? Status::FileReadError : Status::Ok;
}

// Number of canvas pixels in a rectangle.
uint64_t PixelsOn(const PackedImage& canvas, const Rectangle& target) {
  const int32_t width = std::min(target.x + target.width, canvas.Width()) - std::max(target.x, 0);
  const int32_t height =
      std::min(target.y + target.height, canvas.Height()) - std::max(target.y, 0);
  return width < 1 || height < 1 ? 0 : static_cast<uint64_t>(width) * static_cast<uint64_t>(height);
}

Status ReadCanvas(const PictFile& pict, const PictureRecord& picture, PackedImage& image) {
  std::ranges::fill(image.Rows(), uint8_t{255});
  int32_t done = 0;
  uint64_t drawn = 0;
  for (const PictPixels& pixels : pict.pixels) {
    Rectangle target = pixels.target;
    target.x -= pict.frame.x;
    target.y -= pict.frame.y;
    RETURN_IF_BAD(picture.ReportRow(done++, static_cast<int32_t>(pict.pixels.size())));
    if (target.width < 1 || target.height < 1) continue;
    drawn += PixelsOn(image, target);
    if (drawn > kMostOverdraw * PixelsOn(image, {0, 0, image.Width(), image.Height()}))
      return Status::UnsupportedFormat;
    const auto draw = [&](std::span<const uint8_t> bgr, int32_t y, int32_t height) {
      DrawRow(bgr, y, height, target, image);
    };
    if (pixels.jpeg) {
      RETURN_IF_BAD(ReadJpeg(pixels.data, draw));
      continue;
    }
    const Rectangle shown = Shown(pixels);
    PictRowDecoder rows(pixels);
    for (int32_t y = 0; y < shown.y - pixels.bounds.y; ++y) RETURN_IF_BAD(rows.Next());
    for (int32_t y = 0; y < shown.height; ++y) {
      RETURN_IF_BAD(rows.Next());
      const auto first = 3 * static_cast<size_t>(shown.x - pixels.bounds.x);
      draw(rows.Colors().subspan(first, 3 * static_cast<size_t>(shown.width)), y, shown.height);
    }
  }
  return Status::Ok;
}

Status OpenPicture(platform::FileView& file, const std::string& name, PictFile& pict, View& view,
                   PictureRecord& picture) {
  if (!file.Open(name)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  RETURN_IF_BAD(ParsePict(file.Bytes(), pict));
  RETURN_IF_BAD(ChooseView(pict, view));
  DescribePicture(pict, view, picture);
  return Status::Ok;
}

}  // namespace

Status PictInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  PictFile pict;
  View view;
  return OpenPicture(file, request.fileName, pict, view, picture);
}

Status PictRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  PictFile pict;
  View view;
  RETURN_IF_BAD(OpenPicture(file, request.fileName, pict, view, picture));
  PackedImage image;
  RETURN_IF_BAD(NewPackedImage(view.width, view.height, &picture.palette, view.bits, image));
  if (view.canvas) {
    RETURN_IF_BAD(ReadCanvas(pict, picture, image));
  } else if (pict.pixels.front().jpeg) {
    const Rectangle whole{0, 0, view.width, view.height};
    RETURN_IF_BAD(ReadJpeg(pict.pixels.front().data, [&](std::span<const uint8_t> bgr, int32_t y, int32_t height) {
      DrawRow(bgr, y, height, whole, image);
      (void)picture.ReportRow(y, height);
    }));
  } else {
    RETURN_IF_BAD(ReadPiece(pict.pixels.front(), view, picture, image));
  }
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  return Status::Ok;
}

Status PictDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  PictFile pict;
  View view;
  RETURN_IF_BAD(OpenPicture(file, picture.fileName.c_str(), pict, view, picture));
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("      Version: %d", pict.version);
  lines.AddFormat("        Frame: %d x %d", pict.frame.width, pict.frame.height);
  lines.AddFormat("       Pieces: %zu of pixels", pict.pixels.size());
  const PictPixels& first = pict.pixels.front();
  if (!first.jpeg)
    lines.AddFormat("       Pixels: %d bits%s", first.bits, first.packed ? ", packed" : "");
  if (pict.drawings > 0) lines.AddFormat("    Not drawn: %d lines, shapes, texts", pict.drawings);
  if (pict.unsupported > 0) lines.AddFormat("  Not decoded: %d pieces of pixels", pict.unsupported);
  return Status::Ok;
}

}  // namespace fotomill
