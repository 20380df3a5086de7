#include "desktop/models/metadata/exif_editor.h"

#include <algorithm>
#include <charconv>
#include <set>

#include "core/shown_text.h"
#include "core/text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/exif_transfer.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_tags.h"
#include "metadata/exif/exif_walk.h"
#include "platform/file_view.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr uint16_t kTimes[] = {0x0132, 0x9003, 0x9004};
constexpr uint16_t kTakenTags[] = {0x9003, 0x9004, 0x9011, 0x9012};
constexpr uint16_t kLastGpsTag = 0x001f;

bool IsTime(uint16_t tag) { return std::ranges::find(kTimes, tag) != std::end(kTimes); }
bool IsGps(uint16_t tag) { return tag <= kLastGpsTag; }
// To the other directories.
bool IsPointer(uint16_t tag) { return tag == 0x8769 || tag == 0x8825 || tag == 0xa005; }

// Collects the values of a file, except those about its thumbnail.
class Gather : public ExifSink {
 public:
  explicit Gather(std::map<uint16_t, std::string>& texts) : texts_(texts) {}
  void Directory(int32_t, std::string_view label) override {
    own_ = label == "IFD 0" || label == "EXIF" || label == "GPS";
  }
  void Line(const ExifLine& line) override {
    if (own_ && !IsPointer(line.value.tag))
      texts_.emplace(line.value.tag, EscapeControls(line.text));
  }

 private:
  std::map<uint16_t, std::string>& texts_;
  bool own_ = false;
};

std::string TextOf(const ExifEntry& entry) {
  const ExifValue value{entry.tag, entry.type, entry.count, ExifBytes(entry.value, false)};
  std::string buffer;
  return EscapeControls(ExifValueText(value, FindExifTag(entry.tag), buffer).value_or(""));
}

std::string NameOf(uint16_t tag) {
  const ExifTag* row = FindExifTag(tag);
  return row != nullptr ? std::string(row->name) : "Unknown (" + std::to_string(tag) + ")";
}

std::string ShiftText(int64_t seconds) {
  const int64_t all = seconds < 0 ? -seconds : seconds;
  char text[48];
  std::snprintf(text, sizeof text, "%c%lld:%02d:%02d", seconds < 0 ? '-' : '+',
                static_cast<long long>(all / 3600), static_cast<int>(all / 60 % 60),
                static_cast<int>(all % 60));
  return text;
}

bool Contains(std::string_view text, std::string_view part) {
  return LowerCase(text).find(LowerCase(part)) != std::string::npos;
}

bool Has(const ExifDirectories& old, const DirectoryChange& change) {
  if (change.place == ExifPlace::Gps) return !old.gps.empty();
  return FindExifEntry(change.place == ExifPlace::First ? old.first : old.exif, change.tag) !=
         nullptr;
}

}  // namespace

ExifFileTexts ReadExifFile(const std::string& path) {
  ExifFileTexts file;
  file.path = path;
  file.stamp = platform::StampOf(path);
  platform::FileView view;
  if (!view.Open(path)) {
    file.problem = WithReason(Tr("It cannot be read."));
    return file;
  }
  if (!HasEditableExif(MetadataFormOf(view.Bytes()))) {
    file.problem = Tr("EXIF can be changed in JPEG, TIFF, PNG, WebP and HD Photo files.");
    return file;
  }
  ExifSource source;
  Gather gather(file.texts);
  if (source.Open(path.c_str()) == Status::Ok && !source.Block().empty())
    (void)WalkExif(source.Block(), &gather);
  const ExifDirectories all = GatherPictureExif(view.Bytes());
  file.place = PlaceOf(all);
  file.times.bigEndian = all.bigEndian;
  for (const ExifEntry& entry : all.exif) {
    if (std::ranges::find(kTakenTags, entry.tag) != std::end(kTakenTags))
      file.times.exif.push_back(entry);
  }
  return file;
}

ExifControl ControlOf(uint16_t tag) {
  const ExifTag* row = FindExifTag(tag);
  if (row == nullptr || row->editClass != kExifOrdinary) return ExifControl::None;
  if (row->rule == ExifRule::Flash) return ExifControl::Flash;
  if (row->rule == ExifRule::Words) return ExifControl::Words;
  return IsTime(tag) ? ExifControl::Date : ExifControl::Text;
}

