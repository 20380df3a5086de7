#pragma once

#include <string>

#include "core/status.h"
#include "platform/output_file.h"

namespace fotomill {

// Stores the compressed picture of a file in another format without decoding it, if a module can:
// JPEG files in JPEG XL and back. The extensions name the formats. A JPEG file is only stored if it
// comes back byte for byte.
// UnsupportedFunction (5) if no module does this, UnsupportedFormat (8) for files that it cannot do
// it with, ErrorCreatingFile (10), also if the destination exists and may not be replaced,
// ErrorWritingFile (11), else the module's own.
Status TranscodePicture(const std::string& source, const std::string& destination,
                        platform::Existing existing);

}  // namespace fotomill
