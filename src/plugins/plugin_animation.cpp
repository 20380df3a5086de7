#include "plugins/plugin_animation.h"

#include <algorithm>
#include <utility>

#include "plugins/plugin_bridge.h"
#include "processing/promote.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// Modules return whole frames, so each one replaces the last.
class PluginAnimation final : public Animation {
 public:
  explicit PluginAnimation(ReadRequest request) : request_(std::move(request)) {
    request_.thumbnailSide = 0;
    // The spare row may be bound to another format by the time a frame is read.
    bound_ = "x." + std::string(FormatRow(kSpareRow).extension.view());
  }
  Status Open() {
    PluginFrames frames;
    RETURN_IF_BAD(DescribePluginFrames(request_, frames));
    delays_ = std::move(frames.delays);
    rounds_ = frames.rounds;
    return CheckPackedSize(frames.width, frames.height, 24);
  }

 private:
  Status Compose(size_t frame) override {
    (void)FindPluginFormat(bound_);
    request_.page = static_cast<int32_t>(frame);
    PictureRecord picture;
    RETURN_IF_BAD(PluginInfo(picture, request_));
    picture.stop = request_.stop;
    RETURN_IF_BAD(PluginRead(picture, request_));
    if (frame > 0 &&
        (picture.width != canvas_.image.Width() || picture.height != canvas_.image.Height()))
      return Status::DamagedFile;
    if (picture.image.Bits() != 24) return Status::UnsupportedFormat;
    RETURN_IF_BAD(PromotePicture(picture));
    if (picture.alpha.Empty()) {
      RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, picture.alpha));
      std::ranges::fill(picture.alpha.Rows(), uint8_t{255});
    }
    canvas_.image = std::move(picture.image);
    canvas_.alpha = std::move(picture.alpha);
    return Status::Ok;
  }

  ReadRequest request_;
  std::string bound_;
};

}  // namespace

Status PluginAnimate(const ReadRequest& request, AnimationPointer& animation) {
  auto opened = std::make_unique<PluginAnimation>(request);
  RETURN_IF_BAD(opened->Open());
  animation = std::move(opened);
  return Status::Ok;
}

}  // namespace fotomill
