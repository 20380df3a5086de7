#include "desktop/models/edit/quick_actions.h"

#include <iterator>

#include "desktop/models/batch/named_sizes.h"
#include "desktop/models/edit/operation_memory.h"
#include "operations/operations.h"
#include "operations/recipe.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr struct {
  const char* operation;
  const char* text;
} kActions[] = {
    {"auto-levels", TrLater("Auto &levels")},
    {"caption", TrLater("&Caption")},
    {"watermark", TrLater("&Watermark")},
};

}  // namespace

std::vector<QuickAction> QuickActions() {
  std::vector<QuickAction> actions;
  for (const NamedSize& size : SizeSettings())
    actions.push_back(
        {size.step.empty() ? Tr("Resize (no size set)") : Tr("Resize to %1", size.text)});
  for (const auto& action : kActions)
    actions.push_back({Tr(action.text), &action == std::begin(kActions)});
  return actions;
}

std::string QuickRecipe(size_t place) {
  const std::vector<NamedSize> sizes = SizeSettings();
  if (place < sizes.size()) return sizes[place].step;
  const Operation& operation = *FindOperation(kActions[place - sizes.size()].operation);
  return PrintStep(OperationMemory().Start(operation));
}

}  // namespace fotomill::desktop
