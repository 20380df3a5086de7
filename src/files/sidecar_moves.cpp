#include "files/sidecar_moves.h"

#include <algorithm>
#include <utility>

#include "core/text.h"
#include "metadata/tags/sidecar.h"
#include "metadata/xmp/xmp_tags.h"
#include "platform/existence.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr std::string_view kExtension = ".xmp";

// Whether a folder has other files "photo.*" beside a picture "photo.nef", apart from sidecars.
bool HasNamesakes(const std::string& picture) {
  const platform::PathParts parts = platform::SplitPath(picture);
  const auto entries = platform::ListFolder(platform::FolderOf(picture).empty()
                                                ? std::string(".")
                                                : std::string(platform::FolderOf(picture)));
  if (!entries) return true;  // unknown
  return std::ranges::any_of(*entries, [&](const platform::FolderEntry& entry) {
    const platform::PathParts other = platform::SplitPath(entry.name);
    return other.base == parts.base && entry.name != platform::FileNameOf(picture) &&
           !other.extension.empty() && !EqualIgnoringCase(other.extension, kExtension);
  });
}

// Whether "photo.xmp" goes with a picture "photo.nef".
bool GoesWith(const std::string& sidecar, const std::string& picture) {
  platform::FileView file;
  XmpTags tags;
  if (file.Open(sidecar) && ReadXmpTags(file.Bytes(), tags) == Status::Ok &&
      !tags.sidecarFor.empty())
    return EqualIgnoringCase(tags.sidecarFor, platform::ExtensionOf(picture));
  return !HasNamesakes(picture);
}

}  // namespace

std::vector<RenamedFile> SidecarMoves(const std::string& from, const std::string& to) {
  std::vector<RenamedFile> moves;
  // sidecars have none of their own
  if (EqualIgnoringCase(platform::SplitPath(from).extension, kExtension)) return moves;
  const std::vector<std::string> old = SidecarNames(from), wanted = SidecarNames(to);
  for (size_t i = 0; i < std::min(old.size(), wanted.size()); ++i) {
    if (old[i] == wanted[i] || platform::ExistenceOf(old[i]) != platform::Existence::Yes) continue;
    if (i == 0 || GoesWith(old[i], from)) moves.push_back({old[i], wanted[i]});
  }
  return moves;
}

}  // namespace fotomill
