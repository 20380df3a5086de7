#include "formats/pcx.h"

namespace fotomill {

Status PcxInfo(PictureRecord&, const char*, uint32_t) { return Status::UnsupportedFunction; }
Status PcxRead(PictureRecord&, const char*) { return Status::UnsupportedFunction; }
Status PcxWrite(PictureRecord&, const WriteOptions&) { return Status::UnsupportedFunction; }

}  // namespace fotomill
