#pragma once

#include <cstdint>
#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "metadata/edit/picture_edit.h"

namespace fotomill {

// Changes the EXIF of a picture file, or writes a changed copy; `options` say what to do if the
// destination exists. Nothing is written unless Ok. Statuses: those of EditPictureExif, and those
// of opening and writing files.
RewrittenFile EditExifFile(const std::string& source, const std::string& destination,
                           const ExifChanger& changer, const RewriteRequest& request,
                           const WriteOptions& options);

// Which metadata to remove.
struct StripRequest {
  uint32_t kept = 0;        // what to keep: kKeep flags
  bool placesOnly = false;  // remove only the position
};
// Removes metadata. The new file is read back; the note names what is left in it.
RewrittenFile StripFile(const std::string& source, const std::string& destination,
                        const StripRequest& strip, const RewriteRequest& request,
                        const WriteOptions& options);

}  // namespace fotomill
