#include "metadata/exif/foreign_metadata.h"

#include <atomic>

namespace fotomill {

namespace {

std::atomic<ForeignReader> installed = nullptr;

}  // namespace

void InstallForeignReader(ForeignReader reader) { installed = reader; }

bool ReadForeignMetadata(const std::string& path, ForeignMetadata& metadata) {
  const ForeignReader reader = installed;
  metadata = {};
  return reader != nullptr && reader(path, metadata) &&
         (!metadata.exif.empty() || !metadata.xmp.empty());
}

}  // namespace fotomill
