// Changes of EXIF and tags to hostile files of every form, and removal: what comes out has what was
// put in, and a second run finds nothing to do. The first byte chooses the change.

#include <algorithm>
#include <cstdlib>
#include <vector>

#include "core/limits.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/picture_edit.h"
#include "metadata/edit/strip.h"
#include "metadata/tags/tag_edit.h"

namespace {

using namespace fotomill;

[[maybe_unused]] const bool limitsSet = [] {
  limits.exifEntries = 512;
  limits.filePages = 64;
  return true;
}();

void Expect(bool holds) {
  if (!holds) std::abort();
}

ExifChanges ChangesOf(uint8_t choice) {
  ExifChanges changes;
  const auto add = [&](ExifEntry entry) {
    changes.push_back({PlaceOfExifTag(entry.tag), entry.tag, std::move(entry)});
  };
  if (choice & 1) add(ExifTextEntry(0x013b, std::string(choice, 'a')));
  if (choice & 2) add(ExifRationalEntry(0x829a, {{1, choice}}));
  if (choice & 4) add(ExifTextEntry(0x0001, "N"));
  if (choice & 8) changes.push_back({ExifPlace::First, 0x010f, {}});
  if (choice & 16) changes.push_back({ExifPlace::Exif, 0x9003, {}});
  if (choice & 32) changes.push_back({.place = ExifPlace::Gps, .all = true});
  return changes;
}

void Edit(std::span<const uint8_t> file, uint8_t choice) {
  const ExifChanges changes = ChangesOf(choice);
  const ExifChanger changer = [&](const ExifDirectories&, std::string&) { return changes; };
  FilePieces made, again;
  bool changed = false;
  std::string reason;
  if (EditPictureExif(file, changer, made, changed, reason) != Status::Ok || !changed) return;
  const std::vector<uint8_t> bytes = made.Joined();
  Expect(bytes.size() <= file.size() + 4096 + 20 * limits.exifEntries);
  Expect(EditPictureExif(bytes, changer, again, changed, reason) == Status::Ok);
}

void Strip(std::span<const uint8_t> file, uint8_t choice) {
  FilePieces made, again;
  std::string reason;
  if (StripPicture(file, choice, made, reason) == Status::Ok) {
    const std::vector<uint8_t> bytes = made.Joined();
    (void)MetadataLeft(bytes);
    Expect(StripPicture(bytes, choice, again, reason) != Status::UnsupportedFormat);
  }
  if (StripPlaces(file, made, reason) == Status::Ok) (void)MetadataLeft(made.Joined());
}

void Tag(std::span<const uint8_t> file, uint8_t choice) {
  TagChanges changes{.addedKeywords = {"a", "b & c"}};
  if (choice & 1) changes.rating = choice >> 5;
  if (choice & 2) changes.description = "lake";
  if (changes.rating && *changes.rating > 5) changes.rating = -1;
  FilePieces made, again;
  bool changed = false;
  std::string reason;
  if (EditPictureTags(file, changes, made, changed, reason) != Status::Ok || !changed) return;
  std::vector<uint8_t> bytes = made.Joined();
  Expect(MetadataFormOf(bytes) == MetadataFormOf(file));
  // XML has no control characters, so IPTC may lose some of them in a second run
  Expect(EditPictureTags(bytes, changes, again, changed, reason) == Status::Ok);
  if (changed) bytes = again.Joined();
  Expect(EditPictureTags(bytes, changes, again, changed, reason) == Status::Ok && !changed);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  const std::vector<uint8_t> file(data + 1, data + size);
  Edit(file, data[0]);
  Strip(file, data[0]);
  Tag(file, data[0]);
  (void)MetadataLeft(file);
  return 0;
}
