#include "operations/operations.h"

// Operations that choose new colors for a whole picture.
namespace fotomill {

std::span<const Operation> PaletteOperations() { return {}; }

}  // namespace fotomill
