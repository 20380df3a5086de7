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

// Loads thumbnails on pool threads, in order of priority. The request in a result says if it is a
// stand-in; its thumbnail is null if there is none. If the proper one was available for a stand-in
// request, it is not loaded again.
class ThumbnailLoader {
 public:
  // A finished request.
  struct Result {
    ThumbnailRequest request;
    ThumbnailPointer thumbnail;
  };
  using Load = ThumbnailPointer (*)(const ThumbnailRequest& request);

  // `wake` is called on a worker when new results are available, `idle` on the worker that finished
  // the last request.
  ThumbnailLoader(unsigned atOnce, std::function<void()> wake, Load load = LoadThumbnail,
                  void (*idle)() = KeepThumbnailRecords);
  // Waits for running requests.
  ~ThumbnailLoader() = default;
  ThumbnailLoader(const ThumbnailLoader&) = delete;
  ThumbnailLoader& operator=(const ThumbnailLoader&) = delete;

  // Sets the wanted thumbnails, most urgent first. Pending requests are replaced; running ones
  // finish.
  void Want(std::vector<ThumbnailRequest> requests);
  std::vector<Result> FetchResults();  // results since the last call
  // Number of pending and running requests.
  size_t Pending() const;

 private:
  LatestWork::Piece Next();
  void LoadOne(ThumbnailRequest request);

  const std::function<void()> wake_;
  const Load load_;
  void (*const idle_)();
  mutable std::mutex mutex_;
  std::vector<ThumbnailRequest> requests_;  // most urgent last
  std::vector<ThumbnailRequest> inWork_;    // one per thread
  std::vector<Result> results_;
  LatestWork work_;  // must be last: it uses the other members
};

// Number of thumbnails to load in parallel, leaving one core for the windows.
unsigned ThumbnailsAtOnce();

// Loaded thumbnails: an LRU cache, bounded in bytes.
class ThumbnailCache {
 public:
  explicit ThumbnailCache(uint64_t capacity) : capacity_(capacity) {}  // bytes
  // Null if not cached, or cached for another state of the file or another size.
  ThumbnailPointer Find(const ThumbnailRequest& request);
  // Any thumbnail of a path, regardless of state and
  // size, to show until the right one is loaded.
  ThumbnailPointer FindAny(const std::string& path) const;
  // Adds or replaces the thumbnail of a path; may drop the least recently used ones.
  void Put(const ThumbnailRequest& request, ThumbnailPointer thumbnail);
  // Removes all thumbnails.
  void Clear();
  // Changes the limit in bytes; may drop the least recently used ones.
  void SetCapacity(uint64_t capacity);
  uint64_t Capacity() const { return capacity_; }   // bytes
  uint64_t Bytes() const { return bytes_; }         // of all thumbnails
  size_t Count() const { return entries_.size(); }  // number of thumbnails

 private:
  struct Entry {
    ThumbnailRequest request;
    ThumbnailPointer thumbnail;
  };
  void Shrink();

  uint64_t capacity_;
  uint64_t bytes_ = 0;
  std::list<Entry> entries_;  // most recently used first
  std::unordered_map<std::string, std::list<Entry>::iterator> places_;
};

}  // namespace fotomill::desktop
