#include "cli/commands/pages/pages.h"

#include <cstdlib>
#include <deque>
#include <memory>
#include <utility>

#include "cli/commands/pages/page_command.h"
#include "cli/frame/options.h"

namespace fotomill::cli {

namespace {

// Where the parser puts the value of an option.
struct Variable {
  const PageOption* option = nullptr;
  std::string text;
  std::vector<std::string> texts;
  int32_t number = 0;
  bool flag = false;

  std::string Value() const {
    switch (option->kind) {
      case PageOptionKind::Flag: return flag ? "yes" : "";
      case PageOptionKind::Number: return std::to_string(number);
      case PageOptionKind::Texts: break;
      default: return text;
    }
    std::string all;
    for (const std::string& one : texts) all += (all.empty() ? "" : ",") + one;
    return all;
  }
};

struct KindCommand : PageCommandOptions {
  std::deque<Variable> variables;
};

void AddOption(CLI::App& app, const PageOption& option, KindCommand& command) {
  Variable& variable = command.variables.emplace_back();
  variable.option = &option;
  variable.text = option.usual;
  const std::string name = std::string("--") + option.name;
  switch (option.kind) {
    case PageOptionKind::Flag: AddFlag(app, name.c_str(), variable.flag, option.help); return;
    case PageOptionKind::Text:
      AddText(app, name.c_str(), variable.text, option.shownAs, option.help);
      return;
    case PageOptionKind::Texts:
      AddRepeatedText(app, name.c_str(), variable.texts, option.shownAs, option.help);
      return;
    case PageOptionKind::Number:
      variable.number = std::atoi(option.usual);
      AddNumber(app, name.c_str(), variable.number, option.shownAs, option.least, option.most,
                option.help);
      return;
    case PageOptionKind::Choice:
      AddChoice(app, name.c_str(), variable.text, option.shownAs, option.help, option.choices);
      return;
  }
}

int RunKind(const PageKind& kind, const KindCommand& command, const CommandContext& context) {
  PageValues values;
  for (const Variable& variable : command.variables)
    values.Set(variable.option->name, variable.Value());
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
  for (const PageOption& option : SharedPageOptions()) AddOption(app, option, *command);
  for (const PageOption& option : kind.options) AddOption(app, option, *command);
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
