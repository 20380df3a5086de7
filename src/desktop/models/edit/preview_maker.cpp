#include "desktop/models/edit/preview_maker.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "batch/picture_failure.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "desktop/models/edit/preview_steps.h"
#include "metadata/exif/picture_exif.h"
#include "operations/engine.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

// A picture with what is computed from it once. Pixels do not change after loading.
struct PreviewMaker::Source {
  std::string path;
  ReadOptions read;
  FaceOptions faces;
  MacroFacts facts;
  ViewLook look;
  std::mutex loading;
  bool loaded = false;
  Status status = Status::Ok;
  PicturePointer picture;  // upright
  std::mutex reducing;
  PictureRecord reduced;  // for quick answers; empty before the first one
  double scale = 1;       // of `reduced`
  double share = 1;  // of its edges that quick answers use, so that slow operations are in time
  std::mutex applying;
  // The picture after the steps that cannot be computed for a part, and their text.
  PictureRecord base;
  std::string baseText;

  Status Load() {
    const std::lock_guard lock(loading);
    if (loaded) return status;
    status = Guarded([&] {
      const FolderScope folder(path);
      RETURN_IF_BAD(LoadPicture({.fileName = path, .partial = true, .options = read}, picture));
      return TurnUpright(*picture);
    });
    loaded = true;
    return status;
  }

  // Reduces the picture to about the size of a pane. Callers hold `reducing`.
  Status Reduce(int32_t width, int32_t height) {
    const Size size{picture->image.Width(), picture->image.Height()};
    const double fit = std::min(static_cast<double>(std::max(width, 16)) / size.width,
                                static_cast<double>(std::max(height, 16)) / size.height);
    const double wanted = std::min(fit, 1.0);
    if (!reduced.image.Empty() && scale >= wanted * 0.95 && scale <= wanted * 1.4)
      return Status::Ok;
    const Size small{std::max(1, static_cast<int32_t>(std::lround(size.width * wanted))),
                     std::max(1, static_cast<int32_t>(std::lround(size.height * wanted)))};
    PictureRecord made;
    RETURN_IF_BAD(CopyFacts(made));
    if (wanted == 1.0) {
      RETURN_IF_BAD(CopyPicture(*picture, made));
    } else {
      RETURN_IF_BAD(ScaleFiltered(picture->image, picture->alpha, ReachOf(*picture), small,
                                  {.filter = ScaleFilter::Bilinear, .work = {.threads = 0}},
                                  made.image, made.alpha));
    }
    SetReducedSize(made, wanted);
    reduced = std::move(made);
    scale = wanted;
    return Status::Ok;
  }

  // Copies the reduced picture, even smaller if the last steps were slow. Callers hold `reducing`.
  Status CopyReduced(PictureRecord& copy, double& copyScale) const {
    copyScale = scale * share;
    RETURN_IF_BAD(CopyPicture(reduced, copy));
    if (share == 1) return Status::Ok;
    const auto shared = [this](int32_t edge) {
      return std::max(1, static_cast<int32_t>(std::lround(edge * share)));
    };
    RETURN_IF_BAD(ScalePicture(copy, {shared(copy.image.Width()), shared(copy.image.Height())},
                               ScaleFilter::Bilinear));
    SetReducedSize(copy, share);
    return Status::Ok;
  }

  // The steps took this long for a quick answer; chooses the share for the next one.
  void Took(double seconds) {
    const std::lock_guard lock(reducing);
    share = NextShare(share, seconds);
  }

  // What operations need of a picture besides its pixels.
  Status CopyFacts(PictureRecord& copy) const {
    copy.fileName = picture->fileName;
    copy.metadata = picture->metadata;
    copy.alphaFlags = picture->alphaFlags;
    copy.background = picture->background;
    copy.defaultColour = picture->defaultColour;
    copy.page = picture->page;
    copy.pageCount = picture->pageCount;
    return Status::Ok;
  }
};

namespace {

// Converts a result for the screen.
Status ToScreen(PictureRecord& picture, const ViewLook& look, ViewPixels& pixels) {
  if (look.profiles) ToScreenColors(picture.metadata.icc, look.screen, picture.image);
  picture.metadata.exif.clear();  // it is upright
  RETURN_IF_BAD(PrepareWithAlpha(picture));
  pixels.image = std::move(picture.image);
  pixels.alpha = std::move(picture.alpha);
  return Status::Ok;
}

}  // namespace

