#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// A change that is made to pictures at once, with values that are already known.
struct QuickAction {
  std::string text;          // for the menu: "Resize to 640 x 480"
  bool startsGroup = false;  // a separator goes before it
};

// The quick actions in menu order: the sizes of the settings, then operations with the values that
// were applied last. Their number does not depend on settings.
std::vector<QuickAction> QuickActions();

// The recipe of an action; empty if its size is not set. `place` is its index in QuickActions.
std::string QuickRecipe(size_t place);

}  // namespace fotomill::desktop
