#pragma once

#include <cstdint>
#include <functional>
#include <list>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "core/workers/latest_work.h"
#include "desktop/models/thumbnails/thumbnail.h"

namespace fotomill::desktop {

// Loads thumbnails on threads of the pool, in the order in which they are wanted now. The request
// of a result tells whether it is a stand-in; its thumbnail is null when there is none. Where a
// stand-in was wanted and the proper one was ready, no one loads it again.
class ThumbnailLoader {
 public:
  // A request that was dealt with.
  struct Result {
    ThumbnailRequest request;
    ThumbnailPointer thumbnail;
  };
  using Load = ThumbnailPointer (*)(const ThumbnailRequest& request);

  // `wake` is called on a worker when results wait that no one was told of yet, `idle` on the
  // worker that has done the last request.
  ThumbnailLoader(unsigned atOnce, std::function<void()> wake, Load load = LoadThumbnail,
                  void (*idle)() = KeepThumbnailRecords);
  // Waits for what is in work.
  ~ThumbnailLoader() = default;
  ThumbnailLoader(const ThumbnailLoader&) = delete;
  ThumbnailLoader& operator=(const ThumbnailLoader&) = delete;

  // Sets the wanted thumbnails, most urgent first. Pending requests are replaced; running ones
  // finish.
  void Want(std::vector<ThumbnailRequest> requests);
  std::vector<Result> FetchResults();  // those that came since the last call
  // Thumbnails that wait or are in progress.
  size_t Pending() const;

 private:
  LatestWork::Piece Next();
  void LoadOne(ThumbnailRequest request);

  const std::function<void()> wake_;
  const Load load_;
  void (*const idle_)();
  mutable std::mutex mutex_;
  std::vector<ThumbnailRequest> requests_;  // the most urgent last
  std::vector<ThumbnailRequest> inWork_;  // one a thread
  std::vector<Result> results_;
  LatestWork work_;  // last: it uses the rest
};

// How many thumbnails to load at a time, so that a core is left for the windows.
unsigned ThumbnailsAtOnce();

// Loaded thumbnails: an LRU cache, bounded in bytes.
class ThumbnailCache {
 public:
  explicit ThumbnailCache(uint64_t capacity) : capacity_(capacity) {}  // bytes
  // Null when it is not there, or is there for another state of the file, or another side.
  ThumbnailPointer Find(const ThumbnailRequest& request);
  // The thumbnail of a path in whatever state and size there is: something to show until the right
  // one comes.
  ThumbnailPointer FindAny(const std::string& path) const;
  // Adds or replaces the thumbnail of a path; the least recently used ones may go.
  void Put(const ThumbnailRequest& request, ThumbnailPointer thumbnail);
  // Forgets all thumbnails.
  void Clear();
  uint64_t Bytes() const { return bytes_; }  // of all thumbnails in it
  size_t Count() const { return entries_.size(); }  // thumbnails in it

 private:
  struct Entry {
    ThumbnailRequest request;
    ThumbnailPointer thumbnail;
  };
  const uint64_t capacity_;
  uint64_t bytes_ = 0;
  std::list<Entry> entries_;  // the last used first
  std::unordered_map<std::string, std::list<Entry>::iterator> places_;
};

}  // namespace fotomill::desktop
