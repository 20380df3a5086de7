#include "cli/selection/output_place.h"

#include <cstdio>

#include "platform/file_view.h"
#include "platform/paths.h"

namespace fotomill::cli {

void TakeFolder(std::string& out, std::string& dest) {
  if (!out.ends_with(platform::kSeparator) && !out.ends_with('/')) return;
  dest = std::move(out);
  out.clear();
  while (dest.size() > 1 && (dest.ends_with(platform::kSeparator) || dest.ends_with('/')))
    dest.pop_back();
}

bool StreamedOutput::Create(const std::string& extension) {
  if (!folder_.Create()) return false;
  path_ = platform::JoinFolder(folder_.Path(), "stdout." + extension);
  return true;
}

bool StreamedOutput::Deliver(const CommandContext& context) const {
  platform::FileView file;
  if (!file.Open(path_)) return false;
  const auto bytes = file.Bytes();
  std::fwrite(bytes.data(), 1, bytes.size(), context.io.out);
  return file.Intact();
}

CommandContext WithResultsOnError(const CommandContext& context) {
  CommandContext changed = context;
  changed.io.out = context.io.err;
  changed.io.outTerminal = context.io.errTerminal;
  changed.io.outStored = false;
  return changed;
}

}  // namespace fotomill::cli
