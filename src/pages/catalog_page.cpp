#include "pages/catalog_page.h"

#include <algorithm>
#include <atomic>
#include <memory>
#include <utility>
#include <vector>

#include "batch/destination_name.h"
#include "batch/picture_failure.h"
#include "core/text.h"
#include "core/workers/folder_scope.h"
#include "core/workers/ordered_run.h"
#include "drawing/text_font.h"
#include "metadata/exif/picture_exif.h"
#include "pages/model/placing.h"
#include "pages/raster/raster_page.h"
#include "platform/clock.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "processing/faces/face_finder.h"
#include "processing/palette/reduce.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kPageDigits = 5;
// Most cells that may wait for earlier ones, and the most memory for them.
constexpr size_t kCellsAhead = 64;
constexpr uint64_t kBytesAhead = uint64_t{64} << 20;

// The path of the next unused page number. ErrorWritingFile if there is no number left,
// ErrorCreatingFile if existence cannot be determined.
Status NextPageName(BatchJob& job, const std::string& prefix, std::string& path) {
  platform::Existence existence;
  do {
    if (++job.catalogPage >= kLastCatalogPage) return Status::ErrorWritingFile;
    path = platform::JoinFolder(job.destinationFolder,
                                CatalogPageName(prefix, job.catalogPage, ExtensionOfFormat(job)));
    existence = platform::ExistenceOf(path);
    if (existence == platform::Existence::Unknown) return Status::ErrorCreatingFile;
  } while (existence == platform::Existence::Yes);
  return Status::Ok;
}

Status WritePage(PictureRecord& page, const CatalogPageOptions& options,
                 const Destination& destination, BatchJob& job) {
  if (options.dryRun) return Status::Ok;
  if (!job.destinationFolder.empty() && !platform::MakeFolders(job.destinationFolder))
    return Status::ErrorCreatingFile;
  WriteOptions write{.encode = job.encode};
  write.existing = destination.replace ? platform::Existing::Replace : platform::Existing::Refuse;
  write.password = destination.password;
  if (destination.recycle) write.makeWay = [&] { return platform::MoveToTrash(destination.path); };
  return WritePictureAs(page, destination.path, job.formatIndex, write);
}

class ContactSheet {
 public:
  ContactSheet(std::span<const BatchFile> files, const ContactSheetOptions& options, BatchJob& job)
      : files_(files),
        options_(options),
        job_(job),
        stop_(job.stop.Token()),
        layout_(LayoutOf(options.look, options.fontName)),
        raster_(kCatalogDpi),
        cells_(files.size()) {}

  // Whether there is a font for the names.
  Status CheckFont() const {
    TextFont font;
    return layout_.names ? font.OpenForLine(layout_.font, kCaptionHeight) : Status::Ok;
  }

  void Run() {
    const uint32_t jobs = options_.jobs == 0 ? platform::CoreCount() : options_.jobs;
    const uint64_t cellBytes = uint64_t{3} * static_cast<uint32_t>(options_.look.cellWidth) *
                               static_cast<uint32_t>(options_.look.cellHeight);
    const uint64_t room = kBytesAhead / std::max<uint64_t>(cellBytes, 1);
    OrderedRun run(
        {.work = [this](size_t i) { return Work(i); },
         .deliver = [this](size_t i, Status status) { Deliver(i, status); },
         .goesOn = [this] { return !ended_ && !stop_.Asked(); },
         .tick = [this] { Tick(); },
         .ahead = std::max<size_t>(std::min<uint64_t>(room, kCellsAhead), size_t{jobs} + 1)});
    run.Run(files_.size(), jobs);
    if (ended_ || stop_.Asked()) GiveUpPage();
    EndPage();
  }

 private:
  // A picture scaled for its cell.
  struct Cell {
    FileOutcome outcome;
    PagePicture facts;
    RasterPicture picture;  // in the first cell of a page
  };

  Status Work(size_t i) {
    const FolderScope folder(files_[i].name);
    cells_[i] = std::make_unique<Cell>();
    Cell& cell = *cells_[i];
    cell.outcome = {.source = files_[i].name, .status = files_[i].status, .hint = files_[i].hint};
    if (cell.outcome.status == Status::Ok) Draw(cell);
    return Status::Ok;
  }

