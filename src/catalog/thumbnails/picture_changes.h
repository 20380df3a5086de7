#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// A change of a file or folder that may have thumbnails. Absolute paths.
struct PictureChange {
  std::string path;     // removed from here, or its contents were replaced
  std::string to = {};  // new path, if renamed or moved
};

// Marks the database records of changed files as deleted, in the global database and those of their
// folders, so that compaction removes them and no new file of the same name gets the old thumbnail.
// For folders, marks the records of all files that were in them. Records in read-only folders
// cannot be marked, but are still not used for a picture of different time or size. May take long;
// any thread.
void MarkChangedRecords(std::span<const PictureChange> changes);

// Handles the thumbnail file of a picture; call right after renaming or moving the picture: it is
// renamed along, or deleted if the new name already has one. Does nothing for folders, as they
// contain their thumbnail files, and for thumbnail files themselves.
void FollowThumbnailFile(const std::string& from, const std::string& to);
// Whether `path` is that of a thumbnail file that no longer exists because it was renamed or
// deleted along with the picture of one of these changes.
bool WentWithPicture(const std::string& path, std::span<const PictureChange> changes);
// Deletes the thumbnail file of a picture that was removed or will be replaced. Links, and files
// that only have the name of a thumbnail file, are kept. Does nothing for thumbnail files.
void DeleteThumbnailFile(const std::string& path);
// The same for an existing picture, if the thumbnail file looks current but is not.
void DeleteMisleadingThumbnailFile(const std::string& path);

}  // namespace fotomill
