#pragma once

#include <memory>
#include <string>

#include "core/status.h"
#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// The picture that a parameter names: a name without a folder is looked for in the current folder,
// then in the data folder. Upright as its EXIF says, of 24 bits, with its alpha plane if it has
// one. The last one is kept, so that a batch decodes its logo once. From any thread. Statuses as
// LoadPicture.
Status LoadPictureFile(const std::string& name, std::shared_ptr<const PictureRecord>& picture);

// What is wrong with such a name, as the end of a sentence; empty when the file is a picture.
RecordedText PictureFileProblem(const std::string& name);

}  // namespace fotomill