  void Draw(Cell& cell) const {
    FileOutcome& outcome = cell.outcome;
    const ReadRequest request{
        .fileName = outcome.source,
        .thumbnailSide = std::max({options_.look.cellWidth, options_.look.cellHeight,
                                   options_.onFaces ? kFramingSide : 0}),
        .stop = stop_,
        .options = job_.read};
    PicturePointer picture;
    outcome.status = LoadPictureInfo(request, picture);
    if (outcome.status == Status::Ok && !options_.page.dryRun)
      outcome.status = DrawPicture(request, *picture, cell);
    if (outcome.status != Status::Ok) outcome.hint = OpenHint(outcome.source, outcome.status);
  }

  Status DrawPicture(const ReadRequest& request, PictureRecord& picture, Cell& cell) const {
    RETURN_IF_BAD(ReadPicture(request, picture));
    if (options_.upright) RETURN_IF_BAD(TurnUpright(picture));
    if (options_.onFaces)
      RETURN_IF_BAD(FrameOnFaces(picture, job_.faces, true, [this] { return !stop_.Asked(); }));
    cell.facts.width = picture.width;
    cell.facts.height = picture.height;
    const PictureItem place =
        PlacePicture(cell.facts, ContactArea(layout_, 0), PictureFit::Inside, false);
    const Rectangle page = PageSize(options_.look);
    return PrepareRasterPicture(place, {page.width, page.height}, kCatalogDpi, picture,
                                cell.picture);
  }

  void Deliver(size_t i, Status status) {
    std::unique_ptr<Cell> cell = std::move(cells_[i]);
    if (status != Status::Ok) {
      cell = std::make_unique<Cell>();
      cell->outcome = {.source = files_[i].name, .status = status};
    }
    job_.source.AssignCut(cell->outcome.source);
    if (cell->outcome.status == Status::Ok) cell->outcome.status = PutCell(*cell);
    waiting_.push_back(std::move(cell->outcome));
    if (drawn_ == options_.look.columns * options_.look.rows) EndPage();
    Tick();
  }

  Status PutCell(Cell& cell) {
    if (page_ == nullptr) RETURN_IF_BAD(NewPage());
    if (!cell.picture.image.Empty()) RETURN_IF_BAD(DrawCell(cell));
    ++drawn_;
    return Status::Ok;
  }

  Status DrawCell(Cell& cell) {
    const Rectangle first = CellPlace(options_.look, 0), place = CellPlace(options_.look, drawn_);
    cell.picture.area.x += place.x - first.x;
    cell.picture.area.y += place.y - first.y;
    cell.facts.name = platform::FileNameOf(cell.outcome.source);
    std::vector<PageItem> items;
    AddContactCell(layout_, drawn_, cell.facts, items);
    for (const PageItem& item : items) {
      if (std::holds_alternative<PictureItem>(item)) {
        raster_.Draw(cell.picture);
      } else {
        RETURN_IF_BAD(raster_.Draw(item));
      }
    }
    return Status::Ok;
  }

  Status NewPage() {
    PicturePointer page = NewPictureRecord(job_.read.alphaBackground);
    if (page == nullptr) return Status::MemoryAllocationError;
    if (!options_.page.dryRun) {
      RETURN_IF_BAD(raster_.Begin({.width = layout_.pageWidth,
                                   .height = layout_.pageHeight,
                                   .background = layout_.background}));
    }
    const Rectangle size = PageSize(options_.look);
    page->width = size.width;
    page->height = size.height;
    page->bitsPerPixel = 24;
    page_ = std::move(page);
    return Status::Ok;
  }

  // Writes the current page, if any, and reports the files waiting for it.
  void EndPage() {
    Status status = Status::Ok;
    std::string path;
    const uint32_t writeAborts = job_.writeAborts;
    if (page_ != nullptr) {
      page_->image = std::move(raster_.Image());
      status = WriteCatalogPage(*page_, options_.page, job_, path);
    }
    const bool noName = job_.writeAborts != writeAborts;
    for (FileOutcome& outcome : waiting_) {
      if (outcome.status == Status::Ok) {
        outcome.status = status;
        outcome.destination = path;
        if (status == Status::FunctionCancelled) {
          outcome.status = noName ? Status::ErrorCreatingFile : Status::Ok;
          outcome.skipped = true;
          outcome.hint = noName ? Tr(kWriteAborted) : Tr("skipped, like its page.");
          if (noName) outcome.destination.clear();
        }
        if (status == Status::TooManyColors) outcome.hint = options_.reduceHint;
        if (status == Status::ErrorCreatingFile)
          outcome.hint = WithReason(Tr("\"%1\" cannot be created.", path));
        if (status == Status::ErrorWritingFile) outcome.hint = ReasonSentence();
      }
      ReportOutcome(job_, outcome, reported_++, static_cast<uint32_t>(files_.size()));
    }
    waiting_.clear();
    page_.reset();
    drawn_ = 0;
  }

