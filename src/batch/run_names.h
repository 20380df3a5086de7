#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <unordered_map>
#include <unordered_set>

#include "batch/destination_name.h"

namespace fotomill {

// The names of a run: its sources, its outputs, and existing files. Not thread-safe.
class RunNames {
 public:
  RunNames();  // relative paths are relative to the current folder of this moment

  // A source of the run; and a path that one of its outputs would have.
  void AddSource(const std::string& source);
  void AddPlanned(const std::string& planned);

  // Whether the planned name of this output affects no other file of the run.
  bool ConcernsNobodyElse(const std::string& source, const std::string& planned) const;
  // Whether a path is a source or a planned output of the run.
  bool IsExpected(const std::string& path) const;

  // Whether the output of another file of the run may come to lie where this source is.
  bool IsOutputOfOthers(const std::string& source, std::span<const std::string> planned) const;

  // Whether another file of the run has the path as its source or output.
  bool TakenByRun(const std::string& path, const std::string& source) const;
  // The same, or there is a file of that name.
  platform::Existence Taken(const std::string& path, const std::string& source) const;

  // The path made absolute, by which files are compared.
  std::string Key(const std::string& path) const;

  // Gives a path to an output.
  void Give(const std::string& path);
  // The output was not written: its name is free again.
  void Release(const std::string& path);
  // A variant that was found is not used.
  void ForgetVariants() { variants_.clear(); }

  // As MakeNumberedVariant; numbers that this run has found taken before are not tried again.
  VariantSearch MakeVariant(std::string& path, int64_t first, int64_t last, const TakenTest& taken,
                            const StopToken& stop);

 private:
  std::string folder_;                                 // what relative paths are relative to
  std::unordered_map<std::string, uint32_t> sources_;  // how often each is there
  std::unordered_map<std::string, uint32_t> planned_;
  std::unordered_set<std::string> given_;
  // the number to continue with, by the path without one
  std::unordered_map<std::string, int64_t> variants_;
};

}  // namespace fotomill
