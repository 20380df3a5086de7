#include "cli/commands/search/similar.h"

#include <algorithm>
#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "batch/picture_failure.h"
#include "catalog/similar/hash_store.h"
#include "catalog/similar/similar_groups.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "core/data_folder.h"
#include "core/workers/ordered_run.h"
#include "metadata/exif/picture_exif.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/process.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr int32_t kMostDistance = 32;
// Pictures may be decoded as small as this, four times the size compared.
constexpr int32_t kSideForHash = 64;
constexpr size_t kSavedEvery = 500;  // pictures

struct SimilarOptions {
  SelectionOptions selection;
  int32_t distance = 0;
  bool transforms = false;
  bool exact = false;
  bool json = false;
};

// A file to be grouped.
struct Candidate {
  std::string name;
  HashRecord record;
  Status status = Status::Ok;
  std::string hint;
  bool known = false;  // the store has all that is needed
};

class Search {
 public:
  Search(const SimilarOptions& options, const CommandContext& context)
      : options_(options),
        output_(context, options.json),
        store_(DataFile(kHashStoreName)),
        read_(ReadOptionsFromSettings()) {}

  int Run(const Selection& selection) {
    output_.CloseWith(selection.leftOut);
    if (!store_.SetAside().empty()) {
      output_.Note(Tr("\"%1\" was damaged; it is kept as \"%2\".",
                      output_.ShownMessage(DataFile(kHashStoreName)),
                      output_.ShownMessage(store_.SetAside())));
    }
    std::set<std::string> seen;  // ignores repeated names
    for (const SelectedFile& file : selection.files) {
      if (!seen.insert(platform::AbsolutePath(file.name)).second) continue;
      Candidate& candidate = candidates_.emplace_back();
      candidate.name = file.name;
      candidate.status = file.status;
      candidate.hint = file.hint;
      if (candidate.status == Status::Ok) Recall(candidate);
    }
    output_.Expect(candidates_.size());
    ForEach([this](Candidate& candidate) { Look(candidate); });
    if (options_.exact) {
      FindLonely();
      ForEach([this](Candidate& candidate) { Digest(candidate); });
    }
    Keep();
    if (output_.GoesOn()) Report();
    return output_.Finish();
  }

 private:
  // Runs `work` for all candidates in parallel.
  void ForEach(const std::function<void(Candidate&)>& work) {
    size_t sinceSaved = 0;
    OrderedRun run({.work =
                        [&](size_t i) {
                          if (candidates_[i].status == Status::Ok) work(candidates_[i]);
                          return Status::Ok;
                        },
                    .deliver =
                        [&](size_t i, Status status) {
                          Candidate& candidate = candidates_[i];
                          if (status != Status::Ok) candidate.status = status;
                          Take(candidate);
                          if (++sinceSaved % kSavedEvery == 0) Keep();
                          output_.ShowProgress(++done_,
                                               candidates_.size() * (options_.exact ? 2 : 1));
                        },
                    .goesOn = [this] { return output_.GoesOn(); },
                    .tick = [this] { output_.Tick(); }});
    run.Run(candidates_.size(), platform::CoreCount());
  }

  void Take(Candidate& candidate) {
    if (candidate.status != Status::Ok || candidate.known) return;
    store_.Put(platform::AbsolutePath(candidate.name), candidate.record);
    candidate.known = true;
  }

  void Keep() {
    if (store_.Save() || complained_) return;
    complained_ = true;
    output_.Note(
        Tr("Results cannot be stored in \"%1\".", output_.ShownMessage(DataFile(kHashStoreName))));
  }

  // Loads what the store knows. Must run on the calling thread, before the parallel work.
  void Recall(Candidate& candidate) const {
    const platform::FileFacts facts = platform::FactsOf(candidate.name);
    const auto known =
        store_.Find(platform::AbsolutePath(candidate.name), facts.size, facts.modified);
    if (known) candidate.record = *known;
    candidate.known = known && (options_.exact || known->hasHashes);
    candidate.record.size = facts.size;
    candidate.record.modified = facts.modified;
  }

  // Determines size and, unless only identical pictures count, hashes.
  void Look(Candidate& candidate) const {
    if (candidate.known) return;
    PicturePointer picture;
    const ReadRequest request{
        .fileName = candidate.name, .thumbnailSide = kSideForHash, .options = read_};
    Status status = LoadPictureInfo(request, picture);
    if (status == Status::Ok && !options_.exact) {
      status = ReadPicture(request, *picture);
      if (status == Status::Ok) status = TurnUpright(*picture);
      if (status == Status::Ok) status = HashPicture(*picture, candidate.record.hashes);
      candidate.record.hasHashes = status == Status::Ok;
    }
    if (status != Status::Ok) return Fail(candidate, status);
    candidate.record.width = picture->width;
    candidate.record.height = picture->height;
  }

