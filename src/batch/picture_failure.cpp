#include "batch/picture_failure.h"

#include "picture/picture_record.h"
#include "registry/registry.h"
#include "registry/signature.h"

namespace fotomill {

namespace {

// Whether `word` is one of the words of a list with blanks between them.
bool HasWord(std::string_view list, std::string_view word) {
  while (!list.empty()) {
    const size_t end = list.find(' ');
    if (list.substr(0, end) == word) return true;
    list.remove_prefix(end == std::string_view::npos ? list.size() : end + 1);
  }
  return false;
}

}  // namespace

std::string_view LooksLike(const std::string& fileName, int32_t formatIndex) {
  const Signature signature = IdentifyFile(fileName);
  const bool asNamed = formatIndex != kNoFormat && HasWord(signature.extensions, FormatRow(formatIndex).extension.view());
  return asNamed ? std::string_view() : signature.name;
}

std::string OpenHint(const std::string& fileName, Status status) {
  if (fileName.size() > PathText::Capacity()) return "The path is longer than 260 characters.";
  if (status != Status::DamagedFile && status != Status::FileReadError && status != Status::UnsupportedFunction &&
      status != Status::UnsupportedFormat) {
    return {};
  }
  const int32_t index = FindFormatByName(fileName);
  if (const std::string_view name = LooksLike(fileName, index); !name.empty()) {
    return "It looks like " + std::string(name) + ".";
  }
  if (index == kNoFormat) return "No format goes by that extension.";
  return std::string(CanRead(FormatRow(index)) ? std::string_view() : WhyNot(FormatRow(index)));
}

}  // namespace fotomill
