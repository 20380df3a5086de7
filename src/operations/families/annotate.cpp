#include "operations/operations.h"

// Captions and texts.
namespace fotomill {

std::span<const Operation> AnnotateOperations() { return {}; }

}  // namespace fotomill
