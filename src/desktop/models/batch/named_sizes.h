#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// A size offered by the function Resize.
struct NamedSize {
  std::string text;  // "640 x 480"
  std::string step;  // recipe step: "resize 640x480"
};

// The sizes in the settings Transform320 to Transform1280, in this order. Settings that are not
// WIDTH,HEIGHT are skipped.
std::vector<NamedSize> NamedSizes();

}  // namespace fotomill::desktop
