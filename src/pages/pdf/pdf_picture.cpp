#include "pages/pdf/pdf_picture.h"

#include <algorithm>
#include <cstdlib>

#include "containers/jpeg_segments.h"
#include "core/md5.h"
#include "formats/jpeg/jpeg_encode.h"
#include "metadata/exif/picture_exif.h"
#include "processing/color/color_profile.h"
#include "processing/flatten.h"
#include "processing/pixel_rows.h"
#include "processing/promote.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

constexpr size_t kFrameHead = 6;  // bytes of a frame header up to the number of components
constexpr size_t kTail = 64;      // bytes in which the end marker is looked for

// What a JPEG file's frame header says. Source: ITU-T T.81, B.2.2.
struct JpegFrame {
  int32_t width = 0, height = 0, components = 0;
  bool adobe = false;  // has an Adobe segment
};

bool IsFrame(uint8_t marker) {
  return marker >= 0xC0 && marker <= 0xCF && marker != 0xC4 && marker != 0xC8 && marker != 0xCC;
}

// Whether the bytes are a JPEG file that every reader of documents decodes: Huffman coding,
// baseline to progressive, 8 bits, with its end marker.
bool IsPlainJpeg(std::span<const uint8_t> bytes, JpegFrame& frame) {
  JpegHead head;
  if (ParseJpegHead(bytes, head) != Status::Ok) return false;
  for (const JpegSegment& segment : head.segments) {
    if (segment.marker == 0xEE && segment.Starts("Adobe")) frame.adobe = true;
    if (!IsFrame(segment.marker)) continue;
    const auto data = segment.data;
    if (segment.marker > 0xC2 || data.size() < kFrameHead || data[0] != 8) return false;
    frame.height = data[1] << 8 | data[2];
    frame.width = data[3] << 8 | data[4];
    frame.components = data[5];
    // components named by letters are not the color differences readers expect
    if (frame.components == 3 && data.size() > kFrameHead && data[kFrameHead] == 'R') return false;
  }
  const auto tail = bytes.last(std::min(bytes.size(), kTail));
  constexpr uint8_t kEnd[] = {0xFF, 0xD9};
  return frame.width > 0 && frame.height > 0 &&
         (frame.components == 1 || frame.components == 3 || frame.components == 4) &&
         !std::ranges::search(tail, kEnd).empty();
}

// Keeps a profile only if it describes the picture's colors.
void TakeProfile(const PictureRecord& record, int32_t components, PdfPicture& picture) {
  const ProfileColors colors = ColorsOfProfile(record.metadata.icc);
  const bool fits = (colors == ProfileColors::Rgb && components == 3) ||
                    (colors == ProfileColors::Gray && components == 1);
  if (fits && OpenTrustedProfile(record.metadata.icc) != nullptr)
    picture.profile = record.metadata.icc;
}

// Takes a file as it is; false if it must be decoded.
bool TakeJpeg(const std::string& file, const PictureRecord& record, PdfPicture& picture) {
  JpegFrame frame;
  if (!picture.file.Open(file)) return false;
  if (!IsPlainJpeg(picture.file.Bytes(), frame) || frame.width != record.width ||
      frame.height != record.height) {
    picture.file.Close();
    return false;
  }
  picture.width = frame.width;
  picture.height = frame.height;
  picture.components = frame.components;
  picture.colors = frame.components == 1   ? "/DeviceGray"
                   : frame.components == 3 ? "/DeviceRGB"
                                           : "/DeviceCMYK";
  picture.entries = "/BitsPerComponent 8 /Filter /DCTDecode";
  // programs of Adobe store inverted inks
  if (frame.components == 4 && frame.adobe) picture.entries += " /Decode [1 0 1 0 1 0 1 0]";
  TakeProfile(record, frame.components, picture);
  return true;
}

// Predicts each row from its left neighbors and the row above, which halves photos. Source: PNG
// specification (third edition), section 9.4.
void AddPaethRow(const uint8_t* row, const uint8_t* above, size_t count, size_t pixel,
                 std::vector<uint8_t>& out) {
  out.push_back(4);
  for (size_t i = 0; i < count; ++i) {
    const int left = i < pixel ? 0 : row[i - pixel], up = above[i],
              corner = i < pixel ? 0 : above[i - pixel];
    const int guess = left + up - corner;
    const int toLeft = std::abs(guess - left), toUp = std::abs(guess - up),
              toCorner = std::abs(guess - corner);
    const int chosen = toLeft <= toUp && toLeft <= toCorner ? left : toUp <= toCorner ? up : corner;
    out.push_back(static_cast<uint8_t>(row[i] - chosen));
  }
}

std::string PredictorEntries(int32_t colors, int32_t width) {
  return std::string(
             "/BitsPerComponent 8 /Filter /FlateDecode /DecodeParms << /Predictor 15 /Colors ") +
         std::to_string(colors) + " /Columns " + std::to_string(width) + " >>";
}

