#pragma once

#include <atomic>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_update.h"

namespace fotomill::desktop {

// Offers to create a folder's missing thumbnail files, in the background: searches for missing
// ones, asks, waits for the answer, and creates them on all free cores.
class ThumbnailOffer : public std::enable_shared_from_this<ThumbnailOffer> {
 public:
  // Called on the background thread.
  struct Events {
    std::function<void(int32_t count, int32_t selected)> ask;
    // slow search: files checked so far, called from time to time
    std::function<void(const std::string& text, size_t done, size_t total)> scanning;
    // the choice to save for later offers
    std::function<void(const ThumbnailUpdateOptions& options)> keep;
    std::function<void(size_t done, size_t total)> building;
    std::function<void(bool changed)> ended;
  };
  static constexpr double kSilentSeconds = 0.5;  // delay before reporting progress of the search

  // Starts the search. The object lives until its
  // thread has ended, regardless of other references.
  static std::shared_ptr<ThumbnailOffer> Start(ThumbnailBrowser browser, Events events,
                                               double silentSeconds = kSilentSeconds);

  // The answer: one of the choices, or 0, which also cancels a search before it asks.
  void Answer(int32_t choice);
  // Cancels the offer.
  void Stop();

 private:
  class Face;
  void Run(ThumbnailBrowser browser);

  Events events_;
  double silentSeconds_ = kSilentSeconds;
  std::mutex mutex_;
  std::condition_variable answered_;
  int32_t answer_ = -1;  // -1: none yet
  std::atomic<bool> stop_{false};
};

}  // namespace fotomill::desktop
