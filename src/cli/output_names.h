#pragma once

#include <optional>
#include <set>
#include <string>
#include <string_view>

#include "cli/file_selection.h"
#include "cli/overwrite_question.h"

namespace fotomill::cli {

// The extension of an output, without its dot: the format's own in lower case, then cased letter by letter after the
// source's extension as `style` says: 0 like the letter in its place, 1 upper, 2 lower. Letters beyond the source's
// extension, and places where either has no letter, stay as they are.
std::string CasedExtension(std::string_view formatExtension, std::string_view sourceExtension, int32_t style);

// Hands out the names of one run's outputs and remembers them.
class OutputNames {
 public:
  // Names of the run's own sources: none of them is given to another file's output while it may still have to be read.
  explicit OutputNames(const std::vector<SelectedFile>& sources);

  // Whether another file of this run has the name, or had it as its output.
  bool TakenByRun(const std::string& path, const std::string& source) const;
  // `path` itself when it is free, else the first free one of "NAME [1].EXT", "NAME [2].EXT" and so on, within the
  // numbers of NumberedVariantMin and NumberedVariantMax. Files that are there count as free when they `mayBeReplaced`.
  // nullopt when no number is left.
  std::optional<std::string> FreeName(const std::string& path, const std::string& source, bool mayBeReplaced) const;
  void Remember(const std::string& path);

 private:
  bool Taken(const std::string& path, const std::string& source, bool mayBeReplaced) const;

  std::set<std::string> sources_;  // absolute paths
  std::set<std::string> outputs_;
};

}  // namespace fotomill::cli
