#include "cli/frame/destination_format.h"

#include <string_view>
#include <utility>
#include <vector>

#include "core/text.h"
#include "registry/registry.h"
#include "texts/name_hint.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// The row with exactly this extension; FindFormatByName would select AVI for "x.avif". Common
// alternative spellings are accepted.
int32_t RowOfExtension(std::string_view extension) {
  constexpr std::pair<std::string_view, std::string_view> kSpellings[] = {
      {"tiff", "TIF"}, {"fits", "FIT"}, {"targa", "TGA"}, {"pict", "PCT"}};
  if (extension.starts_with('.')) extension.remove_prefix(1);
  for (const auto& [spelling, row] : kSpellings) {
    if (EqualIgnoringCase(extension, spelling)) extension = row;
  }
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    const bool named = (row.flags & (FMT_SPARE | FMT_CLIPBOARD)) == 0 &&
                       EqualIgnoringCase(row.extension, extension);
    if (named) return i;
  }
  if (extension.empty() || extension.find_first_of("./\\") != std::string_view::npos)
    return kNoFormat;
  return FindPluginFormat("x." + std::string(extension));
}

std::string UnknownFormat(const std::string& extension) {
  if (EqualIgnoringCase(extension, "pdf"))
    return Tr("PDF is not a picture format; \"fotomill pages print\" writes PDF files.");
  std::vector<std::string> known;
  for (int32_t i = 0; i < formatCount; ++i) {
    if (CanWrite(FormatRow(i))) known.push_back(LowerCase(FormatRow(i).extension));
  }
  for (const PluginFormatFacts& format : PluginFormats())
    known.push_back(LowerCase(format.extension));
  const std::vector<std::string_view> names(known.begin(), known.end());
  return Tr("Unknown format \"%1\".", extension) + NearestNameHint(extension, names);
}

}  // namespace

std::string ReadSourceFormat(const std::string& name, std::string& extension) {
  const int32_t index = RowOfExtension(name);
  if (index == kNoFormat) return UnknownFormat(name);
  const FormatEntry& row = FormatRow(index);
  extension = LowerCase(row.extension.view());
  return CanRead(row) ? std::string()
                      : Tr("%1 cannot be read.", row.extension.view()) + " " + Tr(WhyNot(row));
}

std::string ReadDestinationFormat(const std::string& extension, BatchJob& job) {
  job.formatIndex = RowOfExtension(extension);
  if (job.formatIndex == kNoFormat) return UnknownFormat(extension);
  const FormatEntry& row = FormatRow(job.formatIndex);
  job.extension = row.extension.view();
  return CanWrite(row) ? std::string()
                       : Tr("%1 cannot be written.", job.extension) + " " + Tr(WhyNot(row));
}

}  // namespace fotomill::cli
