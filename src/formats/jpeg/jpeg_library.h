#pragma once

#include <csetjmp>
#include <cstddef>
#include <cstdint>
#include <cstdio>  // required by the library's header

#include <jpeglib.h>

#include <span>
#include <vector>

#include "containers/jpeg_segments.h"
#include "core/status.h"
#include "core/workers/stop_token.h"

namespace fotomill {

// Error handling for the library: errors longjmp out of it, warnings are recorded.
struct JpegErrors {
  jpeg_error_mgr base;  // must be first, so that the library's pointer can be cast
  std::jmp_buf jump;
  bool cutShort = false;  // the data ended within a scan
  int64_t wholeRows = 0;  // rows decoded before that; all, for several scans
  bool endMissing = false;
  char warning[JMSG_LENGTH_MAX] = {};  // first one about damage, except for a missing end marker
  char note[JMSG_LENGTH_MAX] = {};     // first one about irregularities that affect no pixels
  int code = 0;
  bool stopped = false;  // canceled by the caller

  void Set();  // installs these handlers
  // The status for a failed library call; `common` is the object it was called for.
  Status Meaning(j_common_ptr common);
};

// Runs library calls; false if one of them failed. `action` must not contain
// objects with destructors.
template <typename Action>
bool Guarded(JpegErrors& errors, Action action) {
  if (setjmp(errors.jump) != 0) return false;
  action();
  return true;
}

// A libjpeg decompressor with its error handler.
struct JpegReader {
  JpegReader();  // creates the decompressor; library errors may occur only within Guarded
  ~JpegReader() { jpeg_destroy_decompress(&info); }
  JpegReader(const JpegReader&) = delete;
  JpegReader& operator=(const JpegReader&) = delete;

  // To be called after Guarded returned false.
  Status Failure() { return errors.Meaning(static_cast<j_common_ptr>(static_cast<void*>(&info))); }

  JpegErrors errors;
  jpeg_decompress_struct info = {};
  // stops files with too many scans, and canceled decodes
  jpeg_progress_mgr monitor = {};
  StopToken stop = {};
  std::vector<JpegSegment> segments;  // the collected ones, in file order
};

// Reads a file up to its first scan, collecting EXIF, XMP, profile and comment segments. `file`
// must outlive the reader. `tables` is an abbreviated stream with default tables, or empty. Huffman
// tables missing in both are those of T.81, K.3.
Status ReadJpegHeader(JpegReader& reader, std::span<const uint8_t> file,
                      std::span<const uint8_t> tables = {});

// Size of the arrays in which the library stores all coefficients of a picture: always for `all`,
// else only if there are several scans, regardless of the decoding scale. Available once the header
// is read.
uint64_t JpegCoefficientBytes(const JpegReader& reader, bool all);

}  // namespace fotomill
