#include "settings/exif_settings.h"

#include "core/data_folder.h"
#include "core/limits.h"
#include "metadata/edit/exif_input.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

std::string LocationsPath() {
  const std::string name(settings.ExifLocationsFile.view());
  return platform::SplitPath(name).folder.empty() ? DataFile(name) : name;
}

std::string ReadLocations(std::string& list) {
  const std::string path = LocationsPath();
  platform::FileView file;
  if (path.empty() || !file.Open(path) || file.FileSize() > limits.listFileBytes)
    return WithReason(Tr("\"%1\" cannot be read.", path));
  const auto bytes = file.Bytes();
  list.assign(bytes.begin(), bytes.end());
  return {};
}

bool OwnerChanges(ExifChanges& changes, std::string& reason) {
  const struct {
    uint16_t tag;
    const SettingText& value;
  } keys[] = {{0x013b, settings.ExifPersonWhoCreatedImage}, {0x8298, settings.ExifCopyrightHolder},
              {0xa430, settings.ExifCameraOwnerName},       {0x0131, settings.ExifSoftwareName},
              {0x010f, settings.ExifEquipmentManufacturer}, {0x0110, settings.ExifEquipmentModel},
              {0x010e, settings.ExifNewImageTitle}};
  for (const auto& key : keys) {
    if (key.value.view().empty()) continue;
    ExifEntry entry;
    if (!ParseExifInput(key.tag, key.value.view(), entry, reason)) return false;
    changes.push_back({PlaceOfExifTag(key.tag), key.tag, std::move(entry)});
  }
  if (changes.empty())
    reason =
        Tr("No owner is configured; set ExifPersonWhoCreatedImage, ExifCopyrightHolder or another "
           "of these keys.");
  return reason.empty();
}

}  // namespace fotomill
