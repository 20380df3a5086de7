#include "cli/commands/turn.h"

#include <algorithm>
#include <memory>
#include <string>

#include "batch/rewrite/turn_run.h"
#include "cli/frame/options.h"
#include "cli/selection/rewrite_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct TurnOptions {
  RewriteOptions rewrite;
  std::string rotate, flip;
  bool byExif = false;
  bool trim = false;
};

struct NamedTurn {
  const char* name;
  Orientation turn;
};
constexpr NamedTurn kTurnNames[] = {{"right", Orientation::QuarterRight},
                                    {"left", Orientation::QuarterLeft},
                                    {"180", Orientation::HalfTurn},
                                    {"horizontal", Orientation::MirrorAcross},
                                    {"vertical", Orientation::MirrorDown}};

Orientation TurnNamed(const std::string& name) {
  const auto* found =
      std::ranges::find_if(kTurnNames, [&](const NamedTurn& turn) { return name == turn.name; });
  return found == std::end(kTurnNames) ? Orientation::Upright : found->turn;
}

int RunTurnCommand(TurnOptions options, const CommandContext& context) {
  if (options.rotate.empty() && options.flip.empty() && !options.byExif)
    return UsageError(context, Tr("Choose --rotate, --flip or --by-exif."));
  const auto selection = SelectForRewrite(options.rewrite, context);
  if (!selection) return kExitUsage;
  const RewriteFunction rewrite = RewriteFunctionOf(options.rewrite);
  const TurnFunction function{
      .request = {.turn = Composed(TurnNamed(options.rotate), TurnNamed(options.flip)),
                  .seenByExif = options.byExif || settings.ExifAdjustOrientation != 0,
                  .trim = options.trim,
                  .keepTime = rewrite.keepTimes,
                  .dryRun = rewrite.dryRun},
      .inPlace = rewrite.inPlace,
      .out = rewrite.out,
      .keepTree = rewrite.keepTree,
      .jobs = rewrite.jobs};
  return RunRewriteJob(options.rewrite, *selection, context, [&](BatchJob& job) {
    (void)RunTurn(selection->files, function, job);  // TerminalBox always opens
  });
}

}  // namespace

void SetUpTurn(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TurnOptions>();
  AddSelection(app, options->rewrite.selection, context);
  AddChoice(app, "--rotate", options->rotate, "HOW",
            "Rotate by 90 degrees left or right, or by 180", {"left", "right", "180"});
  AddChoice(app, "--flip", options->flip, "HOW",
            "Mirror: horizontal or vertical; applied after --rotate", {"horizontal", "vertical"});
  AddFlag(app, "--by-exif", options->byExif,
          "Rotate upright by EXIF orientation, before --rotate and --flip");
  AddFlag(app, "--trim", options->trim, "Crop JPEG edges that cannot be rotated losslessly");
  AddRewriteOptions(app, options->rewrite);
  SetFooter(app,
            "JPEG pictures are rotated losslessly. If the size is not a multiple of the block size "
            "(8 or 16 pixels), only the\nEXIF orientation is changed and a message says so; --trim "
            "crops the edges instead. Files of other formats are\nrewritten if no pixel changes.",
            "fotomill turn --by-exif --in-place holiday -r");
  context.run = [options, &context] { return RunTurnCommand(*options, context); };
}

}  // namespace fotomill::cli
