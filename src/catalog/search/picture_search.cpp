#include "catalog/search/picture_search.h"

#include <utility>
#include <vector>

#include "core/workers/ordered_run.h"
#include "platform/clock.h"
#include "platform/process.h"

namespace fotomill {

namespace {

constexpr double kSaveInterval = 5;  // seconds

}  // namespace

// On any thread.
void PictureSearch::Examine(const std::string& path, ExaminedFile& file) {
  file.state = StateOf(path, options_.tags);
  if (!file.state.regular) {
    file.status = Status::FileOpenError;
    return;
  }
  {
    const std::lock_guard lock(indexMutex_);
    if (auto known = index_.Find(path, file.state)) file.facts = std::move(*known);
  }
  if (file.facts.faceKey != FaceKeyOf(options_.faces)) file.facts.parts &= ~kFactsFaces;
  file.keptParts = file.facts.parts;
  const auto factsWith = [&](uint32_t parts) -> const PictureFacts* {
    const Status status = ReadPictureFacts(path, parts, options_, file.facts);
    if (status != Status::Ok) file.status = status;
    return status == Status::Ok ? &file.facts : nullptr;
  };
  file.found = Meets(criteria_, path, file.state.size, factsWith);
  if (file.found && parts_ != 0) (void)factsWith(parts_);
}

// Adds new facts to the index.
void PictureSearch::Keep(const std::string& path, const ExaminedFile& file) {
  if (file.facts.parts == file.keptParts) return;
  const std::lock_guard lock(indexMutex_);
  index_.Put(path, file.state, file.facts);
  if (platform::MonotonicSeconds() - saved_ < kSaveInterval) return;
  kept_ = index_.Save() && kept_;
  saved_ = platform::MonotonicSeconds();
}

void PictureSearch::Run(std::span<const std::string> paths, const SearchEvents& events) {
  std::vector<std::unique_ptr<ExaminedFile>> files(paths.size());
  saved_ = platform::MonotonicSeconds();
  OrderedRun run(
      {.work =
           [&](size_t i) {
             files[i] = std::make_unique<ExaminedFile>();
             Examine(paths[i], *files[i]);
             if (files[i]->status != Status::Ok && events.hint)
               files[i]->hint = events.hint(paths[i], files[i]->status);
             return Status::Ok;
           },
       .deliver =
           [&](size_t i, Status status) {
             if (files[i] == nullptr) files[i] = std::make_unique<ExaminedFile>();
             const std::unique_ptr<ExaminedFile> file = std::move(files[i]);
             if (status != Status::Ok) file->status = status;
             Keep(paths[i], *file);
             events.examined(i, *file);
           },
       .goesOn = [&] { return !options_.stop.Asked() && (!events.goesOn || events.goesOn()); },
       .tick = events.tick});
  run.Run(paths.size(), platform::CoreCount());
  kept_ = index_.Save() && kept_;
}

}  // namespace fotomill
