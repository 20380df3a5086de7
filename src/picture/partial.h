#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// For readers, of a picture whose rows ended with `status` after `rows` whole ones: what to return.
// Ok where the data ended early or are broken and a part of the picture will do; the record's
// `shortfall` says why it is one.
inline Status TakePart(PictureRecord& picture, bool partial, Status status, int64_t rows) {
  const bool ended = status == Status::FileReadError || status == Status::DamagedFile;
  if (!ended || !partial || rows < 1) return status;
  picture.shortfall = status;
  return Status::Ok;
}

}  // namespace fotomill
