#pragma once

#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace fotomill {

// Maps old paths to current ones: renames, moves and removals of files and folders, recorded from
// last to first.
class FileMoves {
 public:
  // Records that `from` was renamed to `to`, or that `path` was removed, before everything recorded
  // so far.
  void MovedBefore(const std::string& from, const std::string& to);
  void RemovedBefore(const std::string& path);
  // The current path of the file that originally had this path; empty if removed. nullopt if the
  // file was not affected.
  std::optional<std::string> PathNow(std::string_view path) const;

 private:
  // Removes and returns what is known of the files in a folder.
  std::map<std::string, std::string> TakeWithin(const std::string& folder);

  // by original path; empty: removed
  std::map<std::string, std::string> now_;
};

}  // namespace fotomill
