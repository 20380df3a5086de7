#pragma once

#include <cstdint>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/picture_record.h"
#include "platform/file_view.h"

namespace fotomill {

// The position of a PCX picture in a file: all of it, or one of several pages. Must be within the
// file, with `begin` <= `end`.
struct PcxPlace {
  uint64_t begin = 0, end = 0;
  uint64_t Size() const { return end - begin; }  // bytes
};

// As the operations of pcx.h, for a part of a file, with the same
// statuses. DescribePcx only needs the first byte of the file to
// be visible. ReadPcx leaves `image` unchanged on failure.
Status DescribePcx(const platform::FileView& file, const PcxPlace& place, PictureRecord& picture);
Status ReadPcx(platform::FileView& file, const PcxPlace& place, const ReadRequest& request,
               PictureRecord& picture);
// Writes the picture at the writer's position, without a commit.
Status WritePcx(ByteWriter& out, const PictureRecord& picture);

}  // namespace fotomill
