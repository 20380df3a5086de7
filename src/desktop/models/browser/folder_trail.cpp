#include "desktop/models/browser/folder_trail.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostFolders = 100;

}  // namespace

void FolderTrail::Go(const std::string& folder) {
  if (!folders_.empty()) folders_.resize(place_ + 1);
  folders_.push_back(folder);
  if (folders_.size() > kMostFolders) folders_.erase(folders_.begin());
  place_ = folders_.size() - 1;
}

}  // namespace fotomill::desktop
