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
  void Want(std::vector<ThumbnailRequest> requests);
  // The same for the film strip of a view window, before those of the browser; `came` is called
  // when some are loaded. Another owner replaces them; an owner that is destroyed must end them.
  void WantForStrip(const void* owner, std::vector<ThumbnailRequest> requests,
                    std::function<void()> came);
  void EndStrip(const void* owner);
  void SetListener(Listener listener) { listener_ = std::move(listener); }
  void Clear() { cache_.Clear(); }
  size_t Pending() const { return loader_->Pending(); }
  // Makes room for `bytes` of thumbnails, or for the usual number if that is more.
  void MakeRoomFor(uint64_t bytes);
  uint64_t Room() const { return cache_.Capacity(); }  // bytes of thumbnails

 private:
  void FetchResults();
  void WantBoth();

  ThumbnailCache cache_;
  std::vector<ThumbnailRequest> ofBrowser_, ofStrip_;
  const void* stripOwner_ = nullptr;
  std::function<void()> stripCame_;
  Listener listener_;
  std::unique_ptr<ThumbnailLoader> loader_;
};

}  // namespace fotomill::desktop
