#include <algorithm>
#include <memory>

#include "cli/commands/pages/pages.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "pages/model/paper.h"

namespace fotomill::cli {

namespace {

struct PapersCommand {
  bool json = false;
};

std::string Millimeters(double length) {
  std::string text = std::to_string(static_cast<int64_t>(length * 10 + 0.5));
  if (text.size() < 2) text.insert(0, 1, '0');
  const char tenth = text.back();
  text.pop_back();
  return tenth == '0' ? text : text + "." + tenth;
}

int RunPapers(const PapersCommand& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  const auto list = [&](const char* kind, std::span<const NamedSize> sizes) {
    for (const NamedSize& named : sizes) {
      if (output.IsJson()) {
        output.Element({{"name", named.name},
                        {"kind", kind},
                        {"width", named.size.width},
                        {"height", named.size.height}});
        continue;
      }
      std::string line = named.name;
      line.resize(std::max<size_t>(line.size(), 12), ' ');
      output.Line(line + " " + kind + "  " + Millimeters(named.size.width) + " x " +
                  Millimeters(named.size.height) + " mm");
    }
  };
  list("paper", Papers());
  list("print", PrintSizes());
  output.EndArray();
  return kExitOk;
}

}  // namespace

void SetUpPagesPapers(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PapersCommand>();
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {name, kind, width, height}, in millimeters");
  SetFooter(app, nullptr, "fotomill pages papers");
  context.run = [options, &context] { return RunPapers(*options, context); };
}

}  // namespace fotomill::cli
