#include "formats/bmp.h"

namespace fotomill {

Status BmpInfo(PictureRecord&, const char*, uint32_t) { return Status::UnsupportedFunction; }
Status BmpRead(PictureRecord&, const char*) { return Status::UnsupportedFunction; }
Status BmpWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFunction; }
Status BmpDetails(PictureRecord&) { return Status::UnsupportedFunction; }

}  // namespace fotomill
