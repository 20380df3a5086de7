#include "desktop/models/browser/folder_listing.h"

#include <algorithm>
#include <unordered_map>

#include "core/natural_order.h"
#include "core/text.h"
#include "metadata/exif/taken_date.h"
#include "metadata/tags/picture_tags.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Caches formats by extension; a folder of 100,000 files needs only a few registry lookups.
class FormatFinder {
 public:
  int32_t Find(std::string_view name) {
    const std::string extension(platform::ExtensionOf(name));
    const auto [found, added] = rows_.try_emplace(extension, kNoFormat);
    if (added && !extension.empty() && !EqualIgnoringCase(extension, "THN"))
      found->second = FindFormatByName(name);
    return found->second;
  }

 private:
  std::unordered_map<std::string, int32_t> rows_;
};

// Call after ListFolder has failed.
FolderListing NotListed(const std::string& folder) {
  const std::string unreadable = WithReason(Tr("The folder %1 cannot be read.", folder));
  switch (platform::FactsOf(folder).kind) {
    case platform::FileKind::Missing:
      return {.state = FolderState::Missing, .problem = Tr("There is no folder %1.", folder)};
    case platform::FileKind::Regular: return {.problem = Tr("%1 is not a folder.", folder)};
    case platform::FileKind::Folder:
    case platform::FileKind::Other: break;
  }
  return {.problem = unreadable};
}

}  // namespace

FolderListing ListForBrowser(const std::string& folder, bool facts, const StopToken& stop) {
  FolderListing listing;
  const auto entries = platform::ListFolder(folder);
  if (!entries) return NotListed(folder);
  listing.state = FolderState::Listed;
  listing.chosen = ModesForFolder(folder, listing.chosen);
  FormatFinder formats;
  for (const platform::FolderEntry& entry : *entries) {
    if (stop.Asked()) return listing;
    if (entry.name.starts_with('.')) continue;
    FolderItem item;
    item.name = entry.name;
    item.folder = entry.kind == platform::FileKind::Folder;
    if (!item.folder) item.format = formats.Find(entry.name);
    if (item.folder || (entry.kind == platform::FileKind::Regular && item.format != kNoFormat)) {
      listing.items.push_back(std::move(item));
    }
  }
  if (facts) AddFacts(folder, listing, stop);
  return listing;
}

FolderListing ListNames(const std::string& folder, const std::vector<std::string>& names,
                        const StopToken& stop) {
  FolderListing listing{.state = FolderState::Listed};
  FormatFinder formats;
  for (const std::string& name : names) {
    if (stop.Asked()) return listing;
    if (platform::IsRegularFile(platform::JoinFolder(folder, name)))
      listing.items.push_back({.name = name, .format = formats.Find(name)});
  }
  return listing;
}

FolderListing ListWithSubfolders(const std::string& folder, const StopToken& stop) {
  constexpr size_t kDeepest = 64;
  struct Level {
    std::string below;  // relative to the folder, with a separator at its end
    size_t depth;
  };
  FolderListing all{.state = FolderState::Listed};
  all.chosen = ModesForFolder(folder, all.chosen);
  FormatFinder formats;
  std::vector<Level> open{{{}, 0}};
  while (!open.empty() && !stop.Asked()) {
    const Level level = std::move(open.back());
    open.pop_back();
    const auto entries = platform::ListFolder(platform::JoinFolder(folder, level.below));
    if (!entries && level.depth == 0) return NotListed(folder);
    if (!entries) continue;
    for (const platform::FolderEntry& entry : *entries) {
      if (entry.name.starts_with('.')) continue;
      if (entry.kind == platform::FileKind::Folder) {
        if (!entry.link && level.depth < kDeepest)
          open.push_back({level.below + entry.name + platform::kSeparator, level.depth + 1});
        continue;
      }
      FolderItem item;
      item.format = formats.Find(entry.name);
      if (entry.kind != platform::FileKind::Regular || item.format == kNoFormat) continue;
      item.name = level.below + entry.name;
      all.items.push_back(std::move(item));
    }
  }
  return all;
}

std::string_view ShownName(const FolderItem& item) { return platform::FileNameOf(item.name); }

std::vector<std::string> SubfolderNames(const std::string& folder) {
  std::vector<std::string> names;
  for (const platform::FolderEntry& entry :
       platform::ListFolder(folder).value_or(std::vector<platform::FolderEntry>())) {
    if (entry.kind == platform::FileKind::Folder && !entry.name.starts_with('.'))
      names.push_back(entry.name);
  }
  std::sort(names.begin(), names.end(),
            [](const auto& a, const auto& b) { return CompareNatural(a, b) < 0; });
  return names;
}

void AddFacts(const std::string& folder, FolderListing& listing, const StopToken& stop) {
  for (FolderItem& item : listing.items) {
    if (stop.Asked()) return;
    const platform::FileFacts facts = platform::FactsOf(platform::JoinFolder(folder, item.name));
    item.size = item.folder ? 0 : facts.size;
    item.modified = facts.modified;
  }
}

void AddPictureFacts(const std::string& folder, FolderItem& item) {
  const std::string path = platform::JoinFolder(folder, item.name);
  PicturePointer picture;
  if (LoadPictureInfo({.fileName = path, .options = ReadOptionsFromSettings()}, picture) !=
      Status::Ok)
    return;
  item.width = picture->width;
  item.height = picture->height;
  item.bits = picture->bitsPerPixel;
  item.taken = TakenDate(path);
}

void AddPictureTags(const std::string& folder, FolderItem& item) {
  PictureTags tags;
  (void)ReadPictureTags(platform::JoinFolder(folder, item.name), {}, tags);
  item.tagged = true;
  item.outdated = false;
  item.rating = tags.rating;
  item.label = tags.label;
}

}  // namespace fotomill::desktop
