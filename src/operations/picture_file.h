#pragma once

#include <memory>
#include <string>

#include "core/status.h"
#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// Loads the picture named by a parameter: a name without folder is searched
// in the current folder, then in the data folder. Result: upright by EXIF,
// 24 bits, with alpha plane if present. The last picture is cached, so a
// batch decodes its logo once. Thread-safe. Statuses of LoadPicture.
Status LoadPictureFile(const std::string& name, std::shared_ptr<const PictureRecord>& picture);

// What is wrong with such a file, as the end of a sentence; empty if it is a picture.
RecordedText PictureFileProblem(const std::string& name);

}  // namespace fotomill
