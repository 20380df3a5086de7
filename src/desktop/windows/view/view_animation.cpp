#include "desktop/windows/view/view_animation.h"

#include <wx/app.h>

#include <algorithm>
#include <cmath>

#include "core/workers/background_task.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/view/animation_player.h"
#include "desktop/windows/view/system_animations.h"
#include "platform/clock.h"
#include "registry/registry.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kFrameBytes = 256ull * 1024 * 1024;  // cache size

bool IsAnimation(const ViewPicturePointer& picture) {
  return picture->picture != nullptr && picture->picture->pageCount > 1 &&
         picture->request.page == 0 && FormatRow(picture->picture->formatIndex).animate != nullptr;
}

}  // namespace

ViewAnimation::ViewAnimation(ViewCanvas& canvas, AnimationBar& bar, Events events)
    : canvas_(canvas), bar_(bar), events_(std::move(events)) {
  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Tick(); });
}

ViewAnimation::~ViewAnimation() { End(); }

bool ViewAnimation::Playing() const { return Active() && player_->Playing(); }

bool ViewAnimation::MustFinish() const { return Playing() && !player_->PlayedOnce(); }

void ViewAnimation::Begin(const ViewPicturePointer& picture) {
  End();
  hasBar_ = IsAnimation(picture);
  PlaceBar();
  if (!hasBar_) return;
  ViewRequest request = picture->request;
  request.fitWidth = canvas_.DeviceSize().x;
  request.fitHeight = canvas_.DeviceSize().y;
  alive_ = std::make_shared<std::atomic<bool>>(true);
  player_ =
      std::make_unique<AnimationPlayer>(std::move(request), kFrameBytes, [this, alive = alive_] {
        if (!*alive) return;
        wxTheApp->CallAfter([this, alive] {
          if (*alive) Tick();
        });
      });
  if (SystemAnimates()) player_->Play();
  bar_.Report(player_->Playing(), 0, static_cast<size_t>(picture->picture->pageCount));
}

void ViewAnimation::HideBar(bool hide) {
  hideBar_ = hide;
  PlaceBar();
}

void ViewAnimation::PlaceBar() {
  const bool wanted = hasBar_ && !hideBar_;
  if (wanted == bar_.IsShown()) return;
  wanted ? bar_.Open() : bar_.Close();
  bar_.GetParent()->Layout();
}

void ViewAnimation::End() {
  timer_.Stop();
  if (player_ == nullptr) return;
  shown_.reset();
  *alive_ = false;
  // The current decode is no longer needed; let it finish in the background.
  (void)RunLoose([player = std::shared_ptr<AnimationPlayer>(std::move(player_))]() mutable { player.reset(); });
}

void ViewAnimation::Toggle() {
  if (player_->Playing()) {
    player_->Pause();
  } else {
    player_->Play();
  }
  Tick();
  if (!player_->Playing()) canvas_.Sharpen();
  events_.changed();
}

void ViewAnimation::Step(int frames) {
  player_->Step(frames);
  Tick();
  events_.changed();
}

void ViewAnimation::Resized() {
  if (Active()) player_->Fit(canvas_.DeviceSize().x, canvas_.DeviceSize().y);
}

void ViewAnimation::Tick() {
  if (!Active()) return;
  const double now = platform::MonotonicSeconds();
  const bool played = player_->Playing();
  ViewPicturePointer frame = player_->At(now);
  if (frame != nullptr && frame != shown_) {
    shown_ = std::move(frame);
    ShowAgain();
  }
  if (const double left = player_->SecondsLeft(now); left >= 0) {
    timer_.StartOnce(std::max(static_cast<int>(std::ceil(left * 1000)), 1));
  }
  if (played && !player_->Playing()) canvas_.Sharpen();
  bar_.Report(player_->Playing(), player_->Frame(), player_->Count());
}

void ViewAnimation::ShowAgain() {
  ViewPicturePointer dressed = shown_ == nullptr ? nullptr : events_.dressed(shown_);
  if (dressed == nullptr) return;
  canvas_.ShowFrame(std::move(dressed), player_->Playing());
  events_.changed();
}

std::string ViewAnimation::StatusText() const {
  if (!Active()) return {};
  std::string text = "animation";
  if (player_->Count() > 0) text = Tr("frame %1 of %2", player_->Frame() + 1, player_->Count());
  if (player_->Count() > 0 && !player_->Playing()) text += std::string(", ") + Tr("paused");
  if (player_->Failure() != Status::Ok) text += ", " + fotomill::StatusText(player_->Failure());
  return text;
}

}  // namespace fotomill::desktop
