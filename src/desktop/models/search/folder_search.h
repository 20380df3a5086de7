#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "catalog/search/picture_facts.h"
#include "catalog/search/search_criteria.h"
#include "core/workers/stop_token.h"

namespace fotomill::desktop {

// A search in a folder and its subfolders.
struct FolderSearch {
  std::string folder;
  SearchCriteria criteria = {};
  FactsOptions facts = {};  // its stop token is replaced
  std::string index = {};   // path of the picture index
};

// What a search has done since the last report.
struct SearchNews {
  uint64_t examined = 0;                   // files
  std::vector<std::string> found = {};     // paths relative to the folder
  std::vector<std::string> problems = {};  // a line for each file or folder that cannot be read
};

// Searches in the background. Hidden files and folders are left out, links to folders not followed.
// Reports several times a second, and at the end. What was read is kept in the index, also if
// `stop` is asked.
void RunFolderSearch(FolderSearch search, const StopToken& stop,
                     const std::function<void(SearchNews news)>& report);

}  // namespace fotomill::desktop
