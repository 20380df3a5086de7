#include "core/settings.h"

namespace fotomill {

constinit Settings settings;

}  // namespace fotomill
