#include "formats/jpeg/jpeg_library.h"

#include <cstring>
#include <string_view>

namespace fotomill {

namespace {

constexpr int kMostScans = 500;  // of a progressive file; more are an attack on time

JpegErrors& ErrorsOf(j_common_ptr common) { return *static_cast<JpegErrors*>(static_cast<void*>(common->err)); }

[[noreturn]] void OnError(j_common_ptr common) {
  ErrorsOf(common).code = common->err->msg_code;
  std::longjmp(ErrorsOf(common).jump, 1);
}

// Message codes are not part of the library's public header; their texts are stable.
void OnMessage(j_common_ptr common, int level) {
  if (level >= 0) return;  // trace
  ++common->err->num_warnings;
  JpegErrors& errors = ErrorsOf(common);
  char text[JMSG_LENGTH_MAX];
  common->err->format_message(common, text);
  const std::string_view message(text);
  if (message.starts_with("Premature end of JPEG file")) {
    errors.endMissing = true;
  } else if (message.find("premature end of data segment") != std::string_view::npos) {
    errors.cutShort = true;
  }
  if (errors.warning[0] == 0 && !errors.endMissing) std::memcpy(errors.warning, text, sizeof text);
}

void OutputNothing(j_common_ptr) {}

// Called by the library now and then while it reads scans.
void LimitScans(j_common_ptr common) {
  const auto* info = static_cast<const jpeg_decompress_struct*>(static_cast<void*>(common));
  if (info->input_scan_number > kMostScans) common->err->error_exit(common);
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
  monitor.progress_monitor = LimitScans;
}

Status JpegErrors::Meaning(j_common_ptr common) {
  char text[JMSG_LENGTH_MAX];
  base.format_message(common, text);
  const std::string_view message(text);
  if (message.starts_with("Unsupported") || message.starts_with("Sorry")) return Status::UnsupportedFormat;
  if (message.starts_with("Insufficient memory")) return Status::MemoryAllocationError;
  return endMissing ? Status::FileReadError : Status::DamagedFile;
}

Status ReadJpegHeader(JpegReader& reader, std::span<const uint8_t> file, void (*prepare)(j_decompress_ptr info)) {
  if (file.size() < 4) return Status::FileReadError;
  if (file[0] != 0xFF || file[1] != 0xD8) return Status::DamagedFile;
  const bool read = Guarded(reader.errors, [&] {
    jpeg_create_decompress(&reader.info);
    reader.info.progress = &reader.monitor;
    jpeg_mem_src(&reader.info, file.data(), file.size());
    if (prepare != nullptr) prepare(&reader.info);
    jpeg_read_header(&reader.info, TRUE);
  });
  return read ? Status::Ok : reader.Failure();
}

}  // namespace fotomill
