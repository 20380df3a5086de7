#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>

namespace fotomill {

// Where files are now that had other paths before: renames, moves and removals of files and
// folders, taken up from the last to the first.
class FileMoves {
 public:
  // Before everything that was taken up so far, what was at `from` came to `to`; or what was at
  // `path` went away.
  void MovedBefore(const std::string& from, const std::string& to);
  void RemovedBefore(const std::string& path);
  // Where the file is now that had this path before all of it; empty when it is gone. nullopt when
  // nothing of it concerns the file.
  std::optional<std::string> PathNow(std::string_view path) const;

 private:
  // by the path before; empty: gone
  std::unordered_map<std::string, std::string> now_;
};

}  // namespace fotomill
