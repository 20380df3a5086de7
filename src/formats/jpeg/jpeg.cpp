// JPEG (JFIF, Exif), big-endian, decoded and encoded by libjpeg.
//
//   FF D8, then segments of FF, a marker byte, a length (2 bytes, including itself) and data:
//   E0 "JFIF" resolution    E1 "Exif\0\0" EXIF, "http://ns.adobe.com/xap/1.0/\0" XMP
//   E2 "ICC_PROFILE\0" n of m    EE "Adobe" color transform    FE comment    DB, C4 tables
//   C0-CF frame    DA scan and its data    D9 end
//
// Gray pictures become 8 bits with a gray palette, all others 24 bits. CMYK and YCCK are converted
// to RGB by the usual formula, with inverted values as stored by Adobe's programs. EXIF, XMP, ICC
// profile, comment and resolution are kept; the orientation is not applied here.
//
// Error handling: a file that ends before its last pixel fails (status 3). If the decoder recovers
// from damaged data, the picture is shown and the record's `warning` set; a missing end marker is
// not an error.
//
// The writer creates baseline or progressive files (WriteJpegProgressive) with quality
// JpegCompression and chroma subsampling JpegSubsample. Grays stay gray; other palettes are
// promoted. JpegStoreDPI stores a resolution: the picture's, else TiffResolution. Source: ITU-T
// T.81 (1992) and T.871 (2011); Adobe Technical Note 5116; XMP specification part 3; ICC.1:2022,
// annex B.4.
#include "formats/jpeg/jpeg.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <string_view>
#include <vector>

#include "containers/jpeg_segments.h"
#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/choice_lists.h"
#include "core/limits.h"
#include "formats/jpeg/jpeg_coding.h"
#include "formats/jpeg/jpeg_library.h"
#include "picture/gray_palette.h"
#include "picture/partial.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr std::string_view kIccHead("ICC_PROFILE\0", 12);
constexpr int kApp1 = JPEG_APP0 + 1, kApp2 = JPEG_APP0 + 2, kApp13 = JPEG_APP0 + 13;

bool IsGray(const jpeg_decompress_struct& info) { return info.jpeg_color_space == JCS_GRAYSCALE; }
bool IsCmyk(const jpeg_decompress_struct& info) {
  return info.jpeg_color_space == JCS_CMYK || info.jpeg_color_space == JCS_YCCK;
}

std::string_view DataOf(const JpegSegment& segment) {
  return {static_cast<const char*>(static_cast<const void*>(segment.data.data())),
          segment.data.size()};
}

void Append(std::vector<uint8_t>& block, std::string_view data) {
  if (block.size() + data.size() <= limits.metadataBytes)
    block.insert(block.end(), data.begin(), data.end());
}

// The profile's segments may come in any order; each has its number, from 1, and the total.
void JoinProfile(const JpegReader& reader, std::vector<uint8_t>& profile) {
  std::array<std::string_view, 256> pieces = {};
  for (const JpegSegment& segment : reader.segments) {
    const std::string_view data = DataOf(segment);
    if (segment.marker != kApp2 || !data.starts_with(kIccHead) || data.size() <= 14) continue;
    std::string_view& piece = pieces[static_cast<uint8_t>(data[12])];
    if (piece.empty()) piece = data.substr(14);
  }
  for (size_t i = 1; i < pieces.size() && !pieces[i].empty(); ++i) Append(profile, pieces[i]);
}

