#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The folders that a tab went through, the first one first, and where among them it is.
class FolderTrail {
 public:
  // Goes to a folder that was not gone back or forward to; what lay ahead is forgotten, and so are
  // the oldest of many.
  void Go(const std::string& folder);
  // Whether there is a folder `steps` back (negative) or ahead.
  bool CanStep(int steps) const {
    return steps >= -static_cast<int>(place_) && place_ + steps < folders_.size();
  }
  // Takes steps that it can; the folder there.
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
