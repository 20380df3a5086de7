#include "operations/operations.h"

// Mattes, borders and shadows around pictures.
namespace fotomill {

std::span<const Operation> MattOperations() { return {}; }

}  // namespace fotomill
