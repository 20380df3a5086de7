#include "cli/commands/search/find.h"

#include <algorithm>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "batch/picture_failure.h"
#include "catalog/search/picture_search.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "core/data_folder.h"
#include "platform/folders.h"
#include "processing/faces/face_finder.h"
#include "registry/registry.h"
#include "settings/search_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct FindOptions {
  SelectionOptions selection;
  SearchCriteria criteria;
  std::string rating, size, width, height, taken;  // ranges
  std::string format;
  bool json = false;
};

// A range option with its parser.
struct RangeOption {
  const char* name;
  std::string FindOptions::*text;
  std::optional<NumberRange> SearchCriteria::*range;
  std::optional<NumberRange> (*parse)(std::string_view text);
  const char* form;  // for messages
};
constexpr RangeOption kRanges[] = {
    {"--rating", &FindOptions::rating, &SearchCriteria::rating, ParseNumberRange, "3..5"},
    {"--size", &FindOptions::size, &SearchCriteria::size, ParseSizeRange, "500k..2M"},
    {"--width", &FindOptions::width, &SearchCriteria::width, ParseNumberRange, "1024.."},
    {"--height", &FindOptions::height, &SearchCriteria::height, ParseNumberRange, "1024.."},
    {"--taken", &FindOptions::taken, &SearchCriteria::taken, ParseDateRange, "2024-05..2025"},
};

// Parses the options that the parser left as texts. Returns an error message, empty if valid.
std::string ReadCriteria(FindOptions& options) {
  for (const RangeOption& row : kRanges) {
    const std::string& text = options.*row.text;
    if (text.empty()) continue;
    options.criteria.*row.range = row.parse(text);
    if (!(options.criteria.*row.range))
      return Tr("%1: \"%2\" is not a range like %3.", row.name, text, row.form);
  }
  if (options.format.empty()) return {};
  std::string extension;
  const std::string wrong = ReadSourceFormat(options.format, extension);
  if (wrong.empty())
    options.criteria.formats = ExtensionsOfFormat(FindReaderByName("x." + extension));
  return wrong;
}

// "2004-08-31 22:32:08"; null if unknown.
Json TakenText(int64_t taken) {
  if (taken <= 0) return nullptr;
  std::string text = std::to_string(taken);
  text.insert(0, 14 - std::min<size_t>(text.size(), 14), '0');
  for (const auto& [place, mark] : {std::pair(12, ':'), {10, ':'}, {8, ' '}, {6, '-'}, {4, '-'}})
    text.insert(static_cast<size_t>(place), 1, mark);
  return text;
}

Json ElementOf(const std::string& name, const ExaminedFile& file) {
  const PictureFacts& facts = file.facts;
  Json element;
  PutName(element, "file", name);
  element["bytes"] = file.state.size;
  if ((facts.parts & kFactsHeader) != 0) {
    element["format"] = facts.format;
    element["width"] = facts.width;
    element["height"] = facts.height;
  }
  if ((facts.parts & kFactsTags) != 0) {
    const PictureTags& tags = facts.tags;
    element["taken"] = TakenText(tags.taken);
    element["camera"] = tags.camera;
    element["title"] = tags.title;
    element["description"] = tags.description;
    element["comment"] = tags.comment;
    element["keywords"] = tags.keywords;
    element["rating"] = tags.rating;
    element["label"] = tags.label;
  }
  if ((facts.parts & kFactsFaces) != 0) element["faces"] = facts.faces;
  const bool decoded = (facts.parts & kFactsDamage) != 0;
  PutStatus(element, decoded ? facts.decoded : facts.header);
  return element;
}

class Find {
 public:
  Find(const FindOptions& options, const CommandContext& context)
      : json_(options.json), output_(context, options.json) {}

