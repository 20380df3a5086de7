#include "support/codec_target.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdlib>
#include <string>

#include "core/limits.h"
#include "core/settings.h"
#include "formats/bmp.h"

namespace fotomill::fuzz {

namespace {

// A file in memory that every run fills anew.
class MemoryFile {
 public:
  MemoryFile() : handle_(memfd_create("input", 0)), path_("/proc/self/fd/" + std::to_string(handle_)) {}
  const std::string& Fill(const uint8_t* data, size_t size) {
    if (ftruncate(handle_, 0) != 0 || pwrite(handle_, data, size, 0) != static_cast<ssize_t>(size)) std::abort();
    return path_;
  }

 private:
  int handle_;
  std::string path_;
};

// The fuzzer leaves without calling exit handlers: who starts it makes the folder and takes it away again.
std::string OutputFolder() {
  const char* folder = std::getenv("TMPDIR");
  return folder == nullptr ? "/tmp" : folder;
}

uint32_t Hash(const uint8_t* data, size_t size) {
  uint32_t hash = 2166136261u;
  for (size_t i = 0; i < size; ++i) hash = (hash ^ data[i]) * 16777619u;
  return hash;
}

void Write(const WriteOperation write, PictureRecord& picture) {
  static const std::string path = OutputFolder() + "/out-" + std::to_string(getpid());
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
  const Status read = row.read(*picture, path.c_str());
  if (read != Status::Ok) {
    if (!picture->image.Empty() || !picture->alpha.Empty()) std::abort();
    return;
  }
  if (info == Status::Ok &&
      (picture->image.Width() != described->width || picture->image.Height() != described->height)) {
    std::abort();
  }
  if (CanWrite(row)) Write(row.write, *picture);
  Write(BmpWrite, *picture);
}

}  // namespace fotomill::fuzz
