#include "batch/progress_model.h"

#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kBoxWidth = 420, kBoxHeight = 430, kFrameMargin = 16;
constexpr int32_t kListMargin = 5, kBelowList = 64;
constexpr int32_t kStatusX = 8, kStatusUp = 50, kStatusHeight = 16;
constexpr int32_t kButtonWidth = 64, kButtonHeight = 22, kButtonUp = 30;
constexpr int32_t kThumbnailRow = 54;

}  // namespace

void ProgressModel::Open() {
  *this = ProgressModel();
  open_ = abortLive_ = true;
}

void ProgressModel::AddLine(ProgressLine line) {
  if (line.item.file >= 0) ++files_;
  lines_.push_back(std::move(line));
}

void ProgressModel::Finish(bool errors, bool summary, const ProgressSettings& box) {
  if (errors) AddLine({Tr(kErrorsLine), {}});
  if (summary) {
    AddLine({CountLine(files_), {}});
    selected_ = static_cast<int32_t>(lines_.size()) - 1;
  }
  status_ = CountLine(files_);  // no file is being processed now
  if (!errors && box.closeWhenDone) return Close();
  scrollBar_ = closeLive_ = true;
  abortLive_ = false;
}

std::string CountLine(uint32_t files) {
  return files == 0 ? Tr("No files were processed.")
                    : TrCount("One file was processed.", "%1 files were processed.", files);
}

Rectangle ProgressBoxPlace(int32_t frameWidth, int32_t frameHeight, const ProgressSettings& box) {
  const int32_t height = box.optimizeWindow ? frameHeight - kFrameMargin : kBoxHeight;
  return {(frameWidth - kBoxWidth) / 2, (frameHeight - height) / 2, kBoxWidth, height};
}

ProgressLayout LayOutProgressBox(int32_t clientWidth, int32_t clientHeight,
                                 const ProgressSettings& box) {
  const int32_t half = clientWidth / 2;
  const int32_t buttonX = (half - kButtonWidth) / 2, buttonY = clientHeight - kButtonUp;
  ProgressLayout layout;
  layout.list = {kListMargin, kListMargin, clientWidth - 2 * kListMargin,
                 clientHeight - kBelowList};
  layout.status = {kStatusX, clientHeight - kStatusUp, clientWidth - 2 * kStatusX, kStatusHeight};
  layout.abort = {buttonX, buttonY, kButtonWidth, kButtonHeight};
  layout.close = {half + buttonX, buttonY, kButtonWidth, kButtonHeight};
  if (box.optimizeWindow) {
    layout.kind =
        box.showMissingThumbnails ? ProgressListKind::FixedRows : ProgressListKind::VariableRows;
    if (box.thumbnails && box.showMissingThumbnails) layout.rowHeight = kThumbnailRow;
  }
  return layout;
}

}  // namespace fotomill
