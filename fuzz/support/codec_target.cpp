#include "support/codec_target.h"

#include <unistd.h>

#include <cstdlib>
#include <string>

#include "core/limits.h"
#include "formats/bmp/bmp.h"
#include "settings/settings.h"
#include "support/scratch_file.h"

namespace fotomill::fuzz {

namespace {

uint32_t Hash(const uint8_t* data, size_t size) {
  uint32_t hash = 2166136261u;
  for (size_t i = 0; i < size; ++i) hash = (hash ^ data[i]) * 16777619u;
  return hash;
}

void Write(const WriteOperation write, PictureRecord& picture) {
  static const std::string path = ScratchPath("out");
  picture.fileName.AssignCut(path);
  (void)write(picture, {});
  unlink(path.c_str());
}

}  // namespace

void TryCodec(const char* extension, const uint8_t* data, size_t size) {
  static MemoryFile file;
  limits.packedBlockBytes = 4 << 20;
  limits.textScanBytes = 64 << 10;
  const uint32_t options = Hash(data, size);
  settings.UseAlphaChannels = options & 1;
  settings.WriteOS2Bitmaps = options >> 1 & 1;
  settings.CreateMacbinaryHeader = options >> 2 & 1;

  const std::string& path = file.Fill(data, size);
  const FormatEntry& row = FormatRow(FindFormatByName(std::string("a.") + extension));
  const PicturePointer picture = NewPictureRecord(), described = NewPictureRecord();
  described->fileName.AssignCut(path);
  const Status info = row.info(*described, path.c_str(), 0);
  if (row.details != nullptr) (void)row.details(*described);
  AnimationPointer animation;
  if (row.animate != nullptr && row.animate(path.c_str(), animation) == Status::Ok) {
    while (animation->Next() == Status::Ok) continue;
  }
  const Status read = row.read(*picture, path.c_str());
  if (read != Status::Ok) {
    if (!picture->image.Empty() || !picture->alpha.Empty()) std::abort();
    return;
  }
  if (info == Status::Ok && (picture->image.Width() != described->width || picture->image.Height() != described->height)) {
    std::abort();
  }
  if (CanWrite(row)) Write(row.write, *picture);
  Write(BmpWrite, *picture);
}

}  // namespace fotomill::fuzz
