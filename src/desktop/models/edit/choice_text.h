#pragma once

#include <string>
#include <string_view>

#include "operations/recipe.h"

namespace fotomill::desktop {

// A word of a choice as windows show it, translated: "top-left" is "Top left". Recipes and the
// command line keep the word itself.
std::string ChoiceText(std::string_view word);

// "Blur: sigma 3": the label of a step with the values that are not defaults.
std::string StepText(const Step& step);

}  // namespace fotomill::desktop