std::string ExifInputHint(uint16_t tag) {
  constexpr struct {
    uint16_t tag;
    const char* hint;
  } kHints[] = {
      {0x0002, TrLater("Degrees, minutes and seconds, or decimal degrees")},
      {0x0004, TrLater("Degrees, minutes and seconds, or decimal degrees")},
      {0x0014, TrLater("Degrees, minutes and seconds, or decimal degrees")},
      {0x0016, TrLater("Degrees, minutes and seconds, or decimal degrees")},
      {0x0007, TrLater("Hours, minutes and seconds")},
      {0x001d, TrLater("A date such as 2024:05:31")},
      {0x829a, TrLater("Seconds, such as 1/250")},
      {0x9206, TrLater("Meters, Infinity or Unknown")},
  };
  if (IsTime(tag)) return Tr("A date and time such as 2024:05:31 14:03:00");
  for (const auto& hint : kHints) {
    if (hint.tag == tag) return Tr(hint.hint);
  }
  const ExifTag* row = FindExifTag(tag);
  if (row == nullptr || (row->minimum == 0 && row->maximum == 0)) return {};
  const bool rational = row->type == kExifRational || row->type == kExifSRational;
  const auto bound = [&](int32_t value) {
    char digits[32];
    const double number = rational ? value / 1000.0 : value;
    const auto end =
        std::to_chars(digits, digits + sizeof digits, number, std::chars_format::fixed).ptr;
    return std::string(digits, end);
  };
  return Tr("%1 to %2", bound(row->minimum), bound(row->maximum));
}

std::span<const FlashPart> FlashParts() {
  static constexpr FlashPart kParts[] = {
      {TrLater("Flash"), TrLater("Flash not fired;Flash fired"), 0, 1},
      {TrLater("Returned light"),
       TrLater("Flash return not implemented;Flash return undefined;Flash return not "
               "detected;Flash return detected"),
       1, 3},
      {TrLater("Mode"),
       TrLater("Flash mode unknown;Flash firing mode ;Flash suppression mode;Flash auto mode"), 3,
       3},
      {TrLater("Function"), TrLater("Flash present;Flash not present"), 5, 1},
      {TrLater("Redeye"),
       TrLater("Flash redeye suppression unsupported;Flash redeye suppression supported"), 6, 1},
  };
  return kParts;
}

uint32_t FlashNumber(std::string_view text) {
  ExifEntry entry;
  std::string reason;
  if (!ParseExifInput(0x9209, text, entry, reason) || entry.value.empty()) return 0;
  return entry.value[0];
}

// --- the files ---

void ExifEditor::SetFiles(std::vector<ExifFileTexts> files) { files_ = std::move(files); }

std::vector<std::string> ExifEditor::Changeable() const {
  std::vector<std::string> paths;
  for (const ExifFileTexts& file : files_) {
    if (file.problem.empty()) paths.push_back(file.path);
  }
  return paths;
}

std::vector<ExifEditRow> ExifEditor::Rows(bool all, std::string_view filter) const {
  std::set<uint16_t> present;
  for (const ExifFileTexts& file : files_) {
    for (const auto& [tag, text] : file.texts) present.insert(tag);
  }
  for (const auto& [tag, entry] : changes_.set) present.insert(tag);
  std::vector<uint16_t> tags;
  for (const ExifTag& row : ExifTags()) {
    if (present.erase(row.tag) != 0 || (all && row.editClass == kExifOrdinary))
      tags.push_back(row.tag);
  }
  tags.insert(tags.end(), present.begin(), present.end());
  std::vector<ExifEditRow> rows;
  for (const uint16_t tag : tags) {
    ExifEditRow row = Row(tag);
    if (Contains(row.name, filter) || Contains(row.text, filter)) rows.push_back(std::move(row));
  }
  return rows;
}

ExifEditRow ExifEditor::Row(uint16_t tag) const {
  ExifEditRow row;
  row.tag = tag;
  row.name = NameOf(tag);
  for (const ExifFileTexts& file : files_) {
    const auto found = file.texts.find(tag);
    if (found == file.texts.end()) continue;
    std::string text = found->second;
    const auto time = changes_.shift != 0 && IsTime(tag) ? ParseExifTime(text) : std::nullopt;
    if (time) {
      text = ExifTimeText(*time + changes_.shift);
      row.changed = true;
    }
    row.mixed = row.mixed || (row.files > 0 && text != row.text);
    if (row.files == 0) row.text = text;
    ++row.files;
  }
  const ExifTag* known = FindExifTag(tag);
  row.removable = row.files > 0 && (known != nullptr ? known->editClass == kExifOrdinary
                                                     : PlaceOfExifTag(tag) == ExifPlace::Exif);
  const auto set = changes_.set.find(tag);
  if (set != changes_.set.end() || (changes_.noPlace && IsGps(tag) && row.files > 0)) {
    row.changed = true;
    row.mixed = false;
    row.removed = set == changes_.set.end() || !set->second;
    row.text = row.removed ? std::string() : TextOf(*set->second);
  }
  if (row.mixed) row.text.clear();
  return row;
}

std::optional<GpsPlace> ExifEditor::Place(bool& mixed) const {
  mixed = false;
  ExifDirectories changed;
  for (const auto& [tag, entry] : changes_.set) {
    if (IsGps(tag) && entry) changed.gps.push_back(*entry);
  }
  if (const auto place = PlaceOf(changed)) return place;
  std::optional<GpsPlace> place;
  bool first = true;
  for (const ExifFileTexts& file : files_) {
    if (!file.problem.empty()) continue;
    const bool same = place.has_value() == file.place.has_value() &&
                      (!place || MapLink(*place) == MapLink(*file.place));
    if (first) place = file.place;
    mixed = mixed || (!first && !same);
    first = false;
  }
  return mixed ? std::nullopt : place;
}

