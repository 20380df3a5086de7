#include "cli/output_names.h"

#include "core/settings.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill::cli {

std::string CasedExtension(std::string_view formatExtension, std::string_view sourceExtension, int32_t style) {
  std::string extension = LowerCase(formatExtension);
  for (size_t i = 0; i < extension.size() && i < sourceExtension.size(); ++i) {
    if (!IsLetter(extension[i]) || !IsLetter(sourceExtension[i])) continue;
    const bool upper = style == 1 || (style == 0 && sourceExtension[i] != LowerCase(sourceExtension[i]));
    if (upper) extension[i] = UpperCase(extension[i]);
  }
  return extension;
}

OutputNames::OutputNames(const std::vector<SelectedFile>& sources) {
  for (const SelectedFile& source : sources) sources_.insert(platform::AbsolutePath(source.name));
}

bool OutputNames::TakenByRun(const std::string& path, const std::string& source) const {
  const std::string absolute = platform::AbsolutePath(path);
  if (outputs_.contains(absolute)) return true;
  return sources_.contains(absolute) && absolute != platform::AbsolutePath(source);
}

std::optional<std::string> OutputNames::FreeName(const std::string& path, const std::string& source,
                                                 bool mayBeReplaced) const {
  if (!Taken(path, source, mayBeReplaced)) return path;
  const platform::PathParts parts = platform::SplitPath(path);
  for (int64_t number = settings.NumberedVariantMin; number <= settings.NumberedVariantMax; ++number) {
    const std::string base = std::string(parts.base) + " [" + std::to_string(number) + "]";
    std::string variant = platform::JoinPath({parts.drive, parts.folder, base, parts.extension});
    if (!Taken(variant, source, mayBeReplaced)) return variant;
  }
  return std::nullopt;
}

void OutputNames::Remember(const std::string& path) {
  outputs_.insert(platform::AbsolutePath(path));
}

bool OutputNames::Taken(const std::string& path, const std::string& source, bool mayBeReplaced) const {
  return TakenByRun(path, source) || (!mayBeReplaced && platform::FileExists(path));
}

}  // namespace fotomill::cli
