#include "catalog/history/file_history.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <optional>
#include <unordered_map>
#include <vector>

#include "catalog/history/file_moves.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/reserved_memory.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr std::string_view kNames[] = {TrLater("View"),
                                       TrLater("Paint"),
                                       TrLater("Contact sheet"),
                                       TrLater("Web gallery"),
                                       TrLater("Annotate"),
                                       TrLater("Print"),
                                       TrLater("Transform"),
                                       TrLater("Filter"),
                                       TrLater("Effects"),
                                       TrLater("Convert"),
                                       TrLater("Get info"),
                                       TrLater("Move and copy"),
                                       TrLater("Copy to clipboard"),
                                       TrLater("Crop"),
                                       TrLater("Matt"),
                                       TrLater("Watermark"),
                                       TrLater("File time"),
                                       TrLater("Photo workshop"),
                                       TrLater("Find similar"),
                                       TrLater("Catalog")};
static_assert(std::size(kNames) == kFileFunctionCount);

constexpr std::string_view kExtension = ".fhdb";
constexpr std::string_view kPathTag = "\tPATH:", kFunctionTag = "\tFUNCTION:",
                           kAccessedTag = "\tACCESSED:", kEndTag = "\tEND:";
constexpr size_t kLongestLine = 4095;  // longer lines are split

// An entry. Together with its thumbnail for the list window it takes one slot.
#pragma pack(push, 1)
struct Slot {
  char path[261];  // NUL-terminated
  int32_t function, created, accessed;
  uint64_t size;
};
#pragma pack(pop)
static_assert(sizeof(Slot) == 281);
constexpr uint64_t kSlotBytes = sizeof(Slot) + sizeof(ThumbnailRecord);
constexpr uint64_t kGrowth = 128;  // entries
static_assert(kSlotBytes == 28193 && kGrowth * kSlotBytes == 3608704);

int32_t Clamped(int64_t seconds) {
  return static_cast<int32_t>(std::clamp<int64_t>(seconds, INT32_MIN, INT32_MAX));
}

std::string_view PathOf(const Slot& slot) {
  return {slot.path, strnlen(slot.path, sizeof slot.path - 1)};
}

// Sort order: most recent use first; ties by file name, then path, both descending.
bool StandsBefore(const Slot& a, const Slot& b) {
  if (a.accessed != b.accessed) return a.accessed > b.accessed;
  const std::string_view aName = platform::FileNameOf(PathOf(a)),
                         bName = platform::FileNameOf(PathOf(b));
  return aName != bName ? aName > bName : PathOf(a) > PathOf(b);
}

// The list. The fixed parts of all slots come first in memory, then the thumbnails, so that most of
// the large reserved range is never touched.
class HistoryList {
 public:
  bool Exists() const { return !room_.Empty(); }
  size_t Count() const { return order_.size(); }
  const Slot& At(size_t index) const { return Slots()[order_[index]]; }

  bool Record(std::string_view path, int32_t function, int32_t created, int32_t accessed,
              uint64_t size) {
    if (!MakeRoom()) return false;
    const auto found = slotOf_.find(std::string(path));
    uint32_t number = 0;
    if (found != slotOf_.end()) {
      number = found->second;
      order_.erase(Place(number));
    } else {
      number = FreeSlot();
      Slot& slot = Slots()[number];
      std::memset(&slot, 0, sizeof slot);
      std::memcpy(slot.path, path.data(), path.size());
      slot.created = created;
      slot.size = size;
      slotOf_.emplace(path, number);
    }
    Slots()[number].function = function;
    Slots()[number].accessed = accessed;
    order_.insert(Place(number), number);
    return true;
  }

  // The thumbnail of an entry, loaded on first use.
  const ThumbnailRecord* Thumbnail(size_t index) {
    const uint32_t number = order_[index];
    const uint64_t offset =
        room_.Size() / kSlotBytes * sizeof(Slot) + number * sizeof(ThumbnailRecord);
    ThumbnailRecord& record = room_.Items<ThumbnailRecord>(offset, 1)[0];
    hasThumbnail_.resize(used_);
    if (!hasThumbnail_[number])
      hasThumbnail_[number] = ReadThumbnailFile(record, ThumbnailPathFor(PathOf(At(index))));
    return hasThumbnail_[number] ? &record : nullptr;
  }

  // Truncates the list to `count` entries.
  void Cut(size_t count) {
    for (; order_.size() > count; order_.pop_back()) {
      free_.push_back(order_.back());
      slotOf_.erase(std::string(PathOf(Slots()[order_.back()])));
    }
  }

  void Free() { *this = HistoryList(); }

 private:
  Slot* Slots() { return room_.Items<Slot>(0, used_).data(); }
  const Slot* Slots() const { return const_cast<HistoryList*>(this)->Slots(); }

  // The position of a slot in the order, or where to insert it.
  std::vector<uint32_t>::iterator Place(uint32_t number) {
    return std::lower_bound(order_.begin(), order_.end(), number, [this](uint32_t a, uint32_t b) {
      return a != b && StandsBefore(Slots()[a], Slots()[b]);
    });
  }

