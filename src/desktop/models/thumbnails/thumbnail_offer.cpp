#include "desktop/models/thumbnails/thumbnail_offer.h"

#include "catalog/thumbnails/thumbnail_record.h"
#include "core/workers/background_task.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "core/workers/share_out.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "platform/clock.h"
#include "platform/paths.h"

namespace fotomill::desktop {

class ThumbnailOffer::Face : public ThumbnailUpdateFace {
 public:
  Face(ThumbnailOffer& offer, const ThumbnailBrowser& browser)
      : offer_(offer), folder_(browser.folder), options_(browser.options.making) {}
  bool changed = false;

  bool ShowProgress(const std::string& text, size_t done, size_t total) override {
    const double now = platform::MonotonicSeconds();
    if (now - begin_ >= offer_.silentSeconds_ && now - told_ >= kEverySeconds) {
      told_ = now;
      offer_.events_.scanning(text, done, total);
    }
    const std::lock_guard lock(offer_.mutex_);
    return !offer_.stop_ && offer_.answer_ < 0;
  }
  void AttachRecord(const std::string&, const ThumbnailRecord&) override {}
  int32_t AskForUpdate(int32_t count, int32_t selected) override {
    {
      const std::lock_guard lock(offer_.mutex_);
      if (offer_.answer_ >= 0) return offer_.answer_;  // the bar was closed during the search
    }
    offer_.events_.ask(count, selected);
    std::unique_lock lock(offer_.mutex_);
    offer_.answered_.wait(lock, [this] { return offer_.answer_ >= 0 || offer_.stop_; });
    return offer_.stop_ ? 0 : offer_.answer_;
  }
  int32_t BuildThumbnails(const std::vector<std::string>& files) override {
    std::atomic<size_t> finished{0};
    std::atomic<int32_t> made{0};
    (void)ShareOut(static_cast<int32_t>(files.size()), [&](int32_t i) {
      if (offer_.stop_) return Status::FunctionCancelled;
      const std::string path = platform::JoinFolder(folder_, files[static_cast<size_t>(i)]);
      const FolderScope folder(path);
      if (Guarded([&] { return WriteThumbnail(path, options_); }) == Status::Ok) ++made;
      offer_.events_.building(++finished, files.size());
      return Status::Ok;
    });
    changed = made > 0;
    return made;
  }
  void Refresh() override {}
  void KeepChoice(const ThumbnailUpdateOptions& options) override { offer_.events_.keep(options); }

 private:
  static constexpr double kEverySeconds = 0.1;  // between reports

  ThumbnailOffer& offer_;
  const double begin_ = platform::MonotonicSeconds();
  double told_ = 0;
  const std::string folder_;
  const ThumbnailOptions options_;
};

std::shared_ptr<ThumbnailOffer> ThumbnailOffer::Start(ThumbnailBrowser browser, Events events,
                                                      double silentSeconds) {
  auto offer = std::make_shared<ThumbnailOffer>();
  offer->silentSeconds_ = silentSeconds;
  offer->events_ = std::move(events);
  (void)RunLoose([offer, browser = std::move(browser)] {
    if (Guarded([&] { offer->Run(browser); }) != Status::Ok && !offer->stop_)
      offer->events_.ended(true);
  });
  return offer;
}

void ThumbnailOffer::Run(ThumbnailBrowser browser) {
  Face face(*this, browser);
  // The browser loads its records itself.
  if (browser.mode == choice::kVirtual) browser.mode = choice::kDiskBased;
  (void)OfferThumbnailUpdate(browser, face);
  if (!stop_) events_.ended(face.changed);
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
