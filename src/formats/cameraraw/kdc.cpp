// Kodak digital cameras (KDC: DC40, DC50, DC120 and later), TIFF files of either byte order.
//
//   offset size  field
//        0    4  "II" 42, 0 or "MM" 0, 42
//        4    4  offset of the first directory
//   directory: number of entries (2 bytes); entries of 12 bytes: tag, type (2 each), number of
//   values (4), the value or its offset (4); then the offset of the next directory, or 0 (4)
//
// Directories describe the sensor data, along with small preview pictures: a JPEG (tags 513 and
// 514, or a single strip with compression 6 or 7), or a single strip of red, green, blue. The
// encoding of the sensor data depends on the camera model; LibRaw handles it.
//
// If LibRaw is missing or rejects a file, the largest preview is shown, with a note. Read-only.
// Source: Adobe, "TIFF 6.0" (1992), and its Technical Note 1 on subdirectories; LibRaw's
// documentation.
#include "formats/cameraraw/kdc.h"

#include <algorithm>
#include <string>

#include "formats/cameraraw/raw_library.h"
#include "formats/cameraraw/raw_preview.h"
#include "formats/jpeg/jpeg.h"
#include "platform/file_view.h"
#include "platform/temporary_file.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kPreviewNote = TrLater("Only the embedded preview is shown.");

void SetFacts(int32_t width, int32_t height, PictureRecord& picture) {
  picture.width = width;
  picture.height = height;
  picture.bitsPerPixel = 24;
  picture.pageCount = 1;
  picture.imageBytes = EstimateImageBytes(width, height, 24);
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
}

// Converts a row of red, green, blue to the image's byte order.
void SwapRow(const uint8_t* rgb, std::span<uint8_t> bgr, int32_t width) {
  for (size_t i = 0; i < 3 * static_cast<size_t>(width); i += 3) {
    bgr[i] = rgb[i + 2];
    bgr[i + 1] = rgb[i + 1];
    bgr[i + 2] = rgb[i];
  }
}

// The JPEG codec opens files. The record keeps its own file name and size.
Status LoadJpeg(const RawPreview& preview, const ReadRequest& request, bool decode,
                PictureRecord& picture) {
  platform::TemporaryFile working;
  if (!working.Create(".jpg") || !working.Write(preview.jpeg)) return Status::ErrorWritingFile;
  ReadRequest inner = request;
  inner.fileName = working.Path();
  inner.page = 0;
  const uint64_t fileSize = picture.fileSize;
  const Status status = decode ? JpegRead(picture, inner) : JpegInfo(picture, inner);
  picture.fileSize = fileSize;
  return status;
}

Status LoadPreview(const RawPreview& preview, const ReadRequest& request, bool decode,
                   PictureRecord& picture) {
  if (!preview.jpeg.empty()) {
    RETURN_IF_BAD(LoadJpeg(preview, request, decode, picture));
  } else {
    SetFacts(preview.width, preview.height, picture);
  }
  picture.typeName.AssignCut("Preview in a raw file");
  picture.simplified = true;
  picture.note.AssignCut(kPreviewNote);
  if (!decode || !preview.jpeg.empty()) return Status::Ok;
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, nullptr, 24, picture.image));
  const size_t rowBytes = 3 * static_cast<size_t>(picture.width);
  for (int32_t y = 0; y < picture.height; ++y)
    SwapRow(&preview.rows[rowBytes * static_cast<size_t>(y)], picture.image.Row(y), picture.width);
  return Status::Ok;
}

// The picture decoded by LibRaw.
Status LoadRaw(std::span<const uint8_t> file, const ReadRequest& request, bool decode,
               PictureRecord& picture) {
  RawFacts facts;
  RETURN_IF_BAD(DescribeRaw(file, request.stop, facts));
  SetFacts(facts.width, facts.height, picture);
  picture.typeName.AssignCut(facts.camera);
  picture.simplified = true;
  if (!decode) return Status::Ok;
  RawPixels pixels;
  PackedImage image;
  RETURN_IF_BAD(DevelopRaw(file, facts, request.stop, pixels));
  RETURN_IF_BAD(NewPackedImage(facts.width, facts.height, nullptr, 24, image));
  for (int32_t y = 0; y < facts.height; ++y) {
    SwapRow(pixels.Row(facts, y), image.Row(y), facts.width);
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  if (pixels.damaged) picture.warning.AssignCut(TrLater("The sensor data is damaged."));
  picture.image = std::move(image);
  return Status::Ok;
}

// Whether to try the preview: LibRaw failed, and the operation was not canceled.
bool MayFallBack(Status status) {
  return status != Status::Ok && status != Status::FunctionCancelled &&
         status != Status::MemoryAllocationError;
}

Status Load(const ReadRequest& request, bool decode, PictureRecord& picture) {
  picture.warning.Clear();
  picture.note.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  if (!IsRawFile(file.Bytes())) return Status::DamagedFile;
  Status status = LoadRaw(file.Bytes(), request, decode, picture);
  RawPreview preview;
  if (MayFallBack(status) && FindRawPreview(file.Bytes(), preview))
    status = LoadPreview(preview, request, decode, picture);
  if (status == Status::Ok && !file.Intact()) status = Status::FileReadError;
  if (status != Status::Ok) {
    picture.image.Free();
    picture.alpha.Free();
  }
  return status;
}

}  // namespace

Status KdcInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  return Load(request, false, picture);
}

Status KdcRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  return Load(request, true, picture);
}

}  // namespace fotomill
