#pragma once

namespace CLI {
class App;
}

namespace fotomill::cli {

struct CommandContext;

// "similar": groups of pictures that look alike, or are equal pixel by pixel.
void SetUpSimilar(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
