#include "operations/operations.h"

// Watermarks.
namespace fotomill {

std::span<const Operation> WatermarkOperations() { return {}; }

}  // namespace fotomill
