#pragma once

#include <span>
#include <string_view>

#include "operations/operation.h"

namespace fotomill {

// All operations, ordered by family, and within a family as in its file.
std::span<const Operation* const> Operations();

// Null if not found.
const Operation* FindOperation(std::string_view name);

// The operations of each family, from families/.
std::span<const Operation> CropOperations();
std::span<const Operation> TransformOperations();  // rotate, flip, resize, etc.
std::span<const Operation> EffectOperations();  // per-pixel color changes
// family Effects: operations that choose new colors
std::span<const Operation> PaletteOperations();
std::span<const Operation> FilterOperations();  // filters with a neighborhood
// family Filter: operations that displace pixels
std::span<const Operation> DistortOperations();
std::span<const Operation> AnnotateOperations();  // text
std::span<const Operation> WatermarkOperations();  // a text or a picture on top
std::span<const Operation> MattOperations();  // frames and borders

}  // namespace fotomill
