#include "pages/page_run.h"

#include <algorithm>
#include <cmath>
#include <map>
#include <memory>
#include <utility>

#include "batch/picture_failure.h"
#include "core/workers/folder_scope.h"
#include "core/workers/ordered_run.h"
#include "operations/macros.h"
#include "pages/raster/raster_page.h"
#include "platform/files.h"
#include "platform/process.h"
#include "processing/color/color_transform.h"
#include "processing/promote.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

constexpr size_t kAhead = 16;  // pictures that may wait for earlier ones

double Length(Point vector) { return std::hypot(vector.x, vector.y); }

std::vector<std::string> ExpandTexts(const PageRunOptions& options, const std::string& file,
                                     const PictureRecord& record) {
  if (options.texts.empty()) return {};
  const MacroFacts facts{.fileName = file,
                         .copyrightHolder = options.copyrightHolder,
                         .modified = platform::FactsOf(file).modified};
  std::vector<std::string> texts;
  for (const std::string& text : options.texts) texts.push_back(ExpandMacros(text, facts, record));
  return texts;
}

}  // namespace

PageRun::PageRun(std::span<const BatchFile> files, const PageRunOptions& options, PageRunHost host)
    : files_(files), options_(options), host_(std::move(host)), outcomes_(files.size()) {}

bool PageRun::Open() {
  opened_ = false;
  pictures_.clear();
  outcomes_.assign(files_.size(), {});
  std::vector<PagePicture> pictures(files_.size());
  OrderedRun run({.work =
                      [&](size_t i) {
                        if (files_[i].status != Status::Ok) return files_[i].status;
                        const FolderScope folder(files_[i].name);
                        PicturePointer record;
                        PagePicture& picture = pictures[i];
                        picture.id = i;
                        const Status status =
                            ReadPageFacts(files_[i].name, options_.reading, picture, record);
                        if (status == Status::Ok)
                          picture.texts = ExpandTexts(options_, files_[i].name, *record);
                        return status;
                      },
                  .deliver =
                      [&](size_t i, Status status) {
                        if (status != Status::Ok) return Fail(i, status);
                        pictures_.push_back(std::move(pictures[i]));
                      },
                  .goesOn = [this] { return GoesOn(); },
                  .tick =
                      [this] {
                        if (host_.tick) host_.tick();
                      }});
  run.Run(files_.size(), options_.jobs == 0 ? platform::CoreCount() : options_.jobs);
  if (!GoesOn()) return false;
  opened_ = true;
  MakePages();
  return true;
}

bool PageRun::Change(const PageRunOptions& options) {
  const bool known = opened_ && options.texts == options_.texts &&
                     options.reading.upright == options_.reading.upright;
  options_ = options;
  if (!known) return Open();
  MakePages();
  return true;
}

void PageRun::Fail(size_t file, Status status) {
  outcomes_[file].status = status;
  outcomes_[file].hint =
      files_[file].status != Status::Ok ? files_[file].hint : OpenHint(files_[file].name, status);
}

void PageRun::MakePages() {
  pages_.clear();
  for (PageOutcome& outcome : outcomes_) outcome.page = 0;
  if (!pictures_.empty()) pages_ = options_.generator(pictures_);
  for (size_t page = 0; page < pages_.size(); ++page) {
    for (const PageItem& item : pages_[page].items) {
      const auto* const picture = std::get_if<PictureItem>(&item);
      if (picture != nullptr && outcomes_[picture->picture].page == 0)
        outcomes_[picture->picture].page = static_cast<int32_t>(page) + 1;
    }
  }
}

std::vector<PageRun::Need> PageRun::Needs() const {
  std::vector<Need> needs;
  std::map<size_t, size_t> places;
  for (const Page& page : pages_) {
    for (const PageItem& item : page.items) {
      const auto* const picture = std::get_if<PictureItem>(&item);
      if (picture == nullptr) continue;
      const auto [place, added] = places.try_emplace(picture->picture, needs.size());
      if (added) needs.push_back({picture->picture, 0, 0});
      if (options_.dpi <= 0) continue;
      Need& need = needs[place->second];
      const auto pixels = [this](Point edge) {
        return static_cast<int32_t>(
            std::clamp(std::ceil(Length(edge) / kMmPerInch * options_.dpi), 1.0, 1e6));
      };
      need.width = std::max(need.width, pixels(picture->across));
      need.height = std::max(need.height, pixels(picture->down));
    }
  }
  return needs;
}

