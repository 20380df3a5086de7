#include "archive/extract.h"

#include <utility>

#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

class Extractor final : public EntryReceiver {
 public:
  using Places = std::vector<ExtractPlace>;  // one per entry
  Extractor(std::span<const ArchiveEntry> entries, const Places& places, const ExtractJob& job)
      : entries_(entries), places_(places), job_(job) {}

  Status Begin(size_t index) override {
    const std::string& path = places_[index].path;
    const std::string folder = platform::FolderOf(path);
    if (!folder.empty() && !platform::MakeFolders(folder)) return Status::ErrorCreatingFile;
    return file_.Create(path) ? Status::Ok : Status::ErrorCreatingFile;
  }
  Status Data(std::span<const uint8_t> bytes) override {
    return file_.Write(bytes) ? Status::Ok : Status::ErrorWritingFile;
  }
  void End(size_t index, const ArchiveEnd& end) override {
    const ExtractPlace& place = places_[index];
    const ArchiveEntry& entry = entries_[index];
    ArchiveEnd result = end;
    if (result.status == Status::Ok && place.makeWay && !place.makeWay())
      result.status = Status::ErrorCreatingFile;
    if (result.status == Status::Ok) {
      switch (file_.Commit(place.existing)) {
        case platform::CommitResult::Done: break;
        case platform::CommitResult::Taken: result.status = Status::ErrorCreatingFile; break;
        case platform::CommitResult::Failed: result.status = Status::ErrorWritingFile; break;
      }
    }
    file_.Discard();
    if (result.status == Status::Ok && job_.keepTimes && entry.facts.modified != 0)
      (void)platform::SetModificationTime(place.path, {entry.facts.modified, 0});
    job_.done(entry, place.path, result);
  }

 private:
  const std::span<const ArchiveEntry> entries_;
  const Places& places_;
  const ExtractJob& job_;
  platform::OutputFile file_;
};

}  // namespace

ArchiveEnd ExtractArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                          std::vector<bool> wanted, const ExtractJob& job) {
  bool any = false;
  Extractor::Places places(entries.size());
  for (size_t i = 0; i < entries.size(); ++i) {
    if (!wanted[i]) continue;
    wanted[i] = false;
    if (entries[i].refusal != EntryRefusal::None || !entries[i].IsFile()) continue;
    auto place = job.place(entries[i]);
    if (!place) continue;
    places[i] = std::move(*place);
    any = wanted[i] = true;
  }
  if (!any) return {};
  Extractor extractor(entries, places, job);
  return ReadArchive(source, entries, wanted, extractor);
}

}  // namespace fotomill
