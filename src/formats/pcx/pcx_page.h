#pragma once

#include <cstdint>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/picture_record.h"
#include "platform/file_view.h"

namespace fotomill {

// Where a PCX picture is in a file: all of it, or a page among others. Within the file, `begin`
// not behind `end`.
struct PcxPlace {
  uint64_t begin = 0, end = 0;
  uint64_t Size() const { return end - begin; }  // bytes
};

// The work of the operations of pcx.h on a part of a file, with their statuses. DescribePcx needs
// no more of the file to be visible than its first byte. ReadPcx leaves `image` alone unless it
// succeeds.
Status DescribePcx(const platform::FileView& file, const PcxPlace& place, PictureRecord& picture);
Status ReadPcx(platform::FileView& file, const PcxPlace& place, const ReadRequest& request,
               PictureRecord& picture);
// Writes the picture at the writer's position; the commit is the caller's.
Status WritePcx(ByteWriter& out, const PictureRecord& picture);

}  // namespace fotomill
