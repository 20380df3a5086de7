#pragma once

#include <string>
#include <string_view>

#include "catalog/thumbnails/thumbnail_record.h"
#include "picture/picture_record.h"

namespace fotomill {

// The system's thumbnails, created by file managers and read-only here: on free desktops, PNG files
// in the folder "thumbnails" of the user's cache, in subfolders by size, named after the MD5 of the
// picture's URI. Text chunks contain the URI ("Thumb::URI") and the picture's modification time
// ("Thumb::MTime"); a thumbnail with a different time is outdated. Source: freedesktop.org,
// "Thumbnail Managing Standard".

// The URI of an absolute path, escaped according to RFC 2396.
std::string FileUri(std::string_view path);

// Loads the system's thumbnail of a picture, from the first of the folders "normal", "large",
// "x-large" and "xx-large" (128, 256, 512 and 1024 pixels) suitable for `side` pixels. Null if
// there is no valid one.
PicturePointer ReadSystemPicture(const std::string& picturePath, int32_t side);

// Loads the system's thumbnail into a large record. False, with `record` unchanged, if there is no
// valid one.
bool ReadSystemThumbnail(const std::string& picturePath, Color matte, LargeThumbnailRecord& record);

}  // namespace fotomill
