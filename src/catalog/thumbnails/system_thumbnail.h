#pragma once

#include <string>
#include <string_view>

#include "catalog/thumbnails/thumbnail_record.h"
#include "picture/picture_record.h"

namespace fotomill {

// The system's own thumbnails, made by file managers and only read here: on free desktops PNG files
// in the folder "thumbnails/large" of the user's cache, at most 256 pixels wide and high, named
// after the MD5 of the picture's URI. A text in each names the URI ("Thumb::URI"), another the
// picture's modification time ("Thumb::MTime"); it is out of date when that is not the picture's.
// Source: freedesktop.org, "Thumbnail Managing Standard".

// The address of an absolute path, every byte escaped that RFC 2396 does not allow in one.
std::string FileUri(std::string_view path);

// The system's thumbnail of a picture as a record of its own, from the first of these folders and
// of "x-large" and "xx-large" (512 and 1024 pixels) that is made for `side` pixels at least. Null
// without a valid one.
PicturePointer ReadSystemPicture(const std::string& picturePath, int32_t side);

// Fills a large record with the system's thumbnail of a picture. False without a valid one;
// `record` is then as before.
bool ReadSystemThumbnail(const std::string& picturePath, Color matte, LargeThumbnailRecord& record);

}  // namespace fotomill
