#pragma once

#include <csetjmp>
#include <cstddef>
#include <cstdint>
#include <cstdio>  // the library's header wants it first

#include <jpeglib.h>

#include <span>
#include <vector>

#include "containers/jpeg_segments.h"
#include "core/status.h"
#include "core/workers/stop_token.h"

namespace fotomill {

// How the JPEG codec talks to its library: an error jumps out of it, a warning is remembered.
struct JpegErrors {
  jpeg_error_mgr base;  // first, so that the library's pointer leads to the whole
  std::jmp_buf jump;
  bool cutShort = false;  // the data ended within a scan
  int64_t wholeRows = 0;  // that were out before that; of pictures in several scans all
  bool endMissing = false;
  char warning[JMSG_LENGTH_MAX] = {};  // the first one of damage, but for a missing end
  char note[JMSG_LENGTH_MAX] = {};     // the first one of what is odd and harms no pixel
  int code = 0;
  bool stopped = false;  // by the one who asked for the picture

  void Set();
  // What a failed library call means; `common` is what it was called for.
  Status Meaning(j_common_ptr common);
};

// Runs library calls; false when one of them failed. Nothing with a destructor may live inside
// `action`.
template <typename Action>
bool Guarded(JpegErrors& errors, Action action) {
  if (setjmp(errors.jump) != 0) return false;
  action();
  return true;
}

// A decompressor of the library with its error handler.
struct JpegReader {
  JpegReader();
  ~JpegReader() { jpeg_destroy_decompress(&info); }
  JpegReader(const JpegReader&) = delete;
  JpegReader& operator=(const JpegReader&) = delete;

  Status Failure() { return errors.Meaning(static_cast<j_common_ptr>(static_cast<void*>(&info))); }

  JpegErrors errors;
  jpeg_decompress_struct info = {};
  // stops files with too many scans, and decodes that are no longer needed
  jpeg_progress_mgr monitor = {};
  StopToken stop = {};
  std::vector<JpegSegment> segments;  // those kept, in the order of the file
};

// Reads a file up to its first scan, keeping the segments of EXIF, XMP, profiles and comments.
// `file` must stay until the reader is done. `tables` is an abbreviated stream, or empty: tables
// that count where the file has none. Huffman tables that both lack are those of T.81, K.3.
Status ReadJpegHeader(JpegReader& reader, std::span<const uint8_t> file,
                      std::span<const uint8_t> tables = {});

// Bytes of the arrays in which the library holds all coefficients of a picture: always for `all`,
// else only where its scans come one after the other, whatever the size that it is decoded at.
// Known once the header is read.
uint64_t JpegCoefficientBytes(const JpegReader& reader, bool all);

}  // namespace fotomill
