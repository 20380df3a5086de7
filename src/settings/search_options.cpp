#include "settings/search_options.h"

#include <algorithm>
#include <string_view>

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

}  // namespace fotomill
