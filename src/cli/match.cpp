#include "cli/match.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "picture/registry.h"

namespace fotomill::cli {

namespace {

struct MatchOptions {
  std::vector<std::string> names;
  bool json = false;
};

int RunMatch(const MatchOptions& options, const Io& io) {
  for (const std::string& name : options.names) {
    std::fprintf(io.out, "%s\t%s\n", name.c_str(), DescribeFileType(name).c_str());
  }
  return kExitOk;
}

}  // namespace

void SetUpMatch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<MatchOptions>();
  app.add_option("NAME", options->names, "File names; they need not exist")->required();
  app.add_flag("--json", options->json, "One JSON array");
  app.footer("Example: fotomill match scan.tiff photo.jpeg");
  app.callback([options, &context] { context.exitStatus = RunMatch(*options, context.io); });
}

}  // namespace fotomill::cli
