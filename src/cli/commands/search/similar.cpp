#include "cli/commands/search/similar.h"

#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "batch/picture_failure.h"
#include "catalog/similar/hash_store.h"
#include "catalog/similar/similar_search.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "core/data_folder.h"
#include "platform/folders.h"
#include "settings/search_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct CommandOptions {
  SelectionOptions selection;
  SimilarOptions similar{.distance = -1};  // use settings
  bool json = false;
};

class Similar {
 public:
  Similar(const CommandOptions& options, const CommandContext& context)
      : output_(context, options.json),
        store_(DataFile(kHashStoreName)),
        search_(options.similar, store_) {}

  int Run(const Selection& selection) {
    output_.CloseWith(selection.leftOut);
    const std::string store = output_.ShownMessage(DataFile(kHashStoreName));
    if (!store_.SetAside().empty()) {
      output_.Note(Tr("\"%1\" was damaged; it is kept as \"%2\".", store,
                      output_.ShownMessage(store_.SetAside())));
    }
    std::set<std::string> seen;  // ignores repeated names
    for (const SelectedFile& file : selection.files) {
      if (!seen.insert(platform::AbsolutePath(file.name)).second) continue;
      files_.push_back({.name = file.name, .status = file.status, .hint = file.hint});
    }
    const auto goesOn = [this] { return output_.GoesOn(); };
    search_.Read(files_, {.hint = OpenHint,
                          .goesOn = goesOn,
                          .tick = [this] { output_.Tick(); },
                          .progress = [this](uint64_t done, uint64_t total) {
                            output_.ShowProgress(done, total);
                          }});
    if (!search_.Kept()) output_.Note(Tr("Results cannot be stored in \"%1\".", store));
    if (output_.GoesOn()) {
      for (const ComparedFile& file : files_) Count(file);
      const std::vector<SimilarGroup> groups = search_.Group(files_, goesOn);
      if (!output_.GoesOn()) return output_.Finish();
      for (const SimilarGroup& group : groups) Print(group);
    }
    return output_.Finish();
  }

 private:
  void Count(const ComparedFile& file) {
    if (file.status != Status::Ok) return output_.Failure(file.name, file.status, file.hint);
    output_.CountFile();
  }

  void Print(const SimilarGroup& group) {
    Json files = Json::array();
    if (!output_.IsJson() && printed_++ > 0) output_.Line("");
    for (const size_t member : group.members) {
      const std::string& name = files_[member].name;
      const HashRecord& record = files_[member].record;
      if (!output_.IsJson()) {
        output_.Line(output_.Shown(name) + "  " + std::to_string(record.width) + " x " +
                     std::to_string(record.height) + "  " + std::to_string(record.size));
        continue;
      }
      Json file;
      PutName(file, "file", name);
      file["width"] = record.width;
      file["height"] = record.height;
      file["bytes"] = record.size;
      files.push_back(std::move(file));
    }
    if (output_.IsJson())
      output_.Element({{"distance", group.distance}, {"files", std::move(files)}});
  }

  ResultOutput output_;
  HashStore store_;
  SimilarSearch search_;
  std::vector<ComparedFile> files_;
  size_t printed_ = 0;
};

int RunSimilar(CommandOptions options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  const SimilarOptions usual = SimilarOptionsFromSettings();
  if (options.similar.distance < 0) options.similar.distance = usual.distance;
  options.similar.transforms = options.similar.transforms || usual.transforms;
  options.similar.read = usual.read;
  return Similar(options, context).Run(*selection);
}

}  // namespace

void SetUpSimilar(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<CommandOptions>();
  AddSelection(app, options->selection, context);
  AddNumber(app, "--distance", options->similar.distance, "N", 0, kMostDistance,
            "How many of 64 bits may differ (default: the key FindSimlarDistance)");
  AddFlag(app, "--transforms", options->similar.transforms, "Also find rotated or mirrored copies");
  AddFlag(app, "--exact", options->similar.exact, "Only find pictures with identical pixels");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {distance, files: [{file, width, height, bytes}]}");
  SetFooter(app,
            "Prints groups of files, with size in pixels and in bytes. Results are stored in the "
            "data folder, so a second search does not read the pictures again.",
            "fotomill similar -r --distance 6 holiday");
  context.run = [options, &context] { return RunSimilar(*options, context); };
}

}  // namespace fotomill::cli
