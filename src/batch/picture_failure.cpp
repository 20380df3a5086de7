#include "batch/picture_failure.h"

#include "picture/picture_record.h"
#include "platform/reason.h"
#include "registry/registry.h"
#include "registry/signature.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

std::string_view LooksLike(const std::string& fileName, int32_t formatIndex) {
  const FileKind kind = IdentifyFile(fileName);
  const bool asNamed =
      formatIndex != kNoFormat && kind.IsOf(FormatRow(formatIndex).extension.view());
  // Targa files have no signature, and the first bytes of many are those of an icon or a cursor.
  const bool chance = formatIndex != kNoFormat && FormatRow(formatIndex).signatures.empty() &&
                      (kind.IsOf("CUR") || kind.IsOf("ICO"));
  return asNamed || chance ? std::string_view() : kind.name;
}

std::string OpenHint(const std::string& fileName, Status status) {
  if (fileName.size() > PathText::Capacity()) return Tr("The path is longer than 260 characters.");
  if (status == Status::FileOpenError) return ReasonSentence();
  if (status == Status::FileReadError && !platform::SystemReason().empty()) return ReasonSentence();
  if (status != Status::DamagedFile && status != Status::FileReadError &&
      status != Status::UnsupportedFunction && status != Status::UnsupportedFormat) {
    return {};
  }
  const int32_t index = FindFormatByName(fileName);
  if (const std::string_view name = LooksLike(fileName, index); !name.empty()) {
    return Tr("It looks like %1.", Tr(name));
  }
  if (index == kNoFormat) return Tr("Unknown file extension.");
  if (!CanRead(FormatRow(index))) return Tr(WhyNot(FormatRow(index)));
  return status == Status::UnsupportedFormat ? Tr("This variant of the format cannot be read.")
                                             : std::string();
}

}  // namespace fotomill