  // Pictures of unique size have no identical ones.
  void FindLonely() {
    std::map<std::pair<int32_t, int32_t>, size_t> sizes;
    const auto sizeOf = [](const Candidate& candidate) {
      // ignores orientation, which may swap width and height
      return std::minmax({candidate.record.width, candidate.record.height});
    };
    for (const Candidate& candidate : candidates_)
      ++sizes[std::pair<int32_t, int32_t>(sizeOf(candidate))];
    lonely_.clear();
    for (const Candidate& candidate : candidates_)
      lonely_.push_back(sizes[std::pair<int32_t, int32_t>(sizeOf(candidate))] < 2);
  }

  void Digest(Candidate& candidate) const {
    const auto place = static_cast<size_t>(&candidate - candidates_.data());
    if (lonely_[place] || !candidate.record.digest.empty()) return;
    PicturePointer picture;
    Status status = LoadPicture({.fileName = candidate.name, .options = read_}, picture);
    if (status == Status::Ok) status = TurnUpright(*picture);
    if (status == Status::Ok) status = DigestPixels(*picture, candidate.record.digest);
    if (status != Status::Ok) return Fail(candidate, status);
    candidate.record.width = picture->width;  // upright
    candidate.record.height = picture->height;
    candidate.known = false;  // to be saved
  }

  static void Fail(Candidate& candidate, Status status) {
    candidate.status = status;
    candidate.hint = OpenHint(candidate.name, status);
  }

  void Report() {
    std::vector<size_t> places;  // of the readable files
    std::vector<PictureHashes> hashes;
    std::vector<std::string> digests;
    for (size_t i = 0; i < candidates_.size(); ++i) {
      const Candidate& candidate = candidates_[i];
      if (candidate.status != Status::Ok) {
        output_.Failure(candidate.name, candidate.status, candidate.hint);
        continue;
      }
      output_.CountFile();
      places.push_back(i);
      hashes.push_back(candidate.record.hashes);
      digests.push_back(candidate.record.digest);
    }
    const auto groups = options_.exact
                            ? FindEqual(digests)
                            : FindSimilar(hashes, options_.distance, options_.transforms,
                                          [this] { return output_.GoesOn(); });
    for (const SimilarGroup& group : groups) Print(group, places);
  }

  void Print(const SimilarGroup& group, const std::vector<size_t>& places) {
    Json files = Json::array();
    if (!output_.IsJson() && printed_++ > 0) output_.Line("");
    for (const size_t member : group.members) {
      const Candidate& candidate = candidates_[places[member]];
      const HashRecord& record = candidate.record;
      if (!output_.IsJson()) {
        output_.Line(output_.Shown(candidate.name) + "  " + std::to_string(record.width) + " x " +
                     std::to_string(record.height) + "  " + std::to_string(record.size));
        continue;
      }
      Json file;
      PutName(file, "file", candidate.name);
      file["width"] = record.width;
      file["height"] = record.height;
      file["bytes"] = record.size;
      files.push_back(std::move(file));
    }
    if (output_.IsJson())
      output_.Element({{"distance", group.distance}, {"files", std::move(files)}});
  }

  const SimilarOptions& options_;
  ResultOutput output_;
  HashStore store_;
  const ReadOptions read_;
  std::vector<Candidate> candidates_;
  std::vector<char> lonely_;
  uint64_t done_ = 0;
  size_t printed_ = 0;
  bool complained_ = false;
};

int RunSimilar(SimilarOptions options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  if (options.distance < 0)
    options.distance = std::clamp(settings.FindSimlarDistance, 0, kMostDistance);
  options.transforms = options.transforms || settings.FindSimilarTransforms != 0;
  return Search(options, context).Run(*selection);
}

}  // namespace

void SetUpSimilar(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<SimilarOptions>();
  options->distance = -1;  // use settings
  AddSelection(app, options->selection, context);
  AddNumber(app, "--distance", options->distance, "N", 0, kMostDistance,
            "How many of 64 bits may differ (default: the key FindSimlarDistance)");
  AddFlag(app, "--transforms", options->transforms, "Also find rotated or mirrored copies");
  AddFlag(app, "--exact", options->exact, "Only find pictures with identical pixels");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {distance, files: [{file, width, height, bytes}]}");
  SetFooter(app,
            "Prints groups of files, with size in pixels and in bytes. Results are stored in the "
            "data folder, so a second search does not read the pictures again.",
            "fotomill similar -r --distance 6 holiday");
  context.run = [options, &context] { return RunSimilar(*options, context); };
}

}  // namespace fotomill::cli
