#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The visited folders of a tab, oldest first, and the current position.
class FolderTrail {
 public:
  // Goes to a new folder, discarding those ahead,
  // and the oldest ones if there are too many.
  void Go(const std::string& folder);
  // Whether there is a folder `steps` back (negative) or ahead.
  bool CanStep(int steps) const {
    return steps >= -static_cast<int>(place_) && place_ + steps < folders_.size();
  }
  // Moves; CanStep must allow it. Returns the folder there.
  const std::string& Step(int steps) { return folders_[place_ += static_cast<size_t>(steps)]; }
  // The folder `steps` back (negative) or ahead; CanStep must allow it.
  const std::string& FolderAt(int steps) const {
    return folders_[place_ + static_cast<size_t>(steps)];
  }

 private:
  std::vector<std::string> folders_;
  size_t place_ = 0;
};

}  // namespace fotomill::desktop