Rectangle VisiblePart(const ViewTransform& transform, Size whole, int32_t width, int32_t height) {
  const double scale = transform.Scale();
  const auto from = [scale](int32_t start) {
    return std::max(0, static_cast<int32_t>(std::floor(-start / scale)));
  };
  const auto to = [scale](int32_t start, int32_t pane, int32_t most) {
    return std::min(most, static_cast<int32_t>(std::ceil((pane - start) / scale)));
  };
  const int32_t left = from(transform.X()), top = from(transform.Y());
  return {left, top, std::max(1, to(transform.X(), width, whole.width) - left),
          std::max(1, to(transform.Y(), height, whole.height) - top)};
}

PreviewMaker::PreviewMaker(std::function<void()> wake)
    : wake_(std::move(wake)),
      quick_(Lane::Urgent, 1, [this] { return NextQuick(); }),
      exact_(Lane::Urgent, 1, [this] { return NextExact(); }) {}

PreviewMaker::~PreviewMaker() { ++latest_; }  // running work stops

void PreviewMaker::SetPicture(const std::string& path) {
  auto source = std::make_shared<Source>();
  source->path = path;
  source->read = ReadOptionsFromSettings();
  source->faces = FaceOptionsFromSettings();
  source->look = ViewLook::FromSettings();
  source->facts = {.fileName = path,
                   .copyrightHolder = std::string(settings.ExifCopyrightHolder.view()),
                   .modified = platform::FactsOf(path).modified};
  const std::lock_guard lock(mutex_);
  source_ = std::move(source);
  quickWaits_ = exactWaits_ = false;
  finished_.clear();
  ++latest_;
}

void PreviewMaker::Request(PreviewRequest request) {
  {
    const std::lock_guard lock(mutex_);
    if (source_ == nullptr) return;
    request_ = std::move(request);
    request_.asked = platform::MonotonicSeconds();
    quickWaits_ = exactWaits_ = true;
    ++latest_;
  }
  quick_.Look();
}

std::vector<PreviewPointer> PreviewMaker::Fetch() {
  const std::lock_guard lock(mutex_);
  return std::exchange(finished_, {});
}

LatestWork::Piece PreviewMaker::NextQuick() {
  const std::lock_guard lock(mutex_);
  if (!std::exchange(quickWaits_, false)) return {};
  return [this, job = Job{request_, source_, latest_.load()}] {
    Run(job, false);
    exact_.Look();
  };
}

LatestWork::Piece PreviewMaker::NextExact() {
  const std::lock_guard lock(mutex_);
  if (quickWaits_ || !std::exchange(exactWaits_, false)) return {};
  return [this, job = Job{request_, source_, latest_.load()}] { Run(job, true); };
}

// Whether the visible part is computed at once, as it has at most as many pixels as the screen.
bool PreviewMaker::StartsExact(const Job& job) const {
  if (LocalSteps(job.request.list) < job.request.list.size()) return false;
  ViewTransform transform;
  transform.SetPicture(job.source->picture->image.Width(), job.source->picture->image.Height());
  transform.SetWindow(job.request.width, job.request.height);
  transform.SetPlace(job.request.place);
  return transform.Scale() >= 1;
}

// The quick answers, or with `exact` the later ones.
void PreviewMaker::Run(const Job& job, bool exact) {
  if (Guarded([&] { return job.source->Load(); }) != Status::Ok)
    return exact ? void() : Answer(job, job.source->status, std::make_shared<Preview>());
  const Make make =
      StartsExact(job) == exact ? &PreviewMaker::MakeReduced : &PreviewMaker::MakeExact;
  MakeOne(job, false, make);
  if (!job.request.original || !GoesOn(job.number)) return;
  Job plain = job;
  plain.request.list.clear();
  MakeOne(plain, true, make);
}

void PreviewMaker::MakeOne(const Job& job, bool original, Make make) {
  auto preview = std::make_shared<Preview>();
  preview->original = original;
  const Status status = Guarded([&] { return (this->*make)(job, *preview); });
  Answer(job, status, std::move(preview));
}

