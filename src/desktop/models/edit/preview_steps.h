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

// The time that steps may take for a quick answer.
inline constexpr double kQuickSeconds = 0.025;
// The share of the edges of a reduced picture, 0.25 to 1, that the next quick answer uses, after
// one with `share` took so long. It falls at once and grows slowly, as the next value of a
// parameter that is being changed may take longer again.
double NextShare(double share, double seconds);

}  // namespace fotomill::desktop
