#include "core/limits.h"

namespace fotomill {

Limits limits;

}  // namespace fotomill
