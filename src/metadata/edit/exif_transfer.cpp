#include "metadata/edit/exif_transfer.h"

#include <algorithm>

#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "metadata/exif/exif_tags.h"
#include "texts/texts.h"

namespace fotomill {

ExifChanges TakenEntries(const ExifDirectories& from,
                         const std::function<bool(const ExifEntry&, ExifPlace)>& isWanted) {
  ExifChanges changes;
  const auto take = [&](const ExifDirectory& directory, ExifPlace place) {
    for (const ExifEntry& entry : directory) {
      if (!isWanted(entry, place)) continue;
      DirectoryChange change{place, entry.tag, entry};
      if (from.bigEndian) SwapExifNumbers(entry.type, change.entry->value);
      changes.push_back(std::move(change));
    }
  };
  take(from.first, ExifPlace::First);
  take(from.exif, ExifPlace::Exif);
  take(from.gps, ExifPlace::Gps);
  return changes;
}

ExifChanges ShiftedTimes(const ExifDirectories& old, int64_t seconds, std::string& reason) {
  constexpr uint16_t kTimes[] = {0x0132, 0x9003, 0x9004};
  ExifChanges changes;
  for (const uint16_t tag : kTimes) {
    const ExifPlace place = PlaceOfExifTag(tag);
    const ExifEntry* entry = FindExifEntry(place == ExifPlace::First ? old.first : old.exif, tag);
    const auto time = entry == nullptr ? std::nullopt : ParseExifTime(ExifEntryText(*entry));
    if (!time) continue;
    const std::string text = ExifTimeText(*time + seconds);
    if (!ParseExifTime(text)) {
      reason = Tr("\"%1\" would leave the calendar.", ExifTagName(tag));
      return {};
    }
    changes.push_back({place, tag, ExifTextEntry(tag, text)});
  }
  if (changes.empty()) reason = Tr("It has no date or time.");
  return changes;
}

ExifChanges CopiedEntries(const ExifDirectories& from) {
  // orientation, resolution; maker notes, sound file; color space, size
  constexpr uint16_t kOwn[] = {0x0112, 0x011a, 0x011b, 0x0128, 0x927c,
                               0xa001, 0xa002, 0xa003, 0xa004, 0xa420};
  return TakenEntries(from, [&](const ExifEntry& entry, ExifPlace place) {
    const bool own = std::ranges::find(kOwn, entry.tag) != std::end(kOwn);
    const uint8_t editClass = ExifEditClass(entry.tag);
    return !own && editClass != kExifOpaque &&
           (editClass != kExifStructural || place == ExifPlace::Gps);
  });
}

}  // namespace fotomill
