#include "settings/settings.h"

namespace fotomill {

constinit Settings settings;
constinit const Settings defaultSettings;

}  // namespace fotomill
