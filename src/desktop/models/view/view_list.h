#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The files that a view window steps through, and which of them it shows. Places count from 0.
class ViewList {
 public:
  // Starts at `file`; if `files` does not contain it, it is the only one.
  ViewList(const std::vector<std::string>& files, const std::string& file);

  const std::vector<std::string>& Files() const { return files_; }
  const std::string& File() const { return files_[place_]; }
  size_t Place() const { return place_; }
  size_t Count() const { return files_.size(); }  // at least 1
  bool Contains(const std::string& file) const;

  // The place some files further or back; the first file follows the last one.
  size_t PlaceAfter(int64_t steps) const;
  void GoTo(size_t place);  // below Count
  // Takes other files and stays at the current one. False, with no change, if they do not contain
  // it.
  bool Replace(const std::vector<std::string>& files);
  // Takes the files of a folder that has changed. A current file that is gone stays in its place
  // until another one is chosen.
  void Follow(const std::vector<std::string>& files);
  // Takes the new names after a file or folder was renamed. Whether the current file has one.
  bool FollowRename(const std::string& from, const std::string& to);
  // Removes a file, unless it is the only one. The one after the current file takes its place.
  void Remove(const std::string& file);

  // The places whose pictures to load, most urgent first: the current one, `upcoming`, which
  // may be any number, and two in each direction. None occurs twice.
  std::vector<size_t> PlacesToLoad(std::optional<size_t> upcoming) const;

 private:
  std::vector<std::string> files_;
  size_t place_ = 0;
  bool isGone_ = false;  // the current file is no longer in the folder
};

}  // namespace fotomill::desktop
