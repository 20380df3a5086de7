#pragma once

#include <wx/event.h>

#include <functional>
#include <memory>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_loader.h"

namespace fotomill::desktop {

// The program's thumbnails: one cache and one set of workers for all browsers. Whoever shows
// thumbnails says what it wants and is told, on the window's thread, when something of it has come.
class ThumbnailService : public wxEvtHandler {
 public:
  using Listener = std::function<void(const std::vector<ThumbnailLoader::Result>&)>;

  ThumbnailService();
  ~ThumbnailService() override;

  // The thumbnail that serves a request, and any that is there of a file, whatever its size and
  // age; null if there is none in the cache.
  ThumbnailPointer Find(const ThumbnailRequest& request) { return cache_.Find(request); }
  ThumbnailPointer FindAny(const std::string& path) const { return cache_.FindAny(path); }
  // Replaces all requests; only one browser is in front.
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
