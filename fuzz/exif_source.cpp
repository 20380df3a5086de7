// Finding the EXIF block in a picture file. The search reads files, so each input is
// written to one.

#include <cstdlib>

#include "metadata/exif/exif_source.h"
#include "platform/files.h"
#include "platform/temporary_file.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  platform::TemporaryFile file;
  if (!file.Create() || !file.Write({data, size})) return 0;
  ExifSource source;
  if (source.Open(file.Path().c_str()) != Status::Ok) return 0;
  if (source.Block().size() > size) std::abort();
  volatile unsigned sum = 0;
  for (const uint8_t byte : source.Block()) sum = sum + byte;
  return 0;
}
