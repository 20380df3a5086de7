#pragma once

#include <span>
#include <vector>

#include "operations/recipe.h"
#include "picture/picture_record.h"

namespace fotomill::desktop {

// Steps that do to a reduced picture what `steps` do to the original: everything measured in
// pixels is multiplied by `scale`, within the limits of its parameter. Physical lengths follow the
// resolution of the reduced picture, see SetReducedSize.
std::vector<Step> ReducedSteps(std::span<const Step> steps, double scale);

// Sets size and resolution of a picture whose `image` was reduced by `scale`.
void SetReducedSize(PictureRecord& picture, double scale);

// The number of steps at the end that can be computed for part of a picture.
size_t LocalSteps(std::span<const Step> steps);

}  // namespace fotomill::desktop
