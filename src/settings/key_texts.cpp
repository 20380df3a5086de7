#include "settings/key_texts.h"

#include "settings/key_table.h"
#include "settings/setting_value.h"

namespace fotomill {

std::string KeyTextInForce(std::string_view key) {
  const KeyRow* const row = FindKey(key);
  return row != nullptr ? ValueText(*row) : std::string();
}

}  // namespace fotomill
