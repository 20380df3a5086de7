#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <unordered_map>
#include <unordered_set>

#include "batch/destination_name.h"

namespace fotomill {

// The names used in a run: sources, outputs, and existing files. Not thread-safe.
class RunNames {
 public:
  RunNames();  // relative paths are relative to the current folder at this time

  // Adds a source of the run; adds a planned output path.
  void AddSource(const std::string& source);
  void AddPlanned(const std::string& planned);

  // Whether this output's planned name does not affect any other file of the run.
  bool ConcernsNobodyElse(const std::string& source, const std::string& planned) const;
  // Whether a path is a source or a planned output of the run.
  bool IsExpected(const std::string& path) const;

  // Whether an output of another file of the run may replace this source.
  bool IsOutputOfOthers(const std::string& source, std::span<const std::string> planned) const;

  // Whether a path is a source or output of another file of the run.
  bool TakenByRun(const std::string& path, const std::string& source) const;
  // The same, or a file of that name exists.
  platform::Existence Taken(const std::string& path, const std::string& source) const;

  // The absolute path, as a key for comparison.
  std::string Key(const std::string& path) const;

  // Assigns a path to an output.
  void Give(const std::string& path);
  // Frees the name of an output that was not written.
  void Release(const std::string& path);
  // A variant that was found will not be used.
  void ForgetVariants() { variants_.clear(); }

  // As MakeNumberedVariant, but does not retry numbers found taken earlier in this run.
  VariantSearch MakeVariant(std::string& path, int64_t first, int64_t last, const TakenTest& taken,
                            const StopToken& stop);

 private:
  std::string folder_;                                 // base of relative paths
  std::unordered_map<std::string, uint32_t> sources_;  // with their number of occurrences
  std::unordered_map<std::string, uint32_t> planned_;
  std::unordered_set<std::string> given_;
  // the next number to try, by the path without number
  std::unordered_map<std::string, int64_t> variants_;
};

}  // namespace fotomill
