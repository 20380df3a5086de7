#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "catalog/similar/hash_store.h"
#include "catalog/similar/similar_groups.h"
#include "core/status.h"
#include "picture/read_request.h"

namespace fotomill {

// How many of the 64 bits of two hashes may differ at most.
inline constexpr int32_t kMostDistance = 32;

// What counts as similar.
struct SimilarOptions {
  int32_t distance = 0;     // bits that may differ, up to kMostDistance
  bool transforms = false;  // also rotated or mirrored
  bool exact = false;       // only identical pixels; the others do not matter then
  ReadOptions read = {};
};

// A file to be compared with others.
struct ComparedFile {
  std::string name;            // path, absolute or relative
  Status status = Status::Ok;  // why it is left out
  std::string hint = {};       // to follow that message; may be empty
  HashRecord record = {};
  bool known = false;  // the record has all that is needed
};

// What a search reports; each may be empty. All but `hint` and `goesOn` are called on the thread
// that searches.
struct SimilarEvents {
  // Explains a failure, on any thread.
  std::function<std::string(const std::string& name, Status status)> hint = {};
  std::function<bool()> goesOn = {};  // on any thread; false ends the search
  std::function<void()> tick = {};    // a few times a second
  // Pictures read, of those that are not in the store.
  std::function<void(uint64_t done, uint64_t total)> progress = {};
};

// A search for similar pictures. What is read is kept in the store, also if the search is ended.
class SimilarSearch {
 public:
  // The store must outlive the search.
  SimilarSearch(const SimilarOptions& options, HashStore& store)
      : options_(options), store_(store) {}

  // Loads what the store knows. Read does so itself.
  void Recall(std::vector<ComparedFile>& files) const;
  // Determines what is compared, on all cores. Files that have a status already are ignored; those
  // that cannot be read get one. If ended, some of the others are not `known`.
  void Read(std::vector<ComparedFile>& files, const SimilarEvents& events);
  // Groups of these files, as their indices; only those that were read are compared. Once
  // `goesOn` returns false, no more are compared.
  std::vector<SimilarGroup> Group(const std::vector<ComparedFile>& files,
                                  const std::function<bool()>& goesOn) const;
  // Measures the sharpness of the files with these indices, unless it is known.
  void Measure(std::vector<ComparedFile>& files, std::span<const size_t> which,
               const SimilarEvents& events);
  // False if the store could not be written; the results are right all the same.
  bool Kept() const { return kept_; }

 private:
  using Work = Status (SimilarSearch::*)(ComparedFile& file) const;

  void ForEach(const std::vector<ComparedFile*>& files, Work work, const SimilarEvents& events);
  Status Look(ComparedFile& file) const;
  Status Digest(ComparedFile& file) const;
  Status AddPages(const PictureRecord& first, ComparedFile& file) const;
  Status FindSharpness(ComparedFile& file) const;

  const SimilarOptions options_;
  HashStore& store_;
  bool kept_ = true;
};

}  // namespace fotomill
