#include "desktop/models/thumbnails/thumbnail_offer.h"

#include <thread>

#include "desktop/models/thumbnails/thumbnail.h"
#include "desktop/models/thumbnails/thumbnail_loader.h"
#include "platform/paths.h"

namespace fotomill::desktop {

class ThumbnailOffer::Face : public ThumbnailUpdateFace {
 public:
  Face(ThumbnailOffer& offer, const ThumbnailBrowser& browser)
      : offer_(offer), folder_(browser.folder), options_(browser.options.making) {}
  bool changed = false;

  bool ShowProgress(const std::string&, size_t, size_t) override { return !offer_.stop_; }
  void AttachRecord(const std::string&, const ThumbnailRecord&) override {}
  int32_t AskForUpdate(int32_t count, int32_t selected) override {
    offer_.events_.ask(count, selected);
    std::unique_lock lock(offer_.mutex_);
    offer_.answered_.wait(lock, [this] { return offer_.answer_ >= 0 || offer_.stop_; });
    return offer_.stop_ ? 0 : offer_.answer_;
  }
  int32_t BuildThumbnails(const std::vector<std::string>& files) override {
    std::atomic<size_t> next{0}, finished{0};
    std::atomic<int32_t> made{0};
    const auto work = [&] {
      for (size_t i = next++; i < files.size() && !offer_.stop_; i = next++) {
        if (WriteThumbnail(platform::JoinFolder(folder_, files[i]), options_) == Status::Ok) ++made;
        offer_.events_.building(++finished, files.size());
      }
    };
    std::vector<std::thread> workers;
    for (unsigned i = 1; i < WorkerCount(); ++i) workers.emplace_back(work);
    work();
    for (std::thread& worker : workers) worker.join();
    changed = made > 0;
    return made;
  }
  void Refresh() override {}
  void KeepChoice(const ThumbnailUpdateOptions& options) override { offer_.events_.keep(options); }

 private:
  ThumbnailOffer& offer_;
  const std::string folder_;
  const ThumbnailOptions options_;
};

std::shared_ptr<ThumbnailOffer> ThumbnailOffer::Start(ThumbnailBrowser browser, Events events) {
  auto offer = std::make_shared<ThumbnailOffer>();
  offer->events_ = std::move(events);
  std::thread([offer, browser = std::move(browser)]() mutable { offer->Run(std::move(browser)); }).detach();
  return offer;
}

void ThumbnailOffer::Run(ThumbnailBrowser browser) {
  Face face(*this, browser);
  // Records of the list itself are not needed: the browser loads what it shows.
  if (browser.mode == choice::kVirtual) browser.mode = choice::kDiskBased;
  (void)OfferThumbnailUpdate(browser, face);
  if (!stop_) events_.ended(face.changed, browser);
}

void ThumbnailOffer::Answer(int32_t choice) {
  {
    const std::lock_guard lock(mutex_);
    answer_ = choice;
  }
  answered_.notify_all();
}

void ThumbnailOffer::Stop() {
  {
    const std::lock_guard lock(mutex_);
    stop_ = true;
  }
  answered_.notify_all();
}

}  // namespace fotomill::desktop
