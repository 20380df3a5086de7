#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/thumbnails/thumbnail_record.h"

namespace fotomill {

// Thumbnail files: one small record in a file beside the picture, of the picture's base name and
// the extension ".THN". Pictures that differ in their extension only share one.

// The extension of thumbnail files. It is written in capitals and read in any case.
inline constexpr std::string_view kThumbnailExtension = ".THN";

// The thumbnail file of a picture; a new text, which stays.
std::string ThumbnailPathFor(std::string_view picturePath);

// Fills a record from a thumbnail file; old records are expanded, and keep their version. A file
// that is shorter than a record counts as an old one. False when it cannot be read or is no
// thumbnail file; `record` is then as before.
bool ReadThumbnailFile(ThumbnailRecord& record, const std::string& path);
// Fills a record from the thumbnail file of a picture, as it is there. False unless it holds a
// whole record; `record` is then zero.
bool ReadThumbnailForPicture(const std::string& picturePath, ThumbnailRecord& record);

// Signs a record and writes it, in one step, in place of what file or link has the name, even a
// hidden or protected one; hides the file with `hidden`. False when it cannot be written; what was
// there stays.
bool WriteThumbnailFile(ThumbnailRecord& record, const std::string& path, bool hidden);
// Makes a record by MakeBlendedThumbnailRecord and writes the thumbnail file of a picture;
// attributes stay as they are.
bool WriteThumbnailForPicture(const std::string& picturePath, const PictureRecord& picture,
                              Color background);

// Reads a picture, as small as it serves, and makes its record. Statuses of reading, EmptyImage
// when the format has no pixels, or MemoryAllocationError; `record` is then as before. With
// `shortfall` a picture that ends early will do as well; it gets the reason, or Ok.
Status MakeThumbnailOfFile(const std::string& picturePath, const ThumbnailOptions& options,
                           ThumbnailRecord& record, Status* shortfall = nullptr);

// The thumbnail files of a folder to which none of the names in it belongs, the case of letters
// ignored: regular files, not links, names that begin with "." left out; in byte order. nullopt
// when the folder cannot be read.
std::optional<std::vector<std::string>> OrphanThumbnails(const std::string& folder,
                                                         const std::vector<std::string>& names);

}  // namespace fotomill
