#include "files/sidecar_moves.h"

#include <algorithm>
#include <utility>

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/text.h"
#include "metadata/tags/sidecar.h"
#include "metadata/xmp/xmp_tags.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr std::string_view kExtension = ".xmp";

// Whether a folder has other files "photo.*" beside a picture "photo.nef", apart from sidecars and
// thumbnails, or a file "photo", whose own sidecar would be "photo.xmp": that of a comment file
// "photo.jpg.txt" is the picture's.
bool HasNamesakes(const std::string& picture) {
  const platform::PathParts parts = platform::SplitPath(picture);
  const auto entries = platform::ListFolder(platform::FolderOf(picture).empty()
                                                ? std::string(".")
                                                : std::string(platform::FolderOf(picture)));
  if (!entries) return true;  // unknown
  return std::ranges::any_of(*entries, [&](const platform::FolderEntry& entry) {
    if (entry.name == platform::FileNameOf(picture)) return false;
    if (entry.name == parts.base) return entry.kind == platform::FileKind::Regular;
    const platform::PathParts other = platform::SplitPath(entry.name);
    return other.base == parts.base && !other.extension.empty() &&
           !EqualIgnoringCase(other.extension, kExtension) &&
           !EqualIgnoringCase(other.extension, kThumbnailExtension);
  });
}

// Whether "photo.xmp" goes with a picture "photo.nef"; to copies also if others share it.
bool GoesWith(const std::string& sidecar, const std::string& picture, bool copied) {
  platform::FileView file;
  XmpTags tags;
  if (file.Open(sidecar) && ReadXmpTags(file.Bytes(), tags) == Status::Ok &&
      !tags.sidecarFor.empty())
    return EqualIgnoringCase(tags.sidecarFor, platform::ExtensionOf(picture));
  const platform::PathParts parts = platform::SplitPath(picture);
  if (!copied || parts.extension.empty()) return !HasNamesakes(picture);
  return !platform::IsRegularFile(platform::JoinPath({parts.drive, parts.folder, parts.base, {}}));
}

// The names a picture's sidecars may have, and that of its comment file; the first is always its
// own, the second may be shared.
std::vector<std::string> NamesBeside(const std::string& picture,
                                     const std::string& commentExtension) {
  std::vector<std::string> names = SidecarNames(picture);
  const bool extended = names.size() > 1;
  if (!extended) names.emplace_back();
  // a text "README.txt" is none of "README"
  names.push_back(commentExtension.empty() || !extended
                      ? std::string()
                      : CommentFileName(picture, {}, commentExtension));
  return names;
}

// Whether the i-th name is that of an existing file that belongs to the picture; a folder never
// does. The first name, too, may be shared if the picture has no extension.
bool Belongs(const std::vector<std::string>& names, size_t i, const std::string& picture,
             bool copied = false) {
  if (names[i].empty() || !platform::IsRegularFile(names[i])) return false;
  const bool shared = i == 1 || (i == 0 && platform::ExtensionOf(picture).empty());
  return !shared || GoesWith(names[i], picture, copied);
}

// Sidecars have none of their own.
bool IsSidecar(const std::string& path) {
  return EqualIgnoringCase(platform::SplitPath(path).extension, kExtension);
}

}  // namespace

std::vector<RenamedFile> SidecarMoves(const std::string& from, const std::string& to,
                                      const std::string& commentExtension, bool copied) {
  std::vector<RenamedFile> moves;
  if (IsSidecar(from)) return moves;
  const auto old = NamesBeside(from, commentExtension), wanted = NamesBeside(to, commentExtension);
  for (size_t i = 0; i < old.size(); ++i) {
    if (old[i] != wanted[i] && !wanted[i].empty() && Belongs(old, i, from, copied))
      moves.push_back({old[i], wanted[i]});
  }
  return moves;
}

std::vector<std::string> SidecarsOf(const std::string& picture,
                                    const std::string& commentExtension) {
  std::vector<std::string> found;
  if (IsSidecar(picture)) return found;
  const auto names = NamesBeside(picture, commentExtension);
  for (size_t i = 0; i < names.size(); ++i) {
    if (Belongs(names, i, picture)) found.push_back(names[i]);
  }
  return found;
}

}  // namespace fotomill
