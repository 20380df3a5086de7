#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// A size that the function Resize offers.
struct NamedSize {
  std::string text;  // "640 x 480"
  std::string step;  // of a recipe: "resize 640x480"
};

// The sizes of the settings Transform320 to Transform1280, in their order. Settings that are not
// WIDTH,HEIGHT are left out.
std::vector<NamedSize> NamedSizes();

}  // namespace fotomill::desktop