void TakeMetadata(const JpegReader& reader, PictureRecord& picture) {
  const jpeg_decompress_struct& info = reader.info;
  PictureMetadata& metadata = picture.metadata;
  metadata = {};
  picture.comment.clear();
  picture.unread = IsCmyk(info) ? kUnreadInks : uint8_t{0};
  for (const JpegSegment& segment : reader.segments) {
    const std::string_view data = DataOf(segment);
    if (segment.marker == kApp13) {
      picture.unread |= kUnreadIptc;
    } else if (segment.marker == JPEG_COM) {
      if (!picture.comment.empty()) picture.unread |= kUnreadTexts;
      if (picture.comment.empty()) Append(picture.comment, data.substr(0, data.find('\0')));
    } else if (segment.marker == kApp1 && data.starts_with(kExifHead) && metadata.exif.empty()) {
      Append(metadata.exif, data.substr(kExifHead.size()));
    } else if (segment.marker == kApp1 && data.starts_with(kXmpHead) && metadata.xmp.empty()) {
      Append(metadata.xmp, data.substr(kXmpHead.size()));
    }
  }
  JoinProfile(reader, metadata.icc);
  if (info.saw_JFIF_marker && (info.density_unit == 1 || info.density_unit == 2)) {
    const double perInch = info.density_unit == 2 ? 2.54 : 1;
    metadata.dpiX = info.X_density * perInch;
    metadata.dpiY = info.Y_density * perInch;
  }
}