  uint32_t FreeSlot() {
    if (free_.empty()) return used_++;
    const uint32_t number = free_.back();
    free_.pop_back();
    if (number < hasThumbnail_.size()) hasThumbnail_[number] = false;
    return number;
  }

  // A full list reserves memory for count x 128 slots, but only raises its capacity by 128 entries.
  // If that much cannot be reserved, the existing memory is used up to its last slot.
  bool MakeRoom() {
    if (room_.Empty()) {
      if (!room_.Reserve(kGrowth * kSlotBytes)) return false;
      capacity_ = kGrowth;
    }
    if (order_.size() < capacity_) return true;
    platform::ReservedMemory larger;
    if (!larger.Reserve(order_.size() * kGrowth * kSlotBytes))
      return order_.size() < room_.Size() / kSlotBytes;
    std::memcpy(larger.Items<Slot>(0, used_).data(), Slots(), used_ * sizeof(Slot));
    room_ = std::move(larger);
    hasThumbnail_.clear();  // reloaded on demand instead of copied
    capacity_ += kGrowth;
    return true;
  }

  platform::ReservedMemory room_;
  uint64_t capacity_ = 0;           // entries
  uint32_t used_ = 0;               // slots used so far, including free ones
  std::vector<uint32_t> order_;     // slots in list order
  std::vector<uint32_t> free_;      // slots of removed entries
  std::vector<bool> hasThumbnail_;  // by slot
  std::unordered_map<std::string, uint32_t> slotOf_;
};

HistoryList list;
bool outOfMemory = false;  // the list is incomplete
bool loaded = false;       // the list was loaded from the file

void LimitList(const HistoryOptions& options) {
  size_t count = list.Count();
  if (options.limitDays) {
    const int64_t oldest = platform::Now() - int64_t{options.days} * 86400;
    while (count > 0 && list.At(count - 1).accessed < oldest) --count;
  } else {
    count = std::min(count, static_cast<size_t>(std::max(options.count, 0)));
  }
  list.Cut(count);
}

// Finds the text between `tag` and the next tab.
bool FindField(std::string_view line, std::string_view tag, std::string_view& value) {
  const size_t start = line.find(tag);
  if (start == std::string_view::npos) return false;
  value = line.substr(start + tag.size());
  value = value.substr(0, value.find('\t'));
  return true;
}

// Removes the next line from the text, or its first part if it is too long.
std::string_view TakeLine(std::string_view& text) {
  const size_t end = std::min({text.find('\n'), text.size() - 1, kLongestLine - 1});
  std::string_view line = text.substr(0, end + 1);
  text.remove_prefix(line.size());
  while (!line.empty() && line[0] != '\t' && static_cast<unsigned char>(line[0]) <= ' ')
    line.remove_prefix(1);
  return line.substr(0, line.find_first_of(std::string_view("\n\r\0", 3)));
}

// Records the entries in a history file's text, with the current paths of their files. False if it
// is not empty but has no valid line. Sets `followed` if an entry was affected by a move or
// removal.
bool ReadEntries(const HistoryOptions& options, std::string_view text, const FileMoves& moves,
                 bool& followed) {
  bool any = text.empty();
  while (!text.empty()) {
    const std::string_view line = TakeLine(text);
    std::string_view path, function, accessed;
    if (!line.starts_with('\t') || !FindField(line, kPathTag, path) || path.empty()) continue;
    any = true;
    const int64_t number =
        FindField(line, kFunctionTag, function) ? LeadingInteger(function) : kNoFileFunction;
    if (number < 0 || number >= kFileFunctionCount) continue;
    const int32_t time =
        FindField(line, kAccessedTag, accessed) ? Clamped(LeadingInteger(accessed)) : kOwnTime;
    const std::optional<std::string> now = moves.PathNow(path);
    followed = followed || now;
    (void)RecordFileHistory(options, now ? *now : path, static_cast<FileFunction>(number), kOwnTime,
                            time);
  }
  return any;
}

std::string TextOfList() {
  std::string text;
  for (size_t i = 0; i < list.Count(); ++i) {
    const Slot& slot = list.At(i);
    text.append(kPathTag).append(PathOf(slot));
    text.append(kFunctionTag).append(std::to_string(slot.function));
    text.append(kAccessedTag).append(std::to_string(slot.accessed));
    text.append(kEndTag).append(platform::kLineEnd);
  }
  return text;
}

bool DeleteHistoryFile(const HistoryOptions& options) {
  const std::string path = FileHistoryPath(options);
  return !path.empty() && (!platform::FileExists(path) || platform::DeleteFile(path));
}

HistoryUpdate UpdateOf(EditResult result) {
  switch (result) {
    case EditResult::Done:
    case EditResult::Unchanged: return HistoryUpdate::Done;
    case EditResult::NotRead: return HistoryUpdate::NotRead;
    case EditResult::Failed: break;
  }
  return HistoryUpdate::Failed;
}

size_t RecordUses(const HistoryOptions& options, std::span<const FileUse> uses,
                  std::span<const std::string> paths) {
  size_t recorded = 0;
  for (size_t i = 0; i < uses.size(); ++i) {
    const FileUse& use = uses[i];
    if (use.removed) continue;  // its entry was dropped
    recorded += RecordFileHistory(options, paths[i], use.function, use.created, use.accessed);
  }
  return recorded;
}

