#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/thumbnails/thumbnail_record.h"

namespace fotomill {

// Thumbnail files: a small record in a file beside the picture, with its base name and the
// extension ".THN". Pictures that differ only in their extension share one.

// Extension of thumbnail files. Written in uppercase, read in any case.
inline constexpr std::string_view kThumbnailExtension = ".THN";

// Path of the thumbnail file of a picture.
std::string ThumbnailPathFor(std::string_view picturePath);

// Reads a record from a thumbnail file; old records are expanded and keep their version. A file
// shorter than a record is treated as an old one. False, with `record` unchanged, if the file
// cannot be read or is not a thumbnail file.
bool ReadThumbnailFile(ThumbnailRecord& record, const std::string& path);
// Reads the thumbnail file of a picture without conversion. False, with `record` zeroed, unless it
// contains a complete record.
bool ReadThumbnailForPicture(const std::string& picturePath, ThumbnailRecord& record);

// Signs a record and writes it, atomically replacing an existing
// file or link, even if hidden or protected; hides the file with
// `hidden`. False, with the old file unchanged, if writing fails.
bool WriteThumbnailFile(ThumbnailRecord& record, const std::string& path, bool hidden);
// Creates a record with MakeBlendedThumbnailRecord and writes the thumbnail file of a picture,
// keeping its attributes.
bool WriteThumbnailForPicture(const std::string& picturePath, const PictureRecord& picture,
                              Color background);

// Reads a picture, at reduced size if possible, and makes its record. Statuses of reading,
// EmptyImage if the format has no pixels, or MemoryAllocationError; `record` is unchanged then. If
// `shortfall` is given, incomplete pictures are accepted, and it is set to the reason, or Ok.
Status MakeThumbnailOfFile(const std::string& picturePath, const ThumbnailOptions& options,
                           ThumbnailRecord& record, Status* shortfall = nullptr);

// Thumbnail files in a folder without a picture in `names`,
// ignoring case: regular files, no links, no names starting with
// "."; in byte order. nullopt if the folder cannot be read.
std::optional<std::vector<std::string>> OrphanThumbnails(const std::string& folder,
                                                         const std::vector<std::string>& names);

}  // namespace fotomill
