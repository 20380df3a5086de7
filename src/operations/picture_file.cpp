#include "operations/picture_file.h"

#include <mutex>

#include "core/data_folder.h"
#include "metadata/exif/picture_exif.h"
#include "platform/files.h"
#include "processing/promote.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

std::string PathOf(const std::string& name) {
  const bool plain = name.find('/') == std::string::npos && name.find('\\') == std::string::npos;
  return plain && !platform::FileExists(name) ? DataFile(name) : name;
}

// The last picture loaded, and the state of its file then.
struct Kept {
  std::string path;
  int64_t modified = 0;
  uint64_t size = 0;
  std::shared_ptr<const PictureRecord> picture;
};

}  // namespace

Status LoadPictureFile(const std::string& name, std::shared_ptr<const PictureRecord>& picture) {
  static std::mutex mutex;
  static Kept kept;
  const std::string path = PathOf(name);
  const platform::FileFacts facts = platform::FactsOf(path);
  const std::scoped_lock lock(mutex);
  if (kept.picture == nullptr || kept.path != path || kept.modified != facts.modified ||
      kept.size != facts.size) {
    PicturePointer loaded;
    RETURN_IF_BAD(LoadPicture({.fileName = path}, loaded));
    RETURN_IF_BAD(TurnUpright(*loaded));
    RETURN_IF_BAD(PromotePicture(*loaded));
    kept = {path, facts.modified, facts.size, std::move(loaded)};
  }
  picture = kept.picture;
  return Status::Ok;
}

RecordedText PictureFileProblem(const std::string& name) {
  PicturePointer picture;
  const Status status = LoadPictureInfo({.fileName = PathOf(name)}, picture);
  if (status == Status::Ok) return {};
  return TrRecorded("names a picture that cannot be read: %1", name);
}

}  // namespace fotomill
