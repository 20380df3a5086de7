#pragma once

#include <cstdint>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "pages/model/page.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"

namespace fotomill {

// How pictures are read for pages.
struct PagePictureOptions {
  bool upright = true;     // rotate by EXIF orientation
  int32_t brightness = 0;  // -100 to 100
  int32_t contrast = 0;    // -100 to 100
  ReadOptions read = {};
  StopToken stop = {};

  bool ChangesColors() const { return brightness != 0 || contrast != 0; }
};

// The facts of a picture file: size, upright if the options say so, resolution. `record` has its
// header. Statuses of LoadPictureInfo.
Status ReadPageFacts(const std::string& file, const PagePictureOptions& options,
                     PagePicture& picture, PicturePointer& record);

// Decodes the picture of a record for a size of up to `width` x `height` pixels when upright, turns
// it upright and adjusts its colors. It is reduced to that size if it is larger. Statuses of
// ReadPicture and ScalePicture.
Status ReadPagePicture(const PagePictureOptions& options, int32_t width, int32_t height,
                       PictureRecord& record);

}  // namespace fotomill
