#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "catalog/search/picture_facts.h"
#include "catalog/search/search_criteria.h"
#include "catalog/similar/similar_search.h"

namespace fotomill {

// The settings that the facts of a search depend on.
FactsOptions FactsOptionsFromSettings();

// The last search: PictureSearchMode (0: all criteria, 1: any), PictureSearchWildcardField and,
// each if its Match key is on, PictureSearchCommentField, PictureSearchKeywordField (separated by
// commas), PictureSearchMatchField and faces.
SearchCriteria SearchCriteriaFromSettings();

// FindSimlarDistance, clamped to its range, and FindSimilarTransforms.
SimilarOptions SimilarOptionsFromSettings();

// Where a search looks: the user's folders by their numbers, which PictureSearchSpecialFolder
// holds, or any other folder. The numbers are those of the Windows shell.
enum class SearchPlace : int32_t {
  Folder = 0,  // of a path
  Documents = 5,
  Pictures = 39,
  Home = 40,
};
// The path of a place; empty for Folder and for folders that the system does not have.
std::string SearchPlacePath(SearchPlace place);
// The user's folder that has this path; Folder if none has.
SearchPlace SearchPlaceOf(const std::string& folder);

// The folder in which a search starts: the one that PictureSearchSpecialFolder or else
// PictureSearchPath names if PictureSearchPreservePath is on, else `current`.
std::string SearchFolderFromSettings(const std::string& current);
// The folders to offer, the latest first: those of the last searches, PictureSearchHistoryMax at
// most, then the user's folders. Each once, absolute.
std::vector<std::string> OfferedSearchFolders();
// Remembers the folder of a search that begins: sets PictureSearchPath and
// PictureSearchSpecialFolder, and adds it to the folders offered. The caller saves the
// configuration. False if the path is too long or the list of folders could not be written.
[[nodiscard]] bool RememberSearchFolder(const std::string& folder);

// The folder to which pictures found by a search were last copied or moved,
// PictureSearchDestination, to be offered first the next time; empty if there is none or it is no
// longer there.
std::string SearchDestinationFromSettings();
void RememberSearchDestination(const std::string& folder);  // the caller saves the configuration

}  // namespace fotomill