Status PageRun::WritePictures(PdfDocument& document) {
  const std::vector<Need> needs = Needs();
  const PdfPictureOptions options{.reading = options_.reading, .quality = options_.quality};
  std::vector<std::unique_ptr<PdfPicture>> prepared(needs.size());
  Status written = Status::Ok;
  bool failed = false;
  const auto work = [&](size_t i) {
    const std::string& file = files_[needs[i].picture].name;
    const FolderScope folder(file);
    prepared[i] = std::make_unique<PdfPicture>();
    return PreparePdfPicture(file, needs[i].width, needs[i].height, options, *prepared[i]);
  };
  const auto deliver = [&](size_t i, Status status) {
    const std::unique_ptr<PdfPicture> picture = std::move(prepared[i]);
    if (status == Status::Ok && written == Status::Ok) {
      written = document.AddPicture(needs[i].picture, *picture);
      if (document.Failed()) written = Status::ErrorWritingFile;
    } else if (status != Status::Ok) {
      failed = true;
      Fail(needs[i].picture, status);
    }
    if (host_.progress) host_.progress(i + 1, needs.size());
  };
  OrderedRun run({.work = work,
                  .deliver = deliver,
                  .goesOn = [&] { return written == Status::Ok && GoesOn(); },
                  .tick =
                      [this] {
                        if (host_.tick) host_.tick();
                      },
                  .ahead = kAhead});
  run.Run(needs.size(), options_.jobs == 0 ? platform::CoreCount() : options_.jobs);
  if (!GoesOn()) return Status::FunctionCancelled;
  RETURN_IF_BAD(written);
  if (!failed) return Status::Ok;
  std::erase_if(pictures_, [this](const PagePicture& picture) {
    return outcomes_[picture.id].status != Status::Ok;
  });
  MakePages();
  return Status::Ok;
}

Status PageRun::WritePdf(const std::string& path, platform::Existing existing) {
  PdfDocument document;
  RETURN_IF_BAD(document.Create(path));
  RETURN_IF_BAD(WritePictures(document));
  if (pages_.empty()) return Status::Ok;
  for (const Page& page : pages_) {
    RETURN_IF_BAD(document.AddPage(page));
    if (!GoesOn()) return Status::FunctionCancelled;
  }
  return document.Finish(options_.title, existing);
}

Status PageRun::DrawPage(size_t index, double dpi, PackedImage& image) {
  const Page& page = pages_[index];
  RasterPages raster(dpi);
  RETURN_IF_BAD(raster.Begin(page));
  const Size size = PixelSize(page, dpi);
  std::vector<RasterPicture> pictures(page.items.size());
  const auto work = [&](size_t i) {
    const auto* const item = std::get_if<PictureItem>(&page.items[i]);
    if (item == nullptr || outcomes_[item->picture].status != Status::Ok) return Status::Ok;
    const std::string& file = files_[item->picture].name;
    const FolderScope folder(file);
    PagePicture facts;
    PicturePointer record;
    RETURN_IF_BAD(ReadPageFacts(file, options_.reading, facts, record));
    const Size wanted = PixelSize(*item, dpi);
    RETURN_IF_BAD(ReadPagePicture(options_.reading, wanted.width, wanted.height, *record));
    const ColorTransform transform(record->metadata.icc);
    if (transform.ChangesColors()) RETURN_IF_BAD(transform.Apply(record->image));
    return PrepareRasterPicture(*item, size, dpi, *record, pictures[i]);
  };
  Status drawn = Status::Ok;
  const auto deliver = [&](size_t i, Status status) {
    const auto* const item = std::get_if<PictureItem>(&page.items[i]);
    if (status != Status::Ok && item != nullptr) return Fail(item->picture, status);
    if (item != nullptr) {
      raster.Draw(pictures[i]);
      pictures[i] = {};
    } else if (drawn == Status::Ok) {
      drawn = raster.Draw(page.items[i]);
    }
  };
  OrderedRun run({.work = work,
                  .deliver = deliver,
                  .goesOn = [&] { return drawn == Status::Ok && GoesOn(); },
                  .tick =
                      [this] {
                        if (host_.tick) host_.tick();
                      },
                  .ahead = kAhead});
  run.Run(page.items.size(), options_.jobs == 0 ? platform::CoreCount() : options_.jobs);
  if (!GoesOn()) return Status::FunctionCancelled;
  RETURN_IF_BAD(drawn);
  if (host_.progress) host_.progress(index + 1, pages_.size());
  image = std::move(raster.Image());
  return Status::Ok;
}

}  // namespace fotomill
