#pragma once

#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "metadata/tags/tag_edit.h"

namespace fotomill {

// How to change the tags of pictures.
struct TagRequest {
  TagChanges changes = {};
  bool sidecarOnly = false;   // leave the picture alone
  bool commentFiles = false;  // write descriptions to text files as well
  TagSources sources = {};    // where these are
};

// Changes the tags of a picture file, or writes a changed copy; `options` say what to do if the
// destination exists. Pictures that cannot hold XMP or cannot be changed safely are left alone (or
// copied), and the tags go to a sidecar, as a note says; an existing sidecar always follows. Each
// file is replaced as a whole. Statuses: those of opening and writing files.
RewrittenFile TagPictureFile(const std::string& source, const std::string& destination,
                             const TagRequest& tags, const RewriteRequest& request,
                             const WriteOptions& options);

}  // namespace fotomill