std::string ExifEditor::PlaceNote() const {
  if (changes_.track != nullptr) return Tr("Will be taken from the track.");
  if (changes_.noPlace) return Tr("Will be removed.");
  const bool set = std::ranges::any_of(changes_.set, [](const auto& c) { return IsGps(c.first); });
  return set ? Tr("Not written yet.") : std::string();
}

// --- changes ---

std::string ExifEditor::Set(uint16_t tag, std::string_view text) {
  ExifEntry entry;
  std::string reason;
  if (!ParseExifInput(tag, text, entry, reason)) return reason;
  changes_.set.erase(tag);
  const ExifEditRow old = Row(tag);
  const bool same = !old.mixed && old.files == Changeable().size() && old.text == TextOf(entry);
  if (!same) changes_.set.emplace(tag, std::move(entry));
  return {};
}

void ExifEditor::Remove(uint16_t tag) { changes_.set.insert_or_assign(tag, std::nullopt); }

void ExifEditor::Revert(uint16_t tag) {
  changes_.set.erase(tag);
  if (IsTime(tag)) changes_.shift = 0;
  if (IsGps(tag)) changes_.noPlace = false;
}

void ExifEditor::ForgetPlace() {
  std::erase_if(changes_.set, [](const auto& change) { return IsGps(change.first); });
  changes_.noPlace = false;
  changes_.track.reset();
}

void ExifEditor::Set(const ExifChanges& changes) {
  if (std::ranges::any_of(changes, [](const auto& change) { return IsGps(change.tag); }))
    ForgetPlace();
  for (const DirectoryChange& change : changes)
    changes_.set.insert_or_assign(change.tag, change.entry);
}

void ExifEditor::RemovePlace() {
  ForgetPlace();
  changes_.noPlace = true;
}

void ExifEditor::Shift(int64_t seconds) { changes_.shift = seconds; }

void ExifEditor::Follow(std::shared_ptr<const GpsTrack> track, std::optional<int64_t> offset) {
  ForgetPlace();
  changes_.track = std::move(track);
  changes_.offset = offset;
}

size_t ExifEditor::OnTrack(const GpsTrack& track, std::optional<int64_t> offset) const {
  return static_cast<size_t>(std::ranges::count_if(files_, [&](const ExifFileTexts& file) {
    const auto time = TakenUtc(file.times, offset);
    return time && track.At(*time);
  }));
}

bool ExifEditor::HasChanges() const {
  return !changes_.set.empty() || changes_.shift != 0 || changes_.noPlace ||
         changes_.track != nullptr;
}

void ExifEditor::Clear() { changes_ = {}; }

std::vector<std::string> ExifEditor::Summary() const {
  std::vector<std::string> lines;
  for (const auto& [tag, entry] : changes_.set)
    lines.push_back(entry ? NameOf(tag) + ": " + TextOf(*entry) : Tr("%1: removed", NameOf(tag)));
  if (changes_.shift != 0) lines.push_back(Tr("Times: shifted by %1", ShiftText(changes_.shift)));
  if (changes_.noPlace) lines.push_back(Tr("Place: removed"));
  if (changes_.track != nullptr) lines.push_back(Tr("Place: from the track"));
  return lines;
}

bool ExifEditor::Adds() const {
  return std::ranges::any_of(files_, [&](const ExifFileTexts& file) {
    if (!file.problem.empty()) return false;
    if (changes_.track != nullptr && !file.place) return true;
    return std::ranges::any_of(changes_.set, [&](const auto& change) {
      return change.second.has_value() && !file.texts.contains(change.first);
    });
  });
}

ExifChanges ExifEditor::Changes::For(const ExifDirectories& old, bool addNew,
                                     std::string& reason) const {
  ExifChanges changes;
  if (shift != 0) changes = ShiftedTimes(old, shift, reason);
  if (noPlace) changes.push_back({.place = ExifPlace::Gps, .all = true});
  if (track != nullptr && reason.empty()) {
    const ExifChanges place = TrackPlace(*track, offset, old, reason);
    changes.insert(changes.end(), place.begin(), place.end());
  }
  if (!reason.empty()) return {};
  for (const auto& [tag, entry] : set) {
    std::erase_if(changes, [tag = tag](const DirectoryChange& change) {
      return !change.all && change.tag == tag;
    });
    changes.push_back({PlaceOfExifTag(tag), tag, entry});
  }
  if (!addNew)
    std::erase_if(changes, [&](const auto& change) { return change.entry && !Has(old, change); });
  return changes;
}

ExifChanger ExifEditor::Changer(bool addNew) const {
  return [changes = changes_, addNew](const ExifDirectories& old, std::string& reason) {
    return changes.For(old, addNew, reason);
  };
}

}  // namespace fotomill::desktop
