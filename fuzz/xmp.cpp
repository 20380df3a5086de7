// An XMP packet: what is written can be read, says what was asked for, and is not changed by a
// second run; blanked places keep the length. The first byte chooses the change.

#include <algorithm>
#include <cstdlib>
#include <vector>

#include "metadata/tags/tag_edit.h"
#include "metadata/xmp/xml_markup.h"
#include "metadata/xmp/xmp_edit.h"
#include "metadata/xmp/xmp_tags.h"

namespace {

using namespace fotomill;

void Expect(bool holds) {
  if (!holds) std::abort();
}

TagChanges ChangesOf(uint8_t choice) {
  TagChanges changes;
  if (choice & 1) changes.rating = choice >> 5;
  if (choice & 2) changes.label = choice & 32 ? "" : "Red";
  if (choice & 4) changes.description = choice & 64 ? "" : "a <&> \"b\"\n'";
  if (choice & 8) changes.addedKeywords = {"a", "b & c"};
  if (choice & 16) changes.removedKeywords = {"a", "x"};
  if (changes.rating && *changes.rating > 5) changes.rating = -1;
  return changes;
}

void Edit(std::span<const uint8_t> packet, const TagChanges& changes) {
  XmpTags before, after;
  const Status readable = ReadXmpTags(packet, before);
  PictureTags current;
  current.keywords = before.keywords;
  std::vector<uint8_t> made, again;
  bool changed = false;
  if (EditSidecar(packet, current, changes, made, changed) != Status::Ok || !changed) return;
  Expect(packet.empty() || readable == Status::Ok);
  Expect(ReadXmpTags(made, after) == Status::Ok);
  if (changes.label) Expect(after.label == *changes.label);
  if (changes.rating && *changes.rating != 0)
    Expect(after.rating == std::to_string(*changes.rating));
  Expect(after.title == before.title && after.copyright == before.copyright);
  current.keywords = after.keywords;
  current.rating = changes.rating.value_or(0);
  Expect(EditSidecar(made, current, changes, again, changed) == Status::Ok && !changed);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  const std::vector<uint8_t> packet(data + 1, data + size);
  Edit(packet, ChangesOf(data[0]));
  std::vector<uint8_t> blanked = packet;
  (void)BlankXmpPlaces(blanked);
  (void)BlankXmpPlaces(blanked);
  Expect(blanked.size() == packet.size());
  return 0;
}
