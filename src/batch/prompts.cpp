#include "batch/prompts.h"

#include "settings/configuration.h"

namespace fotomill {

// A setting that cannot be written holds for this run.
void Prompts::StoreFlag(KeyNumber key, bool value) {
  SettingValue flag;
  flag.number = value ? 1 : 0;
  if (StoreSetting(KeyOf(key), flag) != SaveResult::Done) StoreNumber(KeyOf(key), flag.number);
}

}  // namespace fotomill