  // The current page will not be written: drops the files waiting for it, except failed ones, which
  // are still reported.
  void GiveUpPage() {
    std::erase_if(waiting_,
                  [](const FileOutcome& outcome) { return outcome.status == Status::Ok; });
    page_.reset();
  }

  void Tick() {
    if (job_.box == nullptr) return;
    job_.box->Tick();
    if (!job_.box->GoesOn()) ended_ = true;
  }

  const std::span<const BatchFile> files_;
  const ContactSheetOptions& options_;
  BatchJob& job_;
  const StopToken stop_;
  const ContactLayout layout_;
  RasterPages raster_;                        // the pixels of the page being filled
  std::vector<std::unique_ptr<Cell>> cells_;  // finished, not yet on a page
  PicturePointer page_;                       // its record
  int32_t drawn_ = 0;                         // cells on it
  std::vector<FileOutcome> waiting_;          // files on a page not yet written
  uint32_t reported_ = 0;
  std::atomic<bool> ended_{false};
};

// Writes the page under the next free number. `lostRace`: another program took the name meanwhile.
Status WriteNextPage(PictureRecord& page, const CatalogPageOptions& options, BatchJob& job,
                     std::string& path, bool& lostRace) {
  lostRace = false;
  const TakenTest taken = platform::ExistenceOf;
  const VariantMaker variant = [&](std::string& candidate) {
    return MakeNumberedVariant(candidate, job.naming.firstVariant, job.naming.lastVariant, taken,
                               job.stop.Token());
  };
  std::string name;
  const Status named =
      NextPageName(job,
                   options.prefix.empty() ? std::string(job.naming.PrefixOf(FileFunction::Catalog))
                                          : options.prefix,
                   name);
  path = name;
  RETURN_IF_BAD(named);
  Destination destination;
  destination.path = name;
  if (path.size() > PathText::Capacity()) return Status::InvalidDestination;
  const DestinationAnswer answer =
      MakeDestinationName(destination, name, TrLater("Catalogue page"), job, taken, variant, &page);
  if (destination.search == VariantSearch::GivenUp) return Status::InvalidDestination;
  if (destination.search == VariantSearch::Unknown) return Status::ErrorCreatingFile;
  if (destination.search == VariantSearch::AllTaken) ++job.writeAborts;
  if (answer == DestinationAnswer::Skip) return Status::FunctionCancelled;
  path = destination.path;
  const FormatEntry& row = FormatRow(job.formatIndex);
  if (!CanWrite(row)) return Status::UnsupportedFunction;
  const auto deepest = static_cast<int32_t>(row.maxBits);
  if (!options.reduce && page.bitsPerPixel > deepest) return Status::TooManyColors;
  if (!options.dryRun) RETURN_IF_BAD(ReduceColors(page, deepest, job.reduction));
  const Status status = WritePage(page, options, destination, job);
  lostRace = !destination.replace && LostRace(status, path);
  if (status == Status::Ok && !options.dryRun) {
    job.filesChanged = true;
    MarkChangedRecords({{PictureChange{platform::AbsolutePath(path)}}});
    if (destination.replace) DeleteThumbnailFile(path);
    job.uses.push_back({platform::AbsolutePath(path), FileFunction::Catalog, kOwnTime,
                        static_cast<int32_t>(platform::Now()), false});
  }
  return status;
}

}  // namespace

std::string CatalogPageName(std::string_view prefix, uint32_t number, std::string_view extension) {
  std::string digits = std::to_string(number);
  if (digits.size() < kPageDigits) digits.insert(0, kPageDigits - digits.size(), '0');
  return std::string(prefix) + digits + "." + LowerCase(extension);
}

Status WriteCatalogPage(PictureRecord& page, const CatalogPageOptions& options, BatchJob& job,
                        std::string& path) {
  Status status = Status::ErrorCreatingFile;
  (void)RetryLostRaces([&] {
    bool lostRace = false;
    status = WriteNextPage(page, options, job, path, lostRace);
    return !lostRace;
  });
  return status;
}

Status RunContactSheet(std::span<const BatchFile> files, const ContactSheetOptions& options,
                       BatchJob& job) {
  job.extension = ExtensionOfFormat(job);
  ContactSheet sheet(files, options, job);
  RETURN_IF_BAD(sheet.CheckFont());
  if (!options.page.dryRun && !IsDestinationWanted(job, true)) return Status::FunctionCancelled;
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  sheet.Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
