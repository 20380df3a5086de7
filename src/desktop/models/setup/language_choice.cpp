#include "desktop/models/setup/language_choice.h"

#include "core/ini_file.h"
#include "settings/configuration.h"

namespace fotomill::desktop {

namespace {

constexpr std::string_view kSection = "Desktop", kKey = "Language";

}  // namespace

std::string StoredLanguage() {
  return std::string(
      FindIniValue(ConfigurationText(), kSection, kKey).value_or(std::string_view()));
}

bool StoreLanguage(const std::string& code) {
  if (code == StoredLanguage()) return true;
  IniEdit edit;
  edit.key = kKey;
  if (!code.empty()) edit.value = code;
  const SaveResult saved = StoreInSection(kSection, {&edit, 1});
  return saved == SaveResult::Done || saved == SaveResult::Unchanged;
}

}  // namespace fotomill::desktop
