#include "cli/match.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "picture/registry.h"

namespace fotomill::cli {

namespace {

struct MatchOptions {
  bool json = false;
};

int RunMatch(const MatchOptions&, const CommandContext& context) {
  for (const std::string& name : context.names.values) {
    std::fprintf(context.io.out, "%s\t%s\n", name.c_str(), DescribeFileType(name).c_str());
  }
  return kExitOk;
}

}  // namespace

void SetUpMatch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<MatchOptions>();
  context.names.Declare("NAME...", "File names; they need not exist", 1);
  app.add_flag("--json", options->json, "One JSON array: {name, index, extension, typeName}");
  app.footer("Example: fotomill match scan.tiff photo.jpeg");
  context.run = [options, &context] { return RunMatch(*options, context); };
}

}  // namespace fotomill::cli
