#include "desktop/models/pages/page_preview.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "core/workers/guarded.h"
#include "desktop/models/pages/page_work.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostKept = size_t{64} << 20;  // bytes of pages
constexpr double kLeastDpi = 4, kMostDpi = 1200;
constexpr double kMostPixels = 24e6;

// The resolution at which a page has its size in the pane.
double DpiFor(const PageRequest& request, const Page& page) {
  const double fit = std::min(request.width / page.width, request.height / page.height);
  const double most = std::sqrt(kMostPixels / (page.width * page.height)) * kMmPerInch;
  const double dpi = std::clamp(fit * request.zoom * kMmPerInch, kLeastDpi, kMostDpi);
  return std::min(dpi, most);
}

}  // namespace

PagePreview::PagePreview(std::vector<BatchFile> files, std::function<void()> wake)
    : files_(std::move(files)),
      wake_(std::move(wake)),
      work_(Lane::Urgent, 1, [this] { return Next(); }) {}

PagePreview::~PagePreview() {
  closing_.Stop();
  ++latest_;  // running work stops
}

void PagePreview::Request(PageRequest request) {
  {
    const std::lock_guard lock(mutex_);
    request_ = std::move(request);
    request_.options.reading.stop = closing_.Token();
    waits_ = true;
    ++latest_;
  }
  work_.Look();
}

PageViewPointer PagePreview::Fetch() {
  const std::lock_guard lock(mutex_);
  return std::exchange(finished_, {});
}

LatestWork::Piece PagePreview::Next() {
  const std::lock_guard lock(mutex_);
  if (!std::exchange(waits_, false)) return {};
  return [this, request = request_, number = latest_.load()] { Run(request, number); };
}

void PagePreview::Run(const PageRequest& request, uint64_t number) {
  auto view = std::make_shared<PageView>();
  view->order = request.order;
  const Status status = Guarded([&] { return Make(request, number, *view); });
  if (status == Status::FunctionCancelled || !GoesOn(number)) return;
  view->status = status;
  PageViewPointer answer = Kept(*view);
  if (answer == nullptr) {
    answer = view;
    if (status == Status::Ok) Keep(answer);
  }
  {
    const std::lock_guard lock(mutex_);
    if (!GoesOn(number)) return;
    finished_ = std::move(answer);
  }
  wake_();
}

// The facts are read to the end even if other options are wanted meanwhile, as they need them too.
Status PagePreview::Make(const PageRequest& request, uint64_t number, PageView& view) {
  number_ = number;
  drawing_ = false;
  if (run_ == nullptr) {
    run_ = std::make_unique<PageRun>(
        files_, request.options,
        PageRunHost{
            .progress = {},
            .goesOn =
                [this] { return !closing_.Token().Asked() && (!drawing_ || GoesOn(number_)); },
            .tick = {}});
  }
  if (runOrder_ != request.order) {
    runOrder_ = 0;
    if (!run_->Change(request.options)) return Status::FunctionCancelled;
    runOrder_ = request.order;
  }
  AddFacts(view);
  if (view.pages == 0) return Status::Ok;
  view.page = std::min(request.page, view.pages - 1);
  const Page& page = run_->Pages()[view.page];
  view.width = page.width;
  view.height = page.height;
  view.dpi = DpiFor(request, page);
  if (Kept(view) != nullptr) return Status::Ok;
  drawing_ = true;
  PackedImage image;
  RETURN_IF_BAD(run_->DrawPage(view.page, view.dpi, image));
  AddFacts(view);
  return ToRgb(image, view.image);
}

void PagePreview::AddFacts(PageView& view) const {
  view.pages = run_->Pages().size();
  view.problems = ProblemLines(files_, run_->Outcomes());
  view.leftOut =
      static_cast<size_t>(std::ranges::count_if(run_->Outcomes(), [](const PageOutcome& outcome) {
        return outcome.status == Status::Ok && outcome.page == 0;
      }));
}

void PagePreview::Keep(const PageViewPointer& view) {
  kept_.push_back(view);
  size_t bytes = 0;
  for (const PageViewPointer& kept : kept_) bytes += kept->image.bytes.size();
  while (bytes > kMostKept) {
    bytes -= kept_.front()->image.bytes.size();
    kept_.pop_front();
  }
}

PageViewPointer PagePreview::Kept(const PageView& view) const {
  const auto place = std::ranges::find_if(kept_, [&](const PageViewPointer& kept) {
    return kept->order == view.order && kept->page == view.page && kept->dpi == view.dpi;
  });
  return place == kept_.end() ? nullptr : *place;
}

}  // namespace fotomill::desktop
