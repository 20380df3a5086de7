#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Recipes by name: files "NAME.recipe" in the folder "recipes" of the data folder, and those that
// come with the program. A file of the same name takes the place of the program's own.

// A recipe of the user's library.
struct NamedRecipe {
  std::string name;
  std::string path;  // empty: comes with the program
};
// All of them in order of names.
std::vector<NamedRecipe> ListRecipes();

// Finds a recipe as people name it. With a separator or the ending ".recipe" it is a file; else a
// recipe's name; else a file. Empty when done, else what is wrong, as a sentence. `path` is empty
// for recipes that come with the program.
std::string FindRecipe(const std::string& nameOrFile, std::string& text, std::string& path);

}  // namespace fotomill
