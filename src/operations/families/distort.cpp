#include "operations/operations.h"

// Filters that bend and scatter pixels.
namespace fotomill {

std::span<const Operation> DistortOperations() { return {}; }

}  // namespace fotomill
