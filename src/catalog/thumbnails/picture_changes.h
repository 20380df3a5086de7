#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// What became of a file or folder that may have thumbnails. Paths are absolute.
struct PictureChange {
  std::string path;     // it is gone from here, or has other contents now
  std::string to = {};  // its new path, if it was renamed or moved
};

// Marks the database records of changed files deleted, in the global database and in those of their
// folders, so that compaction drops them and no new file under an old name gets the old thumbnail;
// with folders, of all files that were in them. Records that cannot be marked, in a folder that may
// not be written to, are still not used for a picture of another time or size. May take long; any
// thread.
void MarkChangedRecords(std::span<const PictureChange> changes);

// What becomes of the thumbnail file of one picture, called at once as it is renamed or moved: it
// follows the picture, or is deleted where the new name has one already. Nothing for folders, whose
// thumbnail files are in them.
void FollowThumbnailFile(const std::string& from, const std::string& to);
// Deletes the thumbnail file of a picture that is gone or about to be replaced. What merely has its
// name, and links, stay.
void DeleteThumbnailFile(const std::string& path);
// The same for a picture that is there, only if the thumbnail file would pass for a current one.
void DeleteMisleadingThumbnailFile(const std::string& path);

}  // namespace fotomill