Status DescribePicture(const JpegReader& reader, PictureRecord& picture) {
  const jpeg_decompress_struct& info = reader.info;
  picture.typeName.AssignCut(info.progressive_mode ? "Progressive JPEG" : "JPEG");
  picture.width = static_cast<int32_t>(info.image_width);
  picture.height = static_cast<int32_t>(info.image_height);
  picture.bitsPerPixel = IsGray(info) ? 8 : 24;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  if (IsGray(info)) {
    picture.palette = GrayRamp();
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
  TakeMetadata(reader, picture);
  return picture.width < 1 || picture.height < 1 ? Status::DamagedFile : Status::Ok;
}

// Sets the output color space, and the smallest scale in eighths whose longer edge is at least
// twice the requested side.
void SetOutput(jpeg_decompress_struct& info, int32_t thumbnailSide) {
  info.out_color_space = IsGray(info) ? JCS_GRAYSCALE : IsCmyk(info) ? JCS_CMYK : JCS_EXT_BGR;
  info.scale_denom = 8;
  info.scale_num = 8;
  const auto longer = static_cast<int64_t>(std::max(info.image_width, info.image_height));
  for (const unsigned eighths : {4u, 2u, 1u}) {
    if (thumbnailSide > 0 && longer * eighths / 8 >= 2 * int64_t{thumbnailSide})
      info.scale_num = eighths;
  }
  jpeg_calc_output_dimensions(&info);
}

// CMYK to RGB. 255 means no ink: this is how Adobe's programs store it, and files without their
// marker are treated the same.
void CmykToBgr(const uint8_t* ink, uint8_t* color, size_t width) {
  for (size_t x = 0; x < width; ++x, ink += 4, color += 3) {
    for (size_t i = 0; i < 3; ++i) {
      color[i] = static_cast<uint8_t>((uint32_t{ink[2 - i]} * ink[3] + 127) / 255);
    }
  }
}

Status ReadPixels(JpegReader& reader, const ReadRequest& request, PictureRecord& picture,
                  PackedImage& image) {
  jpeg_decompress_struct& info = reader.info;
  const bool cmyk = info.out_color_space == JCS_CMYK;
  std::vector<uint8_t> ink(cmyk ? 4 * static_cast<size_t>(info.output_width) : 0);
  reader.stop = picture.stop;
  Status status = Status::Ok;
  const bool read = Guarded(reader.errors, [&] {
    jpeg_start_decompress(&info);
    while (info.output_scanline < info.output_height && status == Status::Ok) {
      const auto y = static_cast<int32_t>(info.output_scanline);
      uint8_t* target = image.Row(y).data();
      JSAMPROW row = cmyk ? ink.data() : target;
      jpeg_read_scanlines(&info, &row, 1);
      if (cmyk) CmykToBgr(ink.data(), target, info.output_width);
      status = picture.ReportRow(y, image.Height());
    }
  });
  if (!read) return reader.Failure();
  RETURN_IF_BAD(status);
  const bool ended = reader.errors.cutShort && reader.errors.endMissing;
  return TakePart(picture, request.partial, ended ? Status::FileReadError : Status::Ok,
                  reader.errors.wholeRows);
}

struct JpegWriter {
  JpegWriter() {
    errors.Set();
    info.err = &errors.base;
  }
  ~JpegWriter() { jpeg_destroy_compress(&info); }
  JpegWriter(const JpegWriter&) = delete;
  JpegWriter& operator=(const JpegWriter&) = delete;

  JpegErrors errors;
  jpeg_compress_struct info = {};
  jpeg_destination_mgr destination = {};
  ByteWriter out;
};

// The library writes directly into the file's buffer.
void OfferBuffer(j_compress_ptr info) {
  auto* out = static_cast<ByteWriter*>(info->client_data);
  info->dest->next_output_byte = out->Reserve(ByteWriter::kMostReserved);
  info->dest->free_in_buffer = ByteWriter::kMostReserved;
}
boolean TakeFullBuffer(j_compress_ptr info) {
  static_cast<ByteWriter*>(info->client_data)->Used(ByteWriter::kMostReserved);
  OfferBuffer(info);
  return TRUE;
}
void TakeLastBuffer(j_compress_ptr info) {
  static_cast<ByteWriter*>(info->client_data)
      ->Used(ByteWriter::kMostReserved - info->dest->free_in_buffer);
}

void SetSampling(jpeg_compress_struct& info, int32_t choice) {
  if (info.num_components != 3) return;
  info.comp_info[0].h_samp_factor = choice == choice::kSubsample444 ? 1 : 2;
  info.comp_info[0].v_samp_factor = choice == choice::kSubsample420 ? 2 : 1;
}

void SetResolution(jpeg_compress_struct& info, const PictureMetadata& metadata, int32_t otherwise) {
  const auto clamp = [](double dpi) {
    return static_cast<UINT16>(std::clamp<long>(std::lround(dpi), 1, 65535));
  };
  info.density_unit = 1;
  info.X_density = clamp(metadata.dpiX > 0 ? metadata.dpiX : otherwise);
  info.Y_density = clamp(metadata.dpiY > 0 ? metadata.dpiY : otherwise);
}

void SetParameters(JpegWriter& writer, const PictureRecord& picture, bool gray,
                   const EncodeOptions& options) {
  jpeg_compress_struct& info = writer.info;
  jpeg_create_compress(&info);
  info.client_data = &writer.out;
  info.dest = &writer.destination;
  writer.destination.init_destination = OfferBuffer;
  writer.destination.empty_output_buffer = TakeFullBuffer;
  writer.destination.term_destination = TakeLastBuffer;
  info.image_width = static_cast<JDIMENSION>(picture.image.Width());
  info.image_height = static_cast<JDIMENSION>(picture.image.Height());
  info.input_components = gray ? 1 : 3;
  info.in_color_space = gray ? JCS_GRAYSCALE : JCS_EXT_BGR;
  jpeg_set_defaults(&info);
  jpeg_set_quality(&info, std::clamp<int>(options.jpegQuality, 1, 100), TRUE);
  SetSampling(info, options.jpegSubsampling);
  if (options.jpegAsSource && picture.jpegCoding != nullptr) SetCoding(info, *picture.jpegCoding);
  if (options.jpegStoresResolution) SetResolution(info, picture.metadata, options.resolution);
  if (options.jpegProgressive) {
    jpeg_simple_progression(&info);
  } else {
    info.optimize_coding = FALSE;
  }
}

// Writes a segment with a header and data. False, without writing anything, if it is too large.
bool WriteSegment(jpeg_compress_struct& info, int marker, std::string_view head,
                  std::span<const uint8_t> data) {
  if (data.empty()) return true;
  if (head.size() + data.size() > kMostSegment) return false;
  jpeg_write_m_header(&info, marker, static_cast<unsigned>(head.size() + data.size()));
  for (const char c : head) jpeg_write_m_byte(&info, static_cast<uint8_t>(c));
  for (const uint8_t byte : data) jpeg_write_m_byte(&info, byte);
  return true;
}

bool WriteProfile(jpeg_compress_struct& info, std::span<const uint8_t> profile) {
  constexpr size_t kPiece = kMostSegment - 14;
  const size_t pieces = (profile.size() + kPiece - 1) / kPiece;
  if (pieces > 255) return false;
  for (size_t i = 0; i < pieces; ++i) {
    char head[14];
    std::copy(kIccHead.begin(), kIccHead.end(), head);
    head[12] = static_cast<char>(i + 1);
    head[13] = static_cast<char>(pieces);
    const auto piece = profile.subspan(i * kPiece, std::min(kPiece, profile.size() - i * kPiece));
    (void)WriteSegment(info, kApp2, {head, sizeof head}, piece);  // pieces fit
  }
  return true;
}

// `keep`: whether to write more than the profile, which belongs to the colors.
void WriteMetadata(jpeg_compress_struct& info, PictureRecord& picture, bool keep) {
  const PictureMetadata& metadata = picture.metadata;
  if (keep && !WriteSegment(info, kApp1, kExifHead, metadata.exif))
    picture.lostMetadata |= kLostExif;
  if (keep && !WriteSegment(info, kApp1, kXmpHead, metadata.xmp)) picture.lostMetadata |= kLostXmp;
  if (!WriteProfile(info, metadata.icc)) picture.lostMetadata |= kLostIcc;
  if (keep) (void)WriteSegment(info, JPEG_COM, {}, picture.comment);
}

// A row for the encoder: grays, or blue, green, red.
void ExpandRow(const PictureRecord& picture, int32_t y, bool gray, std::vector<uint8_t>& target) {
  const auto row = picture.image.Row(y);
  const auto bits = static_cast<size_t>(picture.image.Bits());
  const size_t perByte = 8 / bits;
  const uint32_t mask = (1u << bits) - 1;
  for (size_t x = 0; x < static_cast<size_t>(picture.image.Width()); ++x) {
    const uint8_t* color =
        &picture.palette[3 * (row[x / perByte] >> (perByte - 1 - x % perByte) * bits & mask)];
    if (gray) {
      target[x] = color[0];
    } else {
      target[3 * x] = color[2];
      target[3 * x + 1] = color[1];
      target[3 * x + 2] = color[0];
    }
  }
}

Status WriteAll(JpegWriter& writer, PictureRecord& picture, const WriteOptions& options) {
  const PackedImage& image = picture.image;
  const bool gray = HasOnlyGrays(picture.palette, image.Colors());
  std::vector<uint8_t> expanded(
      image.Bits() == 24 ? 0 : (gray ? 1 : 3) * static_cast<size_t>(image.Width()));
  Status status = Status::Ok;
  const bool written = Guarded(writer.errors, [&] {
    SetParameters(writer, picture, gray, options.encode);
    jpeg_start_compress(&writer.info, TRUE);
    WriteMetadata(writer.info, picture, options.KeepsMetadata());
    for (int32_t y = 0; y < image.Height() && status == Status::Ok; ++y) {
      if (!expanded.empty()) ExpandRow(picture, y, gray, expanded);
      JSAMPROW row = expanded.empty() ? const_cast<JSAMPROW>(image.Row(y).data()) : expanded.data();
      jpeg_write_scanlines(&writer.info, &row, 1);
      status = picture.ReportRow(y);
    }
    if (status == Status::Ok) jpeg_finish_compress(&writer.info);
  });
  return written ? status : Status::ErrorWritingFile;
}

const char* ColorSpaceName(J_COLOR_SPACE space) {
  switch (space) {
    case JCS_GRAYSCALE: return "gray";
    case JCS_RGB: return "RGB";
    case JCS_YCbCr: return "YCbCr";
    case JCS_CMYK: return "CMYK";
    case JCS_YCCK: return "YCCK";
    default: return "unknown";
  }
}

void AddDetails(const jpeg_decompress_struct& info, const PictureRecord& picture,
                DetailLines& lines) {
  lines.AddFormat("      Process: %s", info.progressive_mode ? "progressive" : "sequential");
  lines.AddFormat("  Color space: %s", ColorSpaceName(info.jpeg_color_space));
  if (info.num_components >= 3) {
    const jpeg_component_info& luma = info.comp_info[0];
    const jpeg_component_info& chroma = info.comp_info[1];
    lines.AddFormat("     Sampling: %dx%d, %dx%d", luma.h_samp_factor, luma.v_samp_factor,
                    chroma.h_samp_factor, chroma.v_samp_factor);
  }
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0)
    lines.AddFormat("   Resolution: %.0f x %.0f dpi", metadata.dpiX, metadata.dpiY);
  if (info.restart_interval > 0)
    lines.AddFormat("     Restarts: every %u blocks", info.restart_interval);
  if (info.saw_Adobe_marker) lines.AddFormat(" Adobe marker: transform %d", info.Adobe_transform);
  if (!metadata.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", metadata.icc.size());
  if (!metadata.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", metadata.exif.size());
  if (!metadata.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", metadata.xmp.size());
  if (!picture.comment.empty())
    lines.Add("      Comment: " + std::string(picture.comment.begin(), picture.comment.end()));
}

}  // namespace

Status JpegInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  return JpegStreamInfo(picture, {file.Bytes()});
}

Status JpegStreamInfo(PictureRecord& picture, const JpegStream& stream) {
  JpegReader reader;
  RETURN_IF_BAD(ReadJpegHeader(reader, stream.data, stream.tables));
  return DescribePicture(reader, picture);
}

Status JpegRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  return JpegStreamRead(picture, request, {file.Bytes()}, file);
}

