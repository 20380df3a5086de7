#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// For readers: the status to return for a picture whose decoding ended with `status` after `rows`
// complete rows. Ok if the data are truncated or damaged and a partial picture is acceptable; the
// record's `shortfall` then holds the reason.
inline Status TakePart(PictureRecord& picture, bool partial, Status status, int64_t rows) {
  const bool ended = status == Status::FileReadError || status == Status::DamagedFile;
  if (!ended || !partial || rows < 1) return status;
  picture.shortfall = status;
  return Status::Ok;
}

}  // namespace fotomill
