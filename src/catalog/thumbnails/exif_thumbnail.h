#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "picture/encode_options.h"
#include "picture/picture_record.h"

namespace fotomill {

// Decodes an embedded thumbnail, a JPEG stream, using a temporary file
// with the extension ".JPG". `picture` is null unless Ok; EmptyImage
// (31) if there are no bytes, ErrorCreatingFile (10) or ErrorWritingFile
// (11) for the temporary file, else the status of the JPEG codec.
Status DecodeExifThumbnail(std::span<const uint8_t> bytes, PicturePointer& picture);
// Encodes a thumbnail; `bytes` is empty unless Ok.
Status EncodeExifThumbnail(PictureRecord& picture, const EncodeOptions& options,
                           std::vector<uint8_t>& bytes);

}  // namespace fotomill