// Frees the image.
Status EncodeColors(PackedImage& image, PdfPicture& picture) {
  const auto width = static_cast<size_t>(image.Width());
  std::vector<uint8_t> filtered, row(width * 3), above(width * 3);
  filtered.reserve((width * 3 + 1) * static_cast<size_t>(image.Height()));
  for (int32_t y = 0; y < image.Height(); ++y) {
    SwapColors(image.Row(y).data(), width, row.data());
    AddPaethRow(row.data(), above.data(), row.size(), 3, filtered);
    row.swap(above);
  }
  picture.colors = "/DeviceRGB";
  picture.entries = PredictorEntries(3, image.Width());
  image = {};
  return Deflated(filtered, picture.bytes);
}

Status EncodeIndices(const PackedImage& image, PdfPicture& picture) {
  const size_t bytes =
      (static_cast<size_t>(image.Width()) * static_cast<size_t>(image.Bits()) + 7) / 8;
  std::vector<uint8_t> rows;
  for (int32_t y = 0; y < image.Height(); ++y) {
    const auto row = image.Row(y).first(bytes);
    rows.insert(rows.end(), row.begin(), row.end());
  }
  constexpr const char* kDigits = "0123456789ABCDEF";
  std::string table;
  for (int32_t i = 0; i < image.Colors(); ++i) {
    for (const size_t part : {2, 1, 0}) {
      const uint8_t value = image.ColorTable()[static_cast<size_t>(i) * 4 + part];
      table += {kDigits[value >> 4], kDigits[value & 15]};
    }
  }
  picture.colors = std::string("[/Indexed /DeviceRGB ") + std::to_string(image.Colors() - 1) +
                   " <" + table + ">]";
  picture.entries =
      std::string("/BitsPerComponent ") + std::to_string(image.Bits()) + " /Filter /FlateDecode";
  return Deflated(rows, picture.bytes);
}

Status EncodeOpacity(const PackedImage& alpha, PdfPicture& picture) {
  if (alpha.Empty() || IsOpaque(alpha)) return Status::Ok;
  const auto width = static_cast<size_t>(alpha.Width());
  std::vector<uint8_t> filtered, none(width);
  for (int32_t y = 0; y < alpha.Height(); ++y) {
    AddPaethRow(alpha.Row(y).data(), y == 0 ? none.data() : alpha.Row(y - 1).data(), width, 1,
                filtered);
  }
  return Deflated(filtered, picture.opacity);
}

Status Encode(PictureRecord& record, int32_t quality, PdfPicture& picture) {
  picture.width = record.image.Width();
  picture.height = record.image.Height();
  RETURN_IF_BAD(EncodeOpacity(record.alpha, picture));
  const bool photo = record.jpegCoding != nullptr && picture.opacity.empty();
  if (photo) {
    RETURN_IF_BAD(PromotePicture(record));
    TakeProfile(record, 3, picture);
    picture.colors = "/DeviceRGB";
    picture.entries = "/BitsPerComponent 8 /Filter /DCTDecode";
    return EncodeJpeg(record.image, quality, picture.bytes);
  }
  if (record.image.Bits() < 24) return EncodeIndices(record.image, picture);
  TakeProfile(record, 3, picture);
  return EncodeColors(record.image, picture);
}

}  // namespace

Status PreparePdfPicture(const std::string& file, int32_t width, int32_t height,
                         const PdfPictureOptions& options, PdfPicture& picture) {
  PagePicture facts;
  PicturePointer record;
  RETURN_IF_BAD(ReadPageFacts(file, options.reading, facts, record));
  if (width <= 0 || height <= 0) width = facts.width, height = facts.height;
  const bool whole = facts.width <= width && facts.height <= height;
  if (whole && !options.reading.ChangesColors() && TakeJpeg(file, *record, picture)) {
    if (options.reading.upright) picture.orientation = OrientationOf(*record);
    return Status::Ok;
  }
  RETURN_IF_BAD(ReadPagePicture(options.reading, width, height, *record));
  return Encode(*record, options.quality, picture);
}

Status PdfPictureWriter::Write(PdfFile& file, const PdfPicture& picture, int32_t object) {
  std::string entries = std::string("/Type /XObject /Subtype /Image /Width ") +
                        std::to_string(picture.width) + " /Height " +
                        std::to_string(picture.height) + " ";
  if (picture.profile.empty()) {
    entries += "/ColorSpace " + picture.colors + " ";
  } else {
    const auto [known, added] = profiles_.try_emplace(Md5Text(picture.profile), 0);
    if (added) {
      known->second = file.NewObject();
      RETURN_IF_BAD(file.WriteDeflated(
          known->second,
          std::string("/N ") + std::to_string(picture.components) + " /Alternate " + picture.colors,
          picture.profile));
    }
    entries += std::string("/ColorSpace [/ICCBased ") + PdfReference(known->second) + "] ";
  }
  if (!picture.opacity.empty()) {
    const int32_t mask = file.NewObject();
    file.WriteStream(mask,
                     std::string("/Type /XObject /Subtype /Image /Width ") +
                         std::to_string(picture.width) + " /Height " +
                         std::to_string(picture.height) + " /ColorSpace /DeviceGray " +
                         PredictorEntries(1, picture.width),
                     picture.opacity);
    entries += std::string("/SMask ") + PdfReference(mask) + " ";
  }
  file.WriteStream(object, entries + picture.entries, picture.Bytes());
  return Status::Ok;
}

}  // namespace fotomill
