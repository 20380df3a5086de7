#include "support/codec_target.h"

#include <unistd.h>

#include <cstdlib>
#include <string>

#include "core/limits.h"
#include "formats/bmp/bmp.h"
#include "support/scratch_file.h"

namespace fotomill::fuzz {

namespace {

uint32_t Hash(const uint8_t* data, size_t size) {
  uint32_t hash = 2166136261u;
  for (size_t i = 0; i < size; ++i) hash = (hash ^ data[i]) * 16777619u;
  return hash;
}

// Some writers depend on the extension of the file.
void Write(const WriteOperation write, PictureRecord& picture, const char* extension,
           const EncodeOptions& encode) {
  static const std::string path = ScratchPath("out.") + extension;
  picture.fileName.AssignCut(path);
  (void)write(picture, {.encode = encode});
  unlink(path.c_str());
}

}  // namespace

void TryCodec(const char* extension, const uint8_t* data, size_t size) {
  static MemoryFile file;
  limits.packedBlockBytes = 4 << 20;
  limits.textScanBytes = 64 << 10;
  const uint32_t options = Hash(data, size);
  const EncodeOptions encode{.bmpOs2 = (options >> 1 & 1) != 0,
                             .iffCompressed = (options >> 3 & 1) != 0,
                             .iffPacked = (options >> 4 & 1) != 0,
                             .macBinary = (options >> 2 & 1) != 0};

  const ReadRequest request{.fileName = file.Fill(data, size),
                            .options = {.alphaChannels = (options & 1) != 0}};
  const FormatEntry& row = FormatRow(FindFormatByName(std::string("a.") + extension));
  const PicturePointer picture = NewPictureRecord(), described = NewPictureRecord();
  described->fileName.AssignCut(request.fileName);
  const Status info = row.info(*described, request);
  if (row.details != nullptr) (void)row.details(*described);
  AnimationPointer animation;
  if (row.animate != nullptr && row.animate(request, animation) == Status::Ok) {
    while (animation->Next() == Status::Ok) continue;
  }
  const Status read = row.read(*picture, request);
  if (read != Status::Ok) {
    if (!picture->image.Empty() || !picture->alpha.Empty()) std::abort();
    return;
  }
  if (info == Status::Ok && (picture->image.Width() != described->width ||
                             picture->image.Height() != described->height)) {
    std::abort();
  }
  if (CanWrite(row) && row.limits.Allow(picture->image.Width(), picture->image.Height()))
    Write(row.write, *picture, extension, encode);
  Write(BmpWrite, *picture, extension, encode);
}

}  // namespace fotomill::fuzz
