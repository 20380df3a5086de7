#include "formats/jpeg/jpeg_library.h"

#include <cstring>
#include <string_view>

#include "core/limits.h"

namespace fotomill {

namespace {

constexpr int kMostScans = 500;  // in a progressive file; more are a denial of service

JpegErrors& ErrorsOf(j_common_ptr common) {
  return *static_cast<JpegErrors*>(static_cast<void*>(common->err));
}

[[noreturn]] void OnError(j_common_ptr common) {
  ErrorsOf(common).code = common->err->msg_code;
  std::longjmp(ErrorsOf(common).jump, 1);
}

// Number of rows decoded so far; for pictures with several scans, 1 stands for all
// rows, however coarse.
int64_t RowsOut(j_common_ptr common) {
  if (common->is_decompressor == FALSE) return 0;
  auto* info = static_cast<j_decompress_ptr>(static_cast<void*>(common));
  if (jpeg_has_multiple_scans(info) != FALSE)
    return info->input_scan_number > 1 || info->input_iMCU_row > 0 ? 1 : 0;
  return info->output_scanline;
}

// Message codes are not in the library's public header, but their texts are stable.
void OnMessage(j_common_ptr common, int level) {
  if (level >= 0) return;  // trace message
  ++common->err->num_warnings;
  JpegErrors& errors = ErrorsOf(common);
  char text[JMSG_LENGTH_MAX];
  common->err->format_message(common, text);
  const std::string_view message(text);
  if (message.starts_with("Premature end of JPEG file")) {
    errors.endMissing = true;
  } else if (message.find("premature end of data segment") != std::string_view::npos) {
    if (!errors.cutShort) errors.wholeRows = RowsOut(common);
    errors.cutShort = true;
  }
  const bool damage = message.starts_with("Corrupt JPEG data") &&
                      message.find("extraneous bytes") == std::string_view::npos;
  char* const place = damage ? errors.warning : errors.note;
  if (place[0] == 0 && !errors.endMissing) std::memcpy(place, text, sizeof text);
}

void OutputNothing(j_common_ptr) {}

// Called by the library for each row of blocks in every scan.
void Watch(j_common_ptr common) {
  const auto* info = static_cast<const jpeg_decompress_struct*>(static_cast<void*>(common));
  const auto* reader = static_cast<const JpegReader*>(info->client_data);
  ErrorsOf(common).stopped = reader->stop.Asked();
  if (ErrorsOf(common).stopped || info->input_scan_number > kMostScans)
    common->err->error_exit(common);
}

// Whether it is an Adobe segment with captions and keywords. Source: Adobe, "Photoshop File Formats
// Specification", image resources; 1028 is IPTC.
bool HoldsIptc(const JpegSegment& segment) {
  constexpr uint8_t kApp13 = JPEG_APP0 + 13;
  constexpr std::string_view kHead("Photoshop 3.0\0", 14), kIptc("8BIM\x04\x04", 6);
  return segment.marker == kApp13 && segment.Starts(kHead) &&
         TextOf(segment.data).find(kIptc) != std::string_view::npos;
}

// Whether a segment is copied with the picture, or reported if it is not.
bool IsKept(const JpegSegment& segment) {
  constexpr int kApp1 = JPEG_APP0 + 1, kApp2 = JPEG_APP0 + 2;
  return segment.marker == JPEG_COM || segment.marker == kApp2 || HoldsIptc(segment) ||
         (segment.marker == kApp1 && (segment.Starts(kExifHead) || segment.Starts(kXmpHead)));
}

// Walks to the first scan: collects segments, for which the library itself takes quadratic time,
// and rejects files with too much garbage, such as a hole of a terabyte after the first bytes.
Status WalkHead(JpegReader& reader, std::span<const uint8_t> file) {
  JpegWalk walk(file, limits.garbageBytes);
  for (JpegPlace place; walk.Next(place) && place.end <= file.size();) {
    const JpegSegment segment = SegmentAt(file, place);
    if (IsKept(segment) && reader.segments.size() < limits.jpegSegments)
      reader.segments.push_back(segment);
  }
  // The library reports truncation.
  return walk.Outcome() == Status::DamagedFile ? Status::DamagedFile : Status::Ok;
}

}  // namespace

void JpegErrors::Set() {
  jpeg_std_error(&base);
  base.error_exit = OnError;
  base.emit_message = OnMessage;
  base.output_message = OutputNothing;
}

JpegReader::JpegReader() {
  errors.Set();
  info.err = &errors.base;
  monitor.progress_monitor = Watch;
}

Status JpegErrors::Meaning(j_common_ptr common) {
  if (stopped) return Status::FunctionCancelled;
  char text[JMSG_LENGTH_MAX];
  base.format_message(common, text);
  const std::string_view message(text);
  if (message.starts_with("Unsupported") || message.starts_with("Sorry"))
    return Status::UnsupportedFormat;
  if (message.starts_with("Insufficient memory")) return Status::MemoryAllocationError;
  return endMissing ? Status::FileReadError : Status::DamagedFile;
}

Status ReadJpegHeader(JpegReader& reader, std::span<const uint8_t> file,
                      std::span<const uint8_t> tables) {
  if (file.size() < 4) return Status::FileReadError;
  if (file[0] != 0xFF || file[1] != 0xD8) return Status::DamagedFile;
  reader.segments.clear();
  RETURN_IF_BAD(WalkHead(reader, file));
  const bool read = Guarded(reader.errors, [&] {
    jpeg_create_decompress(&reader.info);
    reader.info.client_data = &reader;
    reader.info.progress = &reader.monitor;
    if (!tables.empty()) {
      jpeg_mem_src(&reader.info, tables.data(), tables.size());
      jpeg_read_header(&reader.info, FALSE);
    }
    jpeg_mem_src(&reader.info, file.data(), file.size());
    jpeg_read_header(&reader.info, TRUE);
  });
  return read ? Status::Ok : reader.Failure();
}

uint64_t JpegCoefficientBytes(const JpegReader& reader, bool all) {
  const jpeg_decompress_struct& info = reader.info;
  const bool held = all || info.progressive_mode != 0 || info.comps_in_scan < info.num_components;
  uint64_t blocks = 0;
  for (int i = 0; held && i < info.num_components; ++i) {
    const jpeg_component_info& component = info.comp_info[i];
    blocks += (uint64_t{component.width_in_blocks} + MAX_SAMP_FACTOR) *
              (component.height_in_blocks + MAX_SAMP_FACTOR);
  }
  return blocks * sizeof(JBLOCK);
}

}  // namespace fotomill
