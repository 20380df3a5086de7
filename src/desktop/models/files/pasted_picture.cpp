#include "desktop/models/files/pasted_picture.h"

#include <algorithm>
#include <cstdint>
#include <span>

#include "core/plain_name.h"
#include "files/numbered_name.h"
#include "picture/picture_record.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kExtension = ".png";

// The first unused path; empty if there is none.
std::string FreePath(const std::string& folder) {
  const std::string_view wanted = settings.ClipboardPictureName.view();
  const std::string name(IsPlainName(wanted) && !wanted.empty()
                             ? wanted
                             : defaultSettings.ClipboardPictureName.view());
  std::string path = platform::JoinFolder(folder, name + kExtension);
  if (platform::ExistenceOf(path) == platform::Existence::No) return path;
  return MakeNumberedVariant(path, 1, INT32_MAX, platform::ExistenceOf) == VariantSearch::Found
             ? path
             : std::string();
}

Status ToRecord(const PastedPicture& pasted, PictureRecord& picture) {
  RETURN_IF_BAD(ToPacked(pasted.pixels, picture.image));
  if (pasted.alpha.empty()) return Status::Ok;
  const auto width = static_cast<size_t>(pasted.pixels.width);
  RETURN_IF_BAD(NewAlphaPlane(pasted.pixels.width, pasted.pixels.height, picture.alpha));
  for (int32_t y = 0; y < pasted.pixels.height; ++y) {
    const std::span<uint8_t> row = picture.alpha.Row(y);
    std::copy_n(pasted.alpha.begin() + static_cast<std::ptrdiff_t>(static_cast<size_t>(y) * width),
                width, row.begin());
  }
  return Status::Ok;
}

// Writes it under an unused name, returned in `path`.
Status Write(const PastedPicture& pasted, const std::string& folder, std::string& path) {
  const PicturePointer picture = NewPictureRecord(ReadOptionsFromSettings().alphaBackground);
  if (picture == nullptr) return Status::MemoryAllocationError;
  RETURN_IF_BAD(ToRecord(pasted, *picture));
  WriteOptions options{.encode = EncodeOptionsFromSettings()};
  options.existing = platform::Existing::Refuse;
  Status status = Status::ErrorCreatingFile;
  (void)RetryLostRaces([&] {
    path = FreePath(folder);
    if (path.empty()) return true;
    status = WritePicture(*picture, path, options);
    return !LostRace(status, path);
  });
  return status;
}

}  // namespace

FileOperationResult KeepPastedPicture(const PastedPicture& pasted, const std::string& folder) {
  FileOperationResult result{FileOperation{FileOperationKind::Create, {}}, {}};
  std::string path;
  const Status status = Write(pasted, folder, path);
  if (status == Status::Ok) {
    result.done.steps.push_back({path, path});
  } else {
    result.failures.push_back({path.empty() ? folder : path, StatusText(status)});
  }
  return result;
}

}  // namespace fotomill::desktop
