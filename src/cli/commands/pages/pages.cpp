#include "cli/commands/pages/pages.h"

#include <memory>
#include <utility>

#include "cli/commands/pages/option_variables.h"
#include "cli/commands/pages/page_command.h"
#include "cli/frame/options.h"

namespace fotomill::cli {

namespace {

struct KindCommand : PageCommandOptions {
  OptionVariables variables;
};

int RunKind(const PageKind& kind, const KindCommand& command, const CommandContext& context) {
  PageValues values = command.variables.Values();
  if (command.dpi > 0) values.Set("dpi", std::to_string(command.dpi));
  PagePlan plan;
  if (const std::string wrong = PlanPages(kind, values, plan); !wrong.empty())
    return UsageError(context, wrong);
  return RunPages(command, std::move(plan), context);
}

void SetUp(CLI::App& app, CommandContext& context, const char* name, const char* notes,
           const char* example) {
  const PageKind& kind = PageKindOf(name);
  auto command = std::make_shared<KindCommand>();
  AddPageOutput(app, *command, context);
  command->variables.Add(app, SharedPageOptions());
  command->variables.Add(app, kind.options);
  SetFooter(app, notes, example);
  context.run = [command, &kind, &context] { return RunKind(kind, *command, context); };
}

}  // namespace

void SetUpPagesContact(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "contact",
        TrLater("In PDF, each picture has a bookmark, and names can be searched. CatalogFontName "
                "sets the font."),
        "fotomill pages contact holiday -r --out sheets.pdf --grid 4x6");
}

void SetUpPagesCatalog(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "catalog",
        TrLater("GrafcatBackground, GrafcatFontName and GrafcatFrameTitle set page color, font, "
                "and names in a bar above the pictures."),
        "fotomill pages catalog paintings -r --details \"%D, %W x %H\" --out catalog.pdf");
}

void SetUpPagesPhoto(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "photo",
        TrLater("Prints are turned like their pictures, but not passport and ID sizes, and packed "
                "on as few sheets as possible. PhotoPrnMargin, PhotoPrnCutlineEnable and "
                "PhotoPrnCutlineColor set the defaults."),
        "fotomill pages photo anna.jpg --size 10x15cm --size 4:passport --out prints.pdf");
}

void SetUpPagesPrint(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "print",
        TrLater("Macros are those of operations, such as %F for the file name. The keys Print... "
                "and PrintWorkshop... set fonts, colors and defaults."),
        "fotomill pages print sunset.jpg --size 13x18cm --crop-marks --out sunset.pdf");
}

void SetUpPagesPoster(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "poster",
        TrLater("Dashed ticks beside a sheet show where the edge of the next one goes. Cut lines "
                "have the color PrintPosterCutlineColor."),
        "fotomill pages poster sunset.jpg --size 80x60cm --out poster.pdf");
}

void SetUpPagesCube(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "cube",
        TrLater("The first six pictures are on top, front, bottom, back, left and right; fewer are "
                "repeated. The PrintDodec... keys set colors and lines."),
        "fotomill pages cube family -r --size 5cm --out cube.pdf");
}

void SetUpPagesDodecahedron(CLI::App& app, CommandContext& context) {
  SetUp(app, context, "dodecahedron",
        TrLater("Two pages with six faces each; fewer than twelve pictures are repeated. The "
                "PrintDodec... keys set colors and lines."),
        "fotomill pages dodecahedron months/*.jpg --out calendar.pdf");
}

}  // namespace fotomill::cli
