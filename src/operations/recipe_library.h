#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Recipes by name: files "NAME.recipe" in the folder "recipes" of the data folder, and those built
// into the program. Files take precedence over built-in recipes of the same name.

// A recipe in the library.
struct NamedRecipe {
  std::string name;
  std::string path;  // empty: built in
};
// All recipes, sorted by name.
std::vector<NamedRecipe> ListRecipes();

// Finds a recipe by name or file: with a path separator or the extension ".recipe" it is a file;
// else a recipe's name, or else a file. Empty on success, else what is wrong, as a sentence. `path`
// is empty for built-in recipes.
std::string FindRecipe(const std::string& nameOrFile, std::string& text, std::string& path);

// The file of a recipe in the data folder; empty without a data folder, or if the name cannot be
// that of a file.
std::string RecipePath(const std::string& name);
// Writes a recipe, replacing an older one; creates the folder if it is missing. Empty on success,
// else what is wrong, as a sentence.
std::string SaveRecipe(const std::string& path, const std::string& text);

}  // namespace fotomill
