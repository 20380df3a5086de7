// Animations written by modules.

#include <utility>

#include "plugins/frame_file.h"
#include "plugins/plugin_bridge.h"

namespace fotomill {

namespace {

class PluginSequence final : public SequenceWriter {
 public:
  explicit PluginSequence(const WriteOptions& options) : options_(options) {}

  Status Create(const std::string& path, int32_t rounds) {
    first_ = NewPictureRecord({});
    if (first_ == nullptr || !first_->fileName.Assign(path)) return Status::ErrorCreatingFile;
    frames_.facts.rounds = rounds;
    return frames_.Create();
  }

  Status Add(PictureRecord& picture, int32_t delayMs) override {
    if (frames_.facts.delays.empty()) {
      first_->metadata = picture.metadata;
      first_->comment = picture.comment;
    }
    return frames_.Add(picture, delayMs);
  }

  Status Finish() override {
    RETURN_IF_BAD(frames_.Finish());
    return PluginWriteFrames(*first_, frames_.facts, options_);
  }

 private:
  const WriteOptions options_;
  PicturePointer first_;  // name and metadata, no pixels
  FrameFileWriter frames_;
};

}  // namespace

Status PluginSequenceBegin(const std::string& path, const SequenceFacts& facts,
                           const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<PluginSequence>(options);
  RETURN_IF_BAD(made->Create(path, facts.rounds));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
