#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "catalog/thumbnails/thumbnail_options.h"
#include "core/status.h"
#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// Identifies a thumbnail. Includes the file's time and size, so that a changed file is a different
// one.
struct ThumbnailRequest {
  std::string path;
  int64_t modified = 0;  // both 0: not known yet, LoadThumbnail finds out
  uint64_t size = 0;
  int32_t side = 96;     // of the square in which it must fit, in pixels
  int32_t mode = 0;      // choice::ThumbnailMode: where records are stored
  bool standIn = false;  // return whatever is available immediately, until the proper one is loaded
  ThumbnailOptions options = {};
  bool folder = false;  // the path is a folder; its first picture's
  // bit set of platform::DriveKind: files on such drives get none, as reading may be slow
  int32_t drivesLeftOut = 0;

  bool operator==(const ThumbnailRequest&) const = default;
};

// A thumbnail for display. Immutable, so that threads can share it.
struct Thumbnail {
  Status status = Status::Ok;                          // why there are no pixels
  RgbImage pixels;                                     // fit in the square; never enlarged
  int32_t width = 0, height = 0, bits = 0, pages = 1;  // of the picture, 0 if not opened
  bool alpha = false;
  bool partial = false;   // the file is truncated; part of the picture is missing
  bool animated = false;  // the pages are animation frames
  // the embedded thumbnail, which has not been compared with the picture
  bool standIn = false;

  uint64_t Bytes() const { return sizeof *this + pixels.bytes.size(); }  // size in a cache
};
// Shared between cache and windows; immutable.
using ThumbnailPointer = std::shared_ptr<const Thumbnail>;

// Loads a thumbnail: from LookUpThumbnail, drawn in view size. In the disk-based mode, a picture
// without a thumbnail file has one in the database of the data folder, or among the system's
// thumbnails. Else the picture is decoded, and the result stored for the next time, as far as the
// options allow. The picture's facts are the same in each case. May take long; called by workers. A
// stand-in request decodes no picture: it returns the proper thumbnail if available, else the
// embedded one, else null.
ThumbnailPointer LoadThumbnail(const ThumbnailRequest& request);

// Whether files of a format (a row of the registry) can have an embedded thumbnail.
bool MayHoldThumbnail(int32_t format);

// Writes records collected for databases;
// LoadThumbnail also does so from time to time.
void KeepThumbnailRecords();

// Creates a picture's thumbnail record and writes its thumbnail file.
Status WriteThumbnail(const std::string& path, const ThumbnailOptions& options);

}  // namespace fotomill::desktop
