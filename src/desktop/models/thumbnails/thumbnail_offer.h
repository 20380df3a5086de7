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

// The offer to make missing thumbnail files of one folder, apart: it looks for them, asks, waits
// for the answer as long as it takes, and makes them on all cores that no one else wants.
class ThumbnailOffer : public std::enable_shared_from_this<ThumbnailOffer> {
 public:
  // Called apart.
  struct Events {
    std::function<void(int32_t count, int32_t selected)> ask;
    // it takes long: files looked at, now and then
    std::function<void(const std::string& text, size_t done, size_t total)> scanning;
    // the choice, for later offers
    std::function<void(const ThumbnailUpdateOptions& options)> keep;
    std::function<void(size_t done, size_t total)> building;
    std::function<void(bool changed)> ended;
  };
  static constexpr double kSilentSeconds = 0.5;  // before it is told how far the search is

  // Begins to look for what is missing. The offer lives until its thread has ended, whoever lets go
  // of it.
  static std::shared_ptr<ThumbnailOffer> Start(ThumbnailBrowser browser, Events events,
                                               double silentSeconds = kSilentSeconds);

  // The answer: one of the choices, or 0, which also ends a search that has asked nothing yet.
  void Answer(int32_t choice);
  // The offer is withdrawn.
  void Stop();

 private:
  class Face;
  void Run(ThumbnailBrowser browser);

  Events events_;
  double silentSeconds_ = kSilentSeconds;
  std::mutex mutex_;
  std::condition_variable answered_;
  int32_t answer_ = -1;  // none yet
  std::atomic<bool> stop_{false};
};

}  // namespace fotomill::desktop
