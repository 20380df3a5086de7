#include "cli/frame/recipe_text.h"

#include "operations/recipe_library.h"
#include "settings/key_texts.h"
#include "texts/texts.h"

namespace fotomill::cli {

bool ReadRecipeOptions(const RecipeOptions& options, const CommandContext& context,
                       std::shared_ptr<const Recipe>& recipe) {
  const bool given = !options.steps.empty() || !options.recipe.empty();
  if (!given && !options.needed) return true;
  std::string text = options.steps, path, wrong;
  if (!given) wrong = Tr("Name operations with --do, or a recipe with --recipe.");
  if (!options.recipe.empty()) wrong = FindRecipe(options.recipe, text, path);
  auto read = std::make_shared<Recipe>();
  if (wrong.empty()) {
    const bool lines = text.find('\n') != std::string::npos;
    for (const Mistake& mistake : ReadRecipe(text, KeyTextInForce, *read))
      wrong += (wrong.empty() ? "" : "\n") + mistake.Text(lines);
  }
  if (!wrong.empty()) {
    UsageError(context, wrong);
    return false;
  }
  recipe = std::move(read);
  return true;
}

}  // namespace fotomill::cli
