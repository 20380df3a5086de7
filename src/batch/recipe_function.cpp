#include "batch/recipe_function.h"

#include <algorithm>
#include <utility>

#include "metadata/exif/picture_exif.h"
#include "operations/engine.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// State shared by the steps of all outputs.
struct RecipeRun {
  std::shared_ptr<const Recipe> recipe;
  std::string copyrightHolder;
  FaceOptions faces;
  uint32_t threads = 0;
  StopToken stop;

  MacroFacts FactsOf(const std::string& source) const {
    return {.fileName = source,
            .copyrightHolder = copyrightHolder,
            .modified = platform::FactsOf(source).modified};
  }
  Status Apply(PictureRecord& picture, std::span<const Step> steps) const {
    if (steps.empty()) return Status::Ok;
    return ApplySteps(picture, steps,
                      {.work = {.threads = threads, .goesOn = [this] { return !stop.Asked(); }},
                       .facts = FactsOf(std::string(picture.fileName.view())),
                       .faces = faces});
  }
};

// The only step that receives the decoded picture, if there is just one.
const Step* FirstStep(const Recipe& recipe) {
  if (!recipe.common.empty()) return &recipe.common.front();
  const bool one = recipe.outputs.size() == 1 && !recipe.outputs.front().steps.empty();
  return one ? &recipe.outputs.front().steps.front() : nullptr;
}

// The size that the first step needs; see ReadRequest::thumbnailSide.
int32_t DecodedSide(const Step& first, const PictureRecord& facts) {
  constexpr int32_t kLeastEdge = 512;  // smaller pictures are decoded fast enough
  constexpr int32_t kBlock = 8;        // for other sizes, a reduced decode ends with partial pixels
  // JPEG only: in other formats, embedded smaller pictures may look different.
  if (facts.formatIndex == kNoFormat || !FormatRow(facts.formatIndex).turnsWithoutLoss) return 0;
  if ((facts.unread & kUnreadInks) != 0) return 0;  // averages of inks and colors differ
  if (std::max(facts.width, facts.height) < kLeastEdge) return 0;
  const Orientation orientation = OrientationOf(facts);
  const bool whole = facts.width % kBlock == 0 && facts.height % kBlock == 0;
  if (orientation != Orientation::Upright && !whole) return 0;  // partial pixels would come first
  Size size{facts.width, facts.height};
  if (SwapsSides(orientation)) {
    if (facts.metadata.dpiX != facts.metadata.dpiY) return 0;  // these are swapped as well
    std::swap(size.width, size.height);
  }
  return first.operation->decodedSide(first.arguments, size, facts.metadata);
}

std::string ReadFormat(const SaveStep& save, const BatchJob& job, const FormatLookup& lookup,
                       BatchOutput& output) {
  // The command line overrides the recipe.
  if (job.formatIndex == kNoFormat && !save.to.empty()) {
    if (std::string wrong = lookup(save.to, output.formatIndex, output.extension); !wrong.empty())
      return wrong;
  }
  const std::string& format = job.formatIndex != kNoFormat ? job.extension : output.extension;
  const bool lossy = format.empty() || HasQuality(format);
  if (save.mostBytes > 0 && !lossy)
    return Tr("max-bytes needs a format with a quality, such as jpg or webp; not %1.", format);
  return {};
}

}  // namespace

bool HasQuality(std::string_view extension) { return extension == "JPG" || extension == "WEBP"; }

FileFunction FunctionOfFamily(Family family) {
  constexpr FileFunction kFunctions[] = {
      FileFunction::Crop,     FileFunction::Transform, FileFunction::Effects, FileFunction::Filter,
      FileFunction::Annotate, FileFunction::Watermark, FileFunction::Matt};
  return kFunctions[static_cast<size_t>(family)];
}

std::string SetRecipe(std::shared_ptr<const Recipe> recipe, const std::string& copyrightHolder,
                      const BatchJob& job, const FormatLookup& lookup, BatchFunction& function) {
  const auto run = std::make_shared<RecipeRun>(RecipeRun{
      recipe, copyrightHolder, job.faces, function.jobs == 1 ? 1u : 0u, job.stop.Token()});
  function.transform = [run](PictureRecord& picture) {
    return run->Apply(picture, run->recipe->common);
  };
  function.autoOrient = function.autoOrient || recipe->HasSteps();
  const Step* const first = FirstStep(*recipe);
  if (first != nullptr && first->operation->decodedSide != nullptr)
    function.decodedSide = [run, first](const PictureRecord& facts) {
      return DecodedSide(*first, facts);
    };
  for (size_t i = 0; i < recipe->outputs.size(); ++i) {
    const RecipeOutput& wanted = recipe->outputs[i];
    BatchOutput& output = function.outputs.emplace_back();
    output.label = wanted.name;
    output.folder = wanted.save.folder;
    output.quality = wanted.save.quality;
    output.mostBytes = wanted.save.mostBytes;
    output.transform = [run, i](PictureRecord& picture) {
      return run->Apply(picture, run->recipe->outputs[i].steps);
    };
    if (!wanted.save.name.empty()) {
      output.nameNeedsPicture = !IsKnownEarly(wanted.save.name);
      output.name = [run, i](const std::string& source, const PictureRecord* picture) {
        static const PictureRecord kNone;
        return ExpandNameMacros(run->recipe->outputs[i].save.name, run->FactsOf(source),
                                picture != nullptr ? *picture : kNone);
      };
    }
    if (std::string wrong = ReadFormat(wanted.save, job, lookup, output); !wrong.empty())
      return wrong;
  }
  return {};
}

}  // namespace fotomill
