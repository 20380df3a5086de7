#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "batch/run.h"
#include "operations/recipe.h"

namespace fotomill {

// Looks up the format of `save to=`; implemented by front ends. Empty on success, else an error
// message, a sentence.
using FormatLookup = std::function<std::string(const std::string& extension, int32_t& formatIndex,
                                               std::string& format)>;

// Sets up a batch to run a recipe: the common steps once per file, then
// each output. Sets `transform`, `outputs` and `autoOrient`; set the
// other fields before. `copyrightHolder` is for the macro %N. Empty on
// success, else what is wrong with the recipe's formats, as a sentence.
std::string SetRecipe(std::shared_ptr<const Recipe> recipe, const std::string& copyrightHolder,
                      const BatchJob& job, const FormatLookup& lookup, BatchFunction& function);

// Whether outputs of a format have a quality and can be limited in size; `extension` in uppercase,
// without dot.
bool HasQuality(std::string_view extension);

// The function recorded in the file history for operations of a family; also decides the prefix of
// their outputs.
FileFunction FunctionOfFamily(Family family);

}  // namespace fotomill