Status JpegStreamRead(PictureRecord& picture, const ReadRequest& request, const JpegStream& stream,
                      const platform::FileView& file) {
  picture.warning.Clear();
  picture.note.Clear();
  JpegReader reader;
  RETURN_IF_BAD(ReadJpegHeader(reader, stream.data, stream.tables));
  RETURN_IF_BAD(DescribePicture(reader, picture));
  if (!Guarded(reader.errors, [&] { SetOutput(reader.info, request.thumbnailSide); }))
    return reader.Failure();
  PackedImage image;
  const auto width = static_cast<int32_t>(reader.info.output_width),
             height = static_cast<int32_t>(reader.info.output_height);
  RETURN_IF_BAD(CheckFileMemory(JpegCoefficientBytes(reader, false) + PackedRowBytes(width, height, picture.bitsPerPixel)));
  RETURN_IF_BAD(NewPackedImage(width, height, &picture.palette, picture.bitsPerPixel, image));
  RETURN_IF_BAD(ReadPixels(reader, request, picture, image));
  if (!file.Intact()) return Status::FileReadError;
  picture.warning.AssignCut(reader.errors.warning);
  picture.note.AssignCut(reader.errors.note);
  picture.reduction = static_cast<int32_t>(reader.info.scale_denom / reader.info.scale_num);
  picture.jpegCoding = CodingOf(reader.info);
  picture.image = std::move(image);
  return Status::Ok;
}

Status JpegWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  const uint64_t pixels =
      static_cast<uint64_t>(picture.image.Width()) * static_cast<uint64_t>(picture.image.Height());
  const uint64_t coefficients =
      picture.image.Bits() == 24 ? 3 * sizeof(JCOEF) * pixels : sizeof(JCOEF) * pixels;
  const uint64_t held = picture.image.Bytes().size() + picture.alpha.Bytes().size();
  RETURN_IF_BAD(CheckFileMemory(held + (options.encode.jpegProgressive ? coefficients : 0)));
  JpegWriter writer;
  if (!writer.out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WriteAll(writer, picture, options));
  return CommitOutput(writer.out, options);
}

Status JpegDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  return JpegStreamDetails(picture, {file.Bytes()});
}

Status JpegStreamDetails(PictureRecord& picture, const JpegStream& stream) {
  JpegReader reader;
  RETURN_IF_BAD(ReadJpegHeader(reader, stream.data, stream.tables));
  TakeMetadata(reader, picture);
  AddDetails(reader.info, picture, picture.detailLines);
  return Status::Ok;
}

}  // namespace fotomill
