#include "settings/search_options.h"

#include <algorithm>
#include <string_view>

#include "platform/files.h"
#include "platform/folders.h"
#include "settings/history_list.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

// The entries of a list with commas, without blanks around them.
std::vector<std::string> SplitAtCommas(std::string_view list) {
  std::vector<std::string> entries;
  while (!list.empty()) {
    std::string_view entry = list.substr(0, list.find(','));
    list.remove_prefix(std::min(entry.size() + 1, list.size()));
    entry.remove_prefix(std::min(entry.find_first_not_of(' '), entry.size()));
    entry = entry.substr(0, entry.find_last_not_of(' ') + 1);
    if (!entry.empty()) entries.emplace_back(entry);
  }
  return entries;
}

struct PlaceRow {
  SearchPlace place;
  platform::SpecialFolder folder;
};
constexpr PlaceRow kPlaces[] = {
    {SearchPlace::Pictures, platform::SpecialFolder::Pictures},
    {SearchPlace::Documents, platform::SpecialFolder::Documents},
    {SearchPlace::Home, platform::SpecialFolder::Home},
};

}  // namespace

FactsOptions FactsOptionsFromSettings() {
  return {.read = ReadOptionsFromSettings(),
          .faces = FaceOptionsFromSettings(),
          .tags = TagSourcesFromSettings()};
}

SearchCriteria SearchCriteriaFromSettings() {
  SearchCriteria criteria{.any = settings.PictureSearchMode == 1,
                          .name = std::string(settings.PictureSearchWildcardField),
                          .faces = settings.PictureFaceDetectMatch != 0};
  if (settings.PictureCommentMatch != 0)
    criteria.comment = std::string(settings.PictureSearchCommentField);
  if (settings.PictureKeywordMatch != 0)
    criteria.keywords = SplitAtCommas(settings.PictureSearchKeywordField.view());
  if (settings.PictureStringMatch != 0)
    criteria.text = std::string(settings.PictureSearchMatchField);
  return criteria;
}

SimilarOptions SimilarOptionsFromSettings() {
  return {.distance = std::clamp(settings.FindSimlarDistance, 0, kMostDistance),
          .transforms = settings.FindSimilarTransforms != 0,
          .read = ReadOptionsFromSettings()};
}

std::string SearchPlacePath(SearchPlace place) {
  const auto found = std::ranges::find(kPlaces, place, &PlaceRow::place);
  return found == std::end(kPlaces) ? std::string() : platform::SpecialFolderPath(found->folder);
}

SearchPlace SearchPlaceOf(const std::string& folder) {
  const std::string path = platform::AbsolutePath(folder);
  for (const PlaceRow& row : kPlaces) {
    if (!folder.empty() && platform::SpecialFolderPath(row.folder) == path) return row.place;
  }
  return SearchPlace::Folder;
}

std::string SearchFolderFromSettings(const std::string& current) {
  if (settings.PictureSearchPreservePath == 0) return current;
  std::string folder =
      SearchPlacePath(static_cast<SearchPlace>(settings.PictureSearchSpecialFolder));
  if (folder.empty()) folder = std::string(settings.PictureSearchPath);
  return folder.empty() ? current : folder;
}

std::vector<std::string> OfferedSearchFolders() {
  std::vector<std::string> folders = LoadHistoryList(HistoryList::PictureSearch);
  for (const PlaceRow& row : kPlaces) {
    const std::string path = platform::SpecialFolderPath(row.folder);
    if (!path.empty() && std::ranges::find(folders, path) == folders.end()) folders.push_back(path);
  }
  return folders;
}

bool RememberSearchFolder(const std::string& folder) {
  const std::string path = platform::AbsolutePath(folder);
  if (!settings.PictureSearchPath.Assign(path)) return false;
  settings.PictureSearchSpecialFolder = static_cast<int32_t>(SearchPlaceOf(path));
  return AddToHistoryList(HistoryList::PictureSearch, path);
}

std::string SearchDestinationFromSettings() {
  std::string folder(settings.PictureSearchDestination);
  return platform::IsFolder(folder) ? folder : std::string();
}

void RememberSearchDestination(const std::string& folder) {
  (void)settings.PictureSearchDestination.Assign(platform::AbsolutePath(folder));
}

}  // namespace fotomill
