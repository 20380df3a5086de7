#pragma once

namespace CLI {
class App;
}

namespace fotomill::cli {

struct CommandContext;

// Command "similar": finds groups of pictures that look alike or have identical pixels.
void SetUpSimilar(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