// Records the moves and removals of uses, last one first; returns the current paths of their files.
std::vector<std::string> FollowUses(std::span<const FileUse> uses, FileMoves& moves) {
  std::vector<std::string> paths(uses.size());
  for (size_t i = uses.size(); i > 0; --i) {
    const FileUse& use = uses[i - 1];
    paths[i - 1] = moves.PathNow(use.path).value_or(use.path);
    if (use.removed) moves.RemovedBefore(use.path);
    if (!use.from.empty()) moves.MovedBefore(use.from, use.path);
  }
  return paths;
}

}  // namespace

std::string_view FileFunctionName(int32_t function) {
  return function >= 0 && function < kFileFunctionCount ? kNames[function] : std::string_view();
}

int32_t FileFunctionOfName(std::string_view name) {
  const auto* const found = std::ranges::find_if(
      kNames, [&](std::string_view known) { return EqualIgnoringCase(known, name); });
  return found == std::end(kNames) ? kNoFileFunction : static_cast<int32_t>(found - kNames);
}

bool FitsFileHistory(std::string_view path) {
  return !path.empty() && path.size() < sizeof Slot::path &&
         path.find_first_of(std::string_view("\t\n\r\0", 4)) == std::string_view::npos;
}

bool RecordFileHistory(const HistoryOptions& options, std::string_view path, FileFunction function,
                       int32_t created, int32_t accessed) {
  const auto number = static_cast<int32_t>(function);
  if (!options.on || number < 0 || number >= kFileFunctionCount) return false;
  if ((options.functions >> number & 1) == 0 || !FitsFileHistory(path)) return false;
  const platform::FileFacts facts = platform::FactsOf(std::string(path));
  if (facts.kind != platform::FileKind::Regular) return false;
  if (created == kOwnTime) created = Clamped(facts.created);
  if (accessed == kOwnTime) accessed = Clamped(platform::Now());
  if (!list.Record(path, number, created, accessed, facts.size)) {
    outOfMemory = true;
    return false;
  }
  LimitList(options);
  return true;
}

bool LoadFileHistory(const HistoryOptions& options) {
  if (!options.on) return false;
  const std::string path = FileHistoryPath(options);
  std::string text;
  if (path.empty()) return false;
  const platform::ReadResult result = platform::ReadWholeFile(path, limits.listFileBytes, text);
  loaded = result == platform::ReadResult::Missing || result == platform::ReadResult::Done;
  bool followed = false;
  return result == platform::ReadResult::Done && ReadEntries(options, text, {}, followed);
}

bool SaveFileHistory(const HistoryOptions& options) {
  bool saved = false;
  if (!options.on || (!list.Exists() && loaded)) {
    saved = DeleteHistoryFile(options);
  } else if (list.Exists() && !FileHistoryPath(options).empty()) {
    const EditResult result = EditTextFile(FileHistoryPath(options), limits.listFileBytes,
                                           [](std::string& text) { text = TextOfList(); });
    saved = UpdateOf(result) == HistoryUpdate::Done;
  }
  ClearFileHistory();
  return saved;
}

bool ClearFileHistory() {
  list.Free();
  loaded = outOfMemory = false;
  return true;
}

std::string FileHistoryPath(const HistoryOptions& options) {
  if (options.name.empty() || !IsPlainName(options.name)) return {};
  return DataFile(options.name + std::string(kExtension));
}

size_t FileHistoryCount() { return list.Count(); }

FileHistoryEntry FileHistoryAt(size_t index) {
  const Slot& slot = list.At(index);
  return {PathOf(slot), slot.function, slot.created, slot.accessed, slot.size};
}

const ThumbnailRecord* FileHistoryThumbnail(size_t index) { return list.Thumbnail(index); }

HistoryUpdate UpdateFileHistory(const HistoryOptions& options, std::span<const FileUse> uses,
                                size_t* recorded) {
  if (recorded != nullptr) *recorded = 0;
  ClearFileHistory();
  if (!options.on) {
    return options.offForGood && !DeleteHistoryFile(options) ? HistoryUpdate::Failed
                                                             : HistoryUpdate::Off;
  }
  const std::string path = FileHistoryPath(options);
  if (path.empty()) return HistoryUpdate::Failed;
  bool foreign = false;
  FileMoves moves;
  const std::vector<std::string> paths = FollowUses(uses, moves);
  const EditResult result = EditTextFile(path, limits.listFileBytes, [&](std::string& text) {
    bool followed = false;
    foreign = !ReadEntries(options, text, moves, followed);
    const size_t count = foreign ? 0 : RecordUses(options, uses, paths);
    if (recorded != nullptr) *recorded = count;
    if (!foreign && !outOfMemory && (count > 0 || followed)) text = TextOfList();
  });
  const bool incomplete = outOfMemory;
  ClearFileHistory();
  if (incomplete) return HistoryUpdate::Failed;
  return foreign ? HistoryUpdate::NotRead : UpdateOf(result);
}

}  // namespace fotomill
