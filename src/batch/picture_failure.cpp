#include "batch/picture_failure.h"

#include "picture/picture_record.h"
#include "platform/reason.h"
#include "registry/registry.h"
#include "registry/signature.h"
#include "texts/status_text.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The library that a format lacks; empty if it needs none.
std::string MissingLibrary(int32_t formatIndex) {
  if (formatIndex == kNoFormat || FormatRow(formatIndex).libraries.empty()) return {};
  return Tr("The library %1 is not installed.", FormatRow(formatIndex).libraries[0].name);
}

}  // namespace

std::string_view LooksLike(const std::string& fileName, int32_t formatIndex) {
  return KindBehindName(fileName, formatIndex).name;
}

std::string MisnamedRemark(const PictureRecord& picture) {
  if (!OpenedByContents(picture)) return {};
  return Tr("The file contains %1, despite its name.",
            FormatRow(picture.formatIndex).extension.view());
}

std::string OpenHint(const std::string& fileName, Status status) {
  if (fileName.size() > PathText::Capacity()) return Tr("The path is longer than 260 characters.");
  if (status == Status::FileOpenError) return ReasonSentence();
  if (status == Status::FileReadError && !platform::SystemReason().empty()) return ReasonSentence();
  if (status == Status::FeatureDisabled) return MissingLibrary(FindFormatByName(fileName));
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

std::string FailureText(const std::string& fileName, Status status) {
  const std::string hint = OpenHint(fileName, status);
  return hint.empty() ? StatusText(status) : StatusText(status).append(" ").append(hint);
}

std::string WorkHint(Status status) {
  if (status == Status::ResourceError)
    return Tr("No font was found; install one (package fonts-dejavu-core).");
  if (status == Status::FeatureDisabled) return Tr("The face detector is not installed.");
  return {};
}

std::string SizeHint(const PictureRecord& picture, const FormatEntry& row) {
  if (row.limits.Allow(picture.image.Width(), picture.image.Height())) return {};
  const char* text = row.limits.exact ? TrLater("The format only holds pictures of %1 x %2 pixels.")
                                      : TrLater("The format holds at most %1 x %2 pixels.");
  return Tr(text, row.limits.width, row.limits.height);
}

}  // namespace fotomill
