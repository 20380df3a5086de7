#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "catalog/thumbnails/thumbnail_options.h"
#include "core/status.h"
#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// What a thumbnail is wanted for. The file's time and size are part of it: a changed file is
// another one.
struct ThumbnailRequest {
  std::string path;
  int64_t modified = 0;
  uint64_t size = 0;
  int32_t side = 96;     // pixels of the square that it must fit
  int32_t mode = 0;      // choice::ThumbnailMode: where records may be
  bool standIn = false;  // whatever can be had at once will do, until the proper one comes
  ThumbnailOptions options = {};

  bool operator==(const ThumbnailRequest&) const = default;
};

// What a list shows of a picture. It does not change once it is made, so that threads may share it.
struct Thumbnail {
  Status status = Status::Ok;                          // why there are no pixels
  RgbImage pixels;                                     // never larger than the square, nor enlarged
  int32_t width = 0, height = 0, bits = 0, pages = 1;  // of the picture, 0 when it was not opened
  bool alpha = false;
  bool partial = false;   // the file ends early: the rest of the picture is missing
  bool animated = false;  // the pages are frames that follow each other
  // the thumbnail that the file itself holds, which no one has compared with the picture
  bool standIn = false;

  uint64_t Bytes() const { return sizeof *this + pixels.bytes.size(); }  // what it takes in a cache
};
// Shared by cache and windows; never changes.
using ThumbnailPointer = std::shared_ptr<const Thumbnail>;

// Gets a picture's thumbnail: what LookUpThumbnail finds, drawn at the size of the view, on dense
// screens the system's own where large ones may come from there, else from the picture itself. What
// is known of the picture is the same either way. Takes as long as it takes; called by workers. A
// request for a stand-in decodes no picture: it gets the proper thumbnail when there is one ready,
// else the one that the file holds, and null when it holds none.
ThumbnailPointer LoadThumbnail(const ThumbnailRequest& request);

// Whether files of a row of the registry can hold a thumbnail of their own.
bool MayHoldThumbnail(int32_t format);

// Writes the records that were made for databases since the last call; LoadThumbnail does it as
// well, now and then.
void KeepThumbnailRecords();

// Makes a picture's thumbnail record and writes its thumbnail file.
Status WriteThumbnail(const std::string& path, const ThumbnailOptions& options);

}  // namespace fotomill::desktop
