#include "catalog/similar/similar_search.h"

#include <algorithm>
#include <map>
#include <utility>

#include "catalog/similar/sharpness.h"
#include "core/md5.h"
#include "core/workers/ordered_run.h"
#include "metadata/exif/picture_exif.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/process.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// Pictures may be decoded as small as this, four times the size compared.
constexpr int32_t kSideForHash = 64;
constexpr size_t kSavedEvery = 500;  // pictures

// Files whose pictures have a size that no other has; they have no identical ones.
std::vector<const ComparedFile*> Lonely(const std::vector<ComparedFile>& files) {
  // Orientation may swap width and height.
  std::map<std::pair<int32_t, int32_t>, std::vector<const ComparedFile*>> sizes;
  for (const ComparedFile& file : files)
    sizes[std::minmax({file.record.width, file.record.height})].push_back(&file);
  std::vector<const ComparedFile*> lonely;
  for (const auto& [size, same] : sizes) {
    if (same.size() == 1) lonely.push_back(same[0]);
  }
  std::ranges::sort(lonely);
  return lonely;
}

}  // namespace

void SimilarSearch::Read(std::vector<ComparedFile>& files, const SimilarEvents& events) {
  const auto those = [&files](const auto& wanted) {
    std::vector<ComparedFile*> chosen;
    for (ComparedFile& file : files) {
      if (file.status == Status::Ok && wanted(file)) chosen.push_back(&file);
    }
    return chosen;
  };
  Recall(files);
  ForEach(those([](const ComparedFile& file) { return !file.known; }), &SimilarSearch::Look,
          events);
  if (options_.exact) {
    const std::vector<const ComparedFile*> lonely = Lonely(files);
    const auto needed = [&lonely](const ComparedFile& file) {
      return file.known && file.record.digest.empty() && !std::ranges::binary_search(lonely, &file);
    };
    ForEach(those(needed), &SimilarSearch::Digest, events);
  }
  kept_ = store_.Save() && kept_;
}

// Runs `work` for files in parallel, and adds what it determined to the store.
void SimilarSearch::ForEach(const std::vector<ComparedFile*>& files, Work work,
                            const SimilarEvents& events) {
  const auto run = [&](size_t i) {
    const Status status = (this->*work)(*files[i]);
    if (status != Status::Ok && events.hint) files[i]->hint = events.hint(files[i]->name, status);
    return status;
  };
  const auto take = [&](size_t i, Status status) {
    ComparedFile& file = *files[i];
    file.status = status;
    file.known = status == Status::Ok;
    if (file.known) store_.Put(platform::AbsolutePath(file.name), file.record);
    if ((i + 1) % kSavedEvery == 0) kept_ = store_.Save() && kept_;
    if (events.progress) events.progress(i + 1, files.size());
  };
  const auto goesOn = [&] { return !events.goesOn || events.goesOn(); };
  OrderedRun({.work = run, .deliver = take, .goesOn = goesOn, .tick = events.tick})
      .Run(files.size(), platform::CoreCount());
}

void SimilarSearch::Recall(std::vector<ComparedFile>& files) const {
  for (ComparedFile& file : files) {
    if (file.status != Status::Ok) continue;
    const platform::FileFacts facts = platform::FactsOf(file.name);
    const auto stored = store_.Find(platform::AbsolutePath(file.name), facts.size, facts.modified);
    if (stored) file.record = *stored;
    file.known = stored && (options_.exact || stored->hasHashes);
    file.record.size = facts.size;
    file.record.modified = facts.modified;
  }
}

// Determines size and, unless only identical pictures count, hashes.
Status SimilarSearch::Look(ComparedFile& file) const {
  PicturePointer picture;
  const ReadRequest request{
      .fileName = file.name, .thumbnailSide = kSideForHash, .options = options_.read};
  RETURN_IF_BAD(LoadPictureInfo(request, picture));
  if (!options_.exact) {
    RETURN_IF_BAD(ReadPicture(request, *picture));
    RETURN_IF_BAD(TurnUpright(*picture));
    RETURN_IF_BAD(HashPicture(*picture, file.record.hashes));
    file.record.hasHashes = true;
  }
  file.record.width = picture->width;
  file.record.height = picture->height;
  file.record.severalPages = picture->pageCount > 1;
  return Status::Ok;
}

Status SimilarSearch::Digest(ComparedFile& file) const {
  PicturePointer picture;
  RETURN_IF_BAD(LoadPicture({.fileName = file.name, .options = options_.read}, picture));
  RETURN_IF_BAD(TurnUpright(*picture));
  RETURN_IF_BAD(DigestPixels(*picture, file.record.digest));
  file.record.width = picture->width;  // upright
  file.record.height = picture->height;
  return picture->pageCount > 1 ? AddPages(*picture, file) : Status::Ok;
}

// Adds the other pages to the digest; of animations the bytes of the file, as their frames take
// long.
Status SimilarSearch::AddPages(const PictureRecord& first, ComparedFile& file) const {
  std::string all = file.record.digest;
  const FormatEntry& row = FormatRow(first.formatIndex);
  if (row.animate != nullptr || (row.flags & FMT_ANIMATED) != 0) {
    platform::FileView whole;
    if (!whole.Open(file.name)) return Status::FileOpenError;
    all += Md5Text(whole.Bytes());
    if (!whole.Intact()) return Status::FileReadError;
  } else {
    for (int32_t page = 1; page < first.pageCount; ++page) {
      PicturePointer picture;
      std::string digest;
      RETURN_IF_BAD(
          LoadPicture({.fileName = file.name, .page = page, .options = options_.read}, picture));
      RETURN_IF_BAD(TurnUpright(*picture));
      RETURN_IF_BAD(DigestPixels(*picture, digest));
      all += digest;
    }
  }
  file.record.digest = Md5Text({reinterpret_cast<const uint8_t*>(all.data()), all.size()});
  return Status::Ok;
}

Status SimilarSearch::FindSharpness(ComparedFile& file) const {
  PicturePointer picture;
  RETURN_IF_BAD(LoadPicture(
      {.fileName = file.name, .thumbnailSide = kSideForSharpness, .options = options_.read},
      picture));
  if (file.record.width == 0) {  // not read by a search
    file.record.width = picture->width;
    file.record.height = picture->height;
  }
  return MeasureSharpness(*picture, file.record.sharpness);
}

void SimilarSearch::Measure(std::vector<ComparedFile>& files, std::span<const size_t> which,
                            const SimilarEvents& events) {
  std::vector<ComparedFile*> chosen;
  for (const size_t i : which) {
    if (files[i].status == Status::Ok && files[i].record.sharpness < 0) chosen.push_back(&files[i]);
  }
  ForEach(chosen, &SimilarSearch::FindSharpness, events);
  kept_ = store_.Save() && kept_;
}

std::vector<SimilarGroup> SimilarSearch::Group(const std::vector<ComparedFile>& files,
                                               const std::function<bool()>& goesOn) const {
  std::vector<size_t> places;  // in `files`
  std::vector<PictureHashes> hashes;
  std::vector<std::string> digests;
  for (size_t i = 0; i < files.size(); ++i) {
    if (files[i].status != Status::Ok || !files[i].known) continue;
    places.push_back(i);
    hashes.push_back(files[i].record.hashes);
    digests.push_back(files[i].record.digest);
  }
  std::vector<SimilarGroup> groups =
      options_.exact ? FindEqual(digests)
                     : FindSimilar(hashes, options_.distance, options_.transforms, goesOn);
  for (SimilarGroup& group : groups) {
    for (size_t& member : group.members) member = places[member];
  }
  return groups;
}

}  // namespace fotomill
