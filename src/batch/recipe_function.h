#pragma once

#include <memory>
#include <string>

#include "batch/run.h"
#include "operations/recipe.h"

namespace fotomill {

// Formats that a recipe's `save to=` names, looked up by the face. Empty when done, else what is
// wrong, as a sentence.
using FormatLookup = std::function<std::string(const std::string& extension, int32_t& formatIndex,
                                               std::string& format)>;

// Makes a batch run a recipe over its files: the common steps once for each file, then each output.
// Sets `transform`, `outputs` and `autoOrient` of a function whose other fields are set.
// `copyrightHolder` is for the macro %N. Empty when done, else what is wrong with the recipe's
// formats, as a sentence.
std::string SetRecipe(std::shared_ptr<const Recipe> recipe, const std::string& copyrightHolder,
                      const BatchJob& job, const FormatLookup& lookup, BatchFunction& function);

// Under which function the file history notes operations of a family, and whose prefix their
// outputs have.
FileFunction FunctionOfFamily(Family family);

}  // namespace fotomill
