#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "metadata/edit/gps_place.h"
#include "metadata/edit/picture_edit.h"
#include "platform/held_file.h"

namespace fotomill::desktop {

// What the editor shows of one file.
struct ExifFileTexts {
  std::string path;
  std::string problem;                    // why it cannot be changed, a sentence; empty: it can
  std::map<uint16_t, std::string> texts;  // values as displayed, by tag
  std::optional<GpsPlace> place;
  ExifDirectories times;  // only the entries that tell when it was taken
  platform::FileStamp stamp;
};
// May take long; any thread.
ExifFileTexts ReadExifFile(const std::string& path);

// How the value of a tag is edited.
enum class ExifControl : uint8_t { None, Text, Date, Words, Flash };
ExifControl ControlOf(uint16_t tag);
// What a value may be, a phrase such as "1 to 32767"; empty for any text.
std::string ExifInputHint(uint16_t tag);

// The parts of a Flash value: an item of `words` is its value, at bit `shift`.
struct FlashPart {
  const char* name;
  const char* words;  // separated by ";"
  int shift;
  int mask;
};
std::span<const FlashPart> FlashParts();
// The number in a displayed text; 0 if it has none.
uint32_t FlashNumber(std::string_view text);

// A line of the editor: a tag in all files.
struct ExifEditRow {
  uint16_t tag = 0;
  std::string name;
  std::string text;      // the new value, or that of all files that have the tag
  size_t files = 0;      // that have the tag
  bool mixed = false;    // their values differ, and there is no new one
  bool changed = false;  // will be written
  bool removed = false;
  bool removable = false;
};

// Changes to the EXIF of several files. Only what was changed is written.
class ExifEditor {
 public:
  // Keeps changes that were made before.
  void SetFiles(std::vector<ExifFileTexts> files);
  const std::vector<ExifFileTexts>& Files() const { return files_; }
  // The files that can be changed.
  std::vector<std::string> Changeable() const;

  // Tags that a file has, or with `all` all tags that can be set, whose name or value contains
  // `filter`; in the order of the dictionary, unknown ones last.
  std::vector<ExifEditRow> Rows(bool all, std::string_view filter) const;
  ExifEditRow Row(uint16_t tag) const;
  // The place of all files, or the new one; none if there is none or they differ (`mixed`).
  std::optional<GpsPlace> Place(bool& mixed) const;
  // What will happen to the places when the files are written, a sentence; may be empty.
  std::string PlaceNote() const;

  // Sets a value, as typed. Returns why it is invalid, empty on success.
  std::string Set(uint16_t tag, std::string_view text);
  void Remove(uint16_t tag);
  void Revert(uint16_t tag);
  // Sets several values; the old place is replaced.
  void Set(const ExifChanges& changes);
  void RemovePlace();
  // Shifts all times; 0: not any more.
  void Shift(int64_t seconds);
  // Takes the places from a track; `offset` as for TakenUtc.
  void Follow(std::shared_ptr<const GpsTrack> track, std::optional<int64_t> offset);
  // Files with a position on the track.
  size_t OnTrack(const GpsTrack& track, std::optional<int64_t> offset) const;
  bool HasChanges() const;
  void Clear();  // forgets all changes

  // The changes, a line each, for a question.
  std::vector<std::string> Summary() const;
  // Whether a file gets tags that it does not have.
  bool Adds() const;
  // Makes the changes; without `addNew`, only of tags that a file has.
  ExifChanger Changer(bool addNew) const;

 private:
  struct Changes {
    std::map<uint16_t, std::optional<ExifEntry>> set;  // none: remove
    int64_t shift = 0;
    bool noPlace = false;
    std::shared_ptr<const GpsTrack> track;
    std::optional<int64_t> offset;
    ExifChanges For(const ExifDirectories& old, bool addNew, std::string& reason) const;
  };
  void ForgetPlace();

  std::vector<ExifFileTexts> files_;
  Changes changes_;
};

}  // namespace fotomill::desktop