EngineOptions PreviewMaker::OptionsFor(const Job& job) const {
  EngineOptions options;
  options.work.threads = 0;
  options.work.goesOn = [this, number = job.number] { return GoesOn(number); };
  options.facts = job.source->facts;
  options.faces = job.source->faces;
  return options;
}

Status PreviewMaker::MakeReduced(const Job& job, Preview& preview) {
  Source& source = *job.source;
  PictureRecord picture;
  double scale = 1;
  {
    const std::lock_guard lock(source.reducing);
    RETURN_IF_BAD(source.Reduce(job.request.width, job.request.height));
    RETURN_IF_BAD(source.CopyReduced(picture, scale));
  }
  const std::vector<Step> steps = ReducedSteps(job.request.list, scale);
  const double start = platform::MonotonicSeconds();
  const Status status = ApplySteps(picture, steps, OptionsFor(job));
  const double seconds = platform::MonotonicSeconds() - start;
  if (status == Status::Ok || seconds > kQuickSeconds) source.Took(seconds);
  RETURN_IF_BAD(status);
  const auto grown = [scale](int32_t edge) {
    return std::max(1, static_cast<int32_t>(std::lround(edge / scale)));
  };
  preview.whole = {grown(picture.image.Width()), grown(picture.image.Height())};
  if (job.request.list.empty())
    preview.whole = {source.picture->image.Width(), source.picture->image.Height()};
  preview.area = {0, 0, preview.whole.width, preview.whole.height};
  return ToScreen(picture, source.look, preview.pixels);
}

Status PreviewMaker::MakeExact(const Job& job, Preview& preview) {
  Source& source = *job.source;
  const std::vector<Step>& list = job.request.list;
  const EngineOptions options = OptionsFor(job);
  const std::span<const Step> all(list);
  const auto first = all.first(list.size() - LocalSteps(list));
  std::string text;
  for (const Step& step : first) text += PrintStep(step) + "\n";
  std::unique_lock lock(source.applying, std::defer_lock);
  if (!first.empty()) lock.lock();
  if (!first.empty() && source.baseText != text) {
    source.baseText.clear();
    RETURN_IF_BAD(CopyPicture(*source.picture, source.base));
    RETURN_IF_BAD(ApplySteps(source.base, first, options));
    source.baseText = text;
  }
  const PictureRecord& base = first.empty() ? *source.picture : source.base;
  preview.whole = {base.image.Width(), base.image.Height()};
  ViewTransform transform;
  transform.SetPicture(preview.whole.width, preview.whole.height);
  transform.SetWindow(job.request.width, job.request.height);
  transform.SetPlace(job.request.place);
  preview.area = VisiblePart(transform, preview.whole, job.request.width, job.request.height);
  preview.exact = true;
  PictureRecord part;
  RETURN_IF_BAD(ApplyStepsToArea(base, all.subspan(first.size()), preview.area, options, part));
  part.metadata.icc = base.metadata.icc;
  if (transform.Scale() < 1) {
    const auto shown = [&](int32_t edge) {
      return std::max(1, static_cast<int32_t>(std::lround(edge * transform.Scale())));
    };
    RETURN_IF_BAD(ScalePicture(part, {shown(preview.area.width), shown(preview.area.height)},
                               {.filter = ScaleFilter::Bilinear, .work = options.work}));
  }
  return ToScreen(part, source.look, preview.pixels);
}

void PreviewMaker::Answer(const Job& job, Status status, std::shared_ptr<Preview> preview) {
  if (status == Status::FunctionCancelled || !GoesOn(job.number)) return;
  preview->steps = job.request.steps;
  preview->view = job.request.view;
  preview->status = status;
  if (status != Status::Ok) {
    preview->problem = job.source->status != Status::Ok ? FailureText(job.source->path, status)
                                                        : StatusText(status);
    const std::string hint = job.source->status == Status::Ok ? WorkHint(status) : std::string();
    if (!hint.empty()) preview->problem += " " + hint;
  }
  preview->seconds = platform::MonotonicSeconds() - job.request.asked;
  {
    const std::lock_guard lock(mutex_);
    if (!GoesOn(job.number)) return;
    finished_.push_back(std::move(preview));
  }
  wake_();
}

}  // namespace fotomill::desktop
