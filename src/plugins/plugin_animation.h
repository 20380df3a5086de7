#pragma once

#include <cstdint>
#include <vector>

#include "picture/animation.h"
#include "picture/read_request.h"

namespace fotomill {

// What an animation of a plug-in format consists of.
struct PluginFrames {
  int32_t width = 0, height = 0;
  int32_t rounds = 0;           // times it plays, 0 for endless
  std::vector<int32_t> delays;  // milliseconds, at least one
};
// Statuses as PluginInfo.
Status DescribePluginFrames(const ReadRequest& request, PluginFrames& frames);

// The operation of the spare row: opens a file of a plug-in format frame by frame.
Status PluginAnimate(const ReadRequest& request, AnimationPointer& animation);

}  // namespace fotomill