  int Run(const FindOptions& options, const Selection& selection) {
    output_.CloseWith(selection.leftOut);
    const FactsOptions facts = FactsOptionsFromSettings();
    if (options.criteria.faces && !CanFindFaces(facts.faces)) {
      output_.Message(std::string("fotomill: ") + Tr("The face detector is not installed."));
      return kExitFailed;
    }
    TakeFiles(selection.files);
    PictureIndex index(DataFile(kPictureIndexName));
    PictureSearch search(options.criteria, json_ ? kFactsTags | kFactsHeader : 0, facts, index);
    output_.Expect(paths_.size());
    search.Run(paths_, {.examined = [this](size_t i, const ExaminedFile& file) { Report(i, file); },
                        .hint = OpenHint,
                        .goesOn = [this] { return output_.GoesOn(); },
                        .tick = [this] { output_.Tick(); }});
    output_.EndArray();
    const std::string store = output_.ShownMessage(DataFile(kPictureIndexName));
    if (!index.SetAside().empty()) {
      output_.Note(Tr("\"%1\" was damaged; it is kept as \"%2\".", store,
                      output_.ShownMessage(index.SetAside())));
    }
    if (!search.Kept()) output_.Note(Tr("Results cannot be stored in \"%1\".", store));
    output_.Note(TrCount("%1 picture was found.", "%1 pictures were found.", found_));
    return std::max(output_.Finish(), found_ == 0 ? kExitFailed : kExitOk);
  }

 private:
  // Reports files that cannot be searched; ignores repeated names.
  void TakeFiles(const std::vector<SelectedFile>& files) {
    std::set<std::string> seen;
    for (const SelectedFile& file : files) {
      std::string path = platform::AbsolutePath(file.name);
      if (file.status != Status::Ok) {
        output_.Failure(file.name, file.status, file.hint);
      } else if (seen.insert(path).second) {
        names_.push_back(&file.name);
        paths_.push_back(std::move(path));
      }
    }
  }

  void Report(size_t i, const ExaminedFile& file) {
    const std::string& name = *names_[i];
    if (file.found && json_) output_.Element(ElementOf(name, file));
    if (file.found && !json_) output_.Line(output_.Shown(name));
    found_ += file.found ? 1 : 0;
    if (file.status != Status::Ok) return output_.Failure(name, file.status, file.hint);
    output_.CountFile();
  }

  const bool json_;
  ResultOutput output_;
  std::vector<std::string> paths_;
  std::vector<const std::string*> names_;  // as given, in the same order
  uint64_t found_ = 0;
};

int RunFind(FindOptions options, const CommandContext& context) {
  const std::string wrong = ReadCriteria(options);
  if (!wrong.empty()) return UsageError(context, wrong);
  if (options.criteria == SearchCriteria()) options.criteria = SearchCriteriaFromSettings();
  const auto selection = SelectFiles(options.selection, context);
  return selection ? Find(options, context).Run(options, *selection) : kExitUsage;
}

}  // namespace

void SetUpFind(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<FindOptions>();
  AddSelection(app, options->selection, context);
  SearchCriteria& criteria = options->criteria;
  AddName(app, "--name", criteria.name, "PATTERN",
          "Part of the file name, or a pattern with * and ?");
  AddName(app, "--comment", criteria.comment, "TEXT", "Part of title, description or comment");
  AddRepeatedText(app, "--keyword", criteria.keywords, "TEXT",
                  "A keyword, or a pattern with * and ?; repeat it for several");
  AddName(app, "--text", criteria.text, "TEXT",
          "Part of the name or of any text: title, keyword, camera, place, ...");
  AddName(app, "--camera", criteria.camera, "TEXT", "Part of the camera's maker and model");
  AddName(app, "--rating", options->rating, "RANGE", "Stars, 0 to 5: 3.., ..2, 4");
  AddName(app, "--label", criteria.label, "TEXT", "Color label");
  AddName(app, "--taken", options->taken, "RANGE",
          "When taken: 2024, 2024-05..2024-07-15, 2025-01-01..");
  AddName(app, "--size", options->size, "RANGE", "Bytes: 500k..2M, 10M..");
  AddName(app, "--width", options->width, "RANGE", "Width in pixels");
  AddName(app, "--height", options->height, "RANGE", "Height in pixels");
  AddName(app, "--format", options->format, "EXT", "Format, by its extension");
  AddFlag(app, "--faces", criteria.faces, "Pictures with faces");
  AddFlag(app, "--damaged", criteria.damaged, "Files that cannot be decoded completely");
  AddFlag(app, "--any", criteria.any, "Find pictures that meet any of these, not all");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, bytes, format, width, height, taken, camera, title, "
          "description, comment, keywords, rating, label, status, message}");
  SetFooter(app,
            "Prints the names of the pictures found; the exit status is 1 if there are none. If no "
            "criteria are given, those of the PictureSearch keys apply. What was read is stored in "
            "the data folder, so a second search reads only files that have changed.",
            "fotomill find -r --keyword sea --rating 3.. --taken 2024..2025 holiday");
  context.run = [options, &context] { return RunFind(*options, context); };
}

}  // namespace fotomill::cli
