#pragma once

#include <span>
#include <string_view>

#include "operations/operation.h"

namespace fotomill {

// All operations, in the order of families and within them as their files have them.
std::span<const Operation* const> Operations();

// The operation of that name; null when there is none.
const Operation* FindOperation(std::string_view name);

// The rows of each family, from its own file in families/.
std::span<const Operation> CropOperations();
std::span<const Operation> TransformOperations();  // rotate, flip, resize and the like
std::span<const Operation> EffectOperations();  // change colors point by point
// of the family effects, the ones that choose new colors
std::span<const Operation> PaletteOperations();
std::span<const Operation> FilterOperations();  // look at neighboring pixels
// of the family filter, the ones that bend and scatter
std::span<const Operation> DistortOperations();
std::span<const Operation> AnnotateOperations();  // text
std::span<const Operation> WatermarkOperations();  // a second picture on top
std::span<const Operation> MattOperations();  // frames and borders

}  // namespace fotomill
