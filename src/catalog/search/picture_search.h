#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <span>
#include <string>

#include "catalog/search/picture_facts.h"
#include "catalog/search/picture_index.h"
#include "catalog/search/search_criteria.h"

namespace fotomill {

// A file that a search has examined.
struct ExaminedFile {
  PictureState state;
  PictureFacts facts;
  uint32_t keptParts = 0;  // of the facts, those that the index has already
  bool found = false;
  Status status = Status::Ok;  // why facts that were needed could not be read
  std::string hint = {};       // to follow that message; may be empty
};

// What a search reports. All but `hint` and `goesOn` are called on the thread that searches.
struct SearchEvents {
  // Once per file, in order.
  std::function<void(size_t index, const ExaminedFile& file)> examined;
  // Explains a failure, on any thread; may be empty.
  std::function<std::string(const std::string& path, Status status)> hint = {};
  std::function<bool()> goesOn = {};  // on any thread; false ends the search
  std::function<void()> tick = {};    // a few times a second
};

// A search for pictures, in one or several runs. What is read is kept in the index, also if the
// search is ended.
class PictureSearch {
 public:
  // `parts` are read for every picture found, besides those that the criteria need. The index must
  // outlive the search.
  PictureSearch(SearchCriteria criteria, uint32_t parts, FactsOptions options, PictureIndex& index)
      : criteria_(std::move(criteria)),
        parts_(parts),
        options_(std::move(options)),
        index_(index) {}

  // Examines files, given by absolute paths, on all cores.
  void Run(std::span<const std::string> paths, const SearchEvents& events);
  // False if the index could not be written; the results are right all the same.
  bool Kept() const { return kept_; }

 private:
  void Examine(const std::string& path, ExaminedFile& file);
  void Keep(const std::string& path, const ExaminedFile& file);

  const SearchCriteria criteria_;
  const uint32_t parts_;
  const FactsOptions options_;
  PictureIndex& index_;
  std::mutex indexMutex_;
  double saved_ = 0;  // when, MonotonicSeconds
  bool kept_ = true;
};

}  // namespace fotomill
