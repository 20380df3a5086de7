#pragma once

#include <map>
#include <string>
#include <vector>

class wxWindow;

namespace fotomill::desktop {

class Shell;

// Asks for the destination and starts a batch that applies a recipe to files. False if canceled or
// if the recipe has a mistake, which is reported.
bool SaveCopiesOf(Shell& shell, wxWindow& parent, const std::vector<std::string>& files,
                  const std::string& recipe);
// Starts a batch that applies the steps of a recipe to the files themselves; can be undone.
bool ChangeFilesBy(Shell& shell, const std::vector<std::string>& files, const std::string& recipe);
// The same with a recipe for each file.
using FileRecipes = std::map<std::string, std::string>;
bool SaveCopiesOf(Shell& shell, wxWindow& parent, const FileRecipes& recipes);
bool ChangeFilesBy(Shell& shell, const FileRecipes& recipes);
// Runs a recipe of the library on the frame's selection, as copies.
void RunRecipe(Shell& shell, const std::string& name);

}  // namespace fotomill::desktop
