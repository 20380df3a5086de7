#pragma once

#include <wx/event.h>

#include <functional>
#include <memory>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_loader.h"

namespace fotomill::desktop {

// The program's thumbnails: one cache and one set of workers for all browsers. Users request
// thumbnails and are notified on the window's thread when some are loaded.
class ThumbnailService : public wxEvtHandler {
 public:
  using Listener = std::function<void(const std::vector<ThumbnailLoader::Result>&)>;

  ThumbnailService();
  ~ThumbnailService() override;

  // The thumbnail for a request; any thumbnail of a file, regardless of size and age. Null if not
  // cached.
  ThumbnailPointer Find(const ThumbnailRequest& request) { return cache_.Find(request); }
  ThumbnailPointer FindAny(const std::string& path) const { return cache_.FindAny(path); }
  // Replaces all requests, as only one browser is active.
  void Want(std::vector<ThumbnailRequest> requests) { loader_->Want(std::move(requests)); }
  void SetListener(Listener listener) { listener_ = std::move(listener); }
  void Clear() { cache_.Clear(); }
  size_t Pending() const { return loader_->Pending(); }
  uint64_t Bytes() const { return cache_.Bytes(); }

 private:
  void FetchResults();

  ThumbnailCache cache_;
  Listener listener_;
  std::unique_ptr<ThumbnailLoader> loader_;
};

}  // namespace fotomill::desktop
