#include "cli/commands/pages/page_command.h"

#include <algorithm>
#include <set>

#include "batch/new_job.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/frame/terminal_prompts.h"
#include "core/text.h"
#include "pages/catalog_page.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/temporary_file.h"
#include "printing/page_failure.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr int32_t kMostDpi = 2400;
constexpr double kUsualDpi = 300;  // of pages that are pictures

bool IsPdf(std::string_view name) { return EqualIgnoringCase(name, "pdf"); }

// What is wrong with the options for the output; empty if nothing is.
std::string OutputProblem(const PageCommandOptions& options) {
  const int outputs = !options.out.empty() + !options.to.empty() + !options.printer.empty();
  if (outputs == 0)
    return Tr("Name the output: --out FILE.pdf, --to EXT --dest DIR, or --printer NAME.");
  if (outputs > 1) return Tr("Only one of --out, --to and --printer can be given.");
  if (options.to.empty() != options.dest.empty()) return Tr("--to and --dest go together.");
  if (!options.out.empty() && !IsPdf(platform::ExtensionOf(options.out)))
    return Tr(
        "--out takes the name of a PDF file. For pictures of the pages, use --to EXT --dest DIR.");
  if (!options.dest.empty() && platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest))
    return Tr("\"%1\" is not a folder.", options.dest);
  return {};
}

class PageWriter {
 public:
  PageWriter(const PageCommandOptions& options, PagePlan plan, BatchJob& job,
             const CommandContext& context)
      : options_(options),
        plan_(std::move(plan)),
        job_(job),
        context_(context),
        output_(context, options.json) {}

  int Run(const Selection& selection) {
    files_ = selection.files;
    output_.CloseWith(selection.leftOut);
    output_.KeepGoing();
    PageRun run(
        files_, plan_.run,
        {.progress = [this](size_t done, size_t total) { output_.ShowProgress(done, total); },
         .goesOn = [this] { return output_.GoesOn(); },
         .tick = [this] { output_.Tick(); }});
    if (!run.Open()) return output_.Finish();
    destinations_.resize(run.Pages().size());
    Status status = Status::Ok;
    if (run.Pages().empty()) {
      if (files_.empty()) output_.Message(Tr("There is nothing to put on pages."));
    } else if (options_.to.empty()) {
      status = options_.printer.empty() ? WriteDocument(run, options_.out) : Print(run);
    } else if (IsPdf(options_.to)) {
      status = WriteNumbered(run);
    } else {
      status = WritePages(run);
    }
    if (status == Status::FunctionCancelled) return output_.Finish();
    return Report(run, status);
  }

 private:
  Status WriteDocument(PageRun& run, const std::string& path) {
    std::ranges::fill(destinations_, path);
    const bool replace = options_.overwrite == "replace";
    if (!replace && platform::ExistenceOf(path) == platform::Existence::Yes) {
      hint_ = Tr("\"%1\" exists; --overwrite replace replaces it.", path);
      return Status::ErrorCreatingFile;
    }
    if (options_.dryRun) return Status::Ok;
    const std::string folder = platform::FolderOf(path);
    if (!folder.empty() && !platform::MakeFolders(folder)) {
      hint_ = WithReason(Tr("\"%1\" cannot be created.", path));
      return Status::ErrorCreatingFile;
    }
    const Status status =
        run.WritePdf(path, replace ? platform::Existing::Replace : platform::Existing::Refuse);
    hint_ = PageFailureHint(status, path);
    return status;
  }

  // A document under the first free number.
  Status WriteNumbered(PageRun& run) {
    for (uint32_t number = 1; number < kLastCatalogPage; ++number) {
      const std::string path = platform::JoinFolder(
          options_.dest, CatalogPageName(plan_.prefix, number, options_.to));
      if (platform::ExistenceOf(path) == platform::Existence::No) return WriteDocument(run, path);
    }
    return Status::ErrorCreatingFile;
  }

  Status Print(PageRun& run) {
    std::ranges::fill(destinations_, options_.printer);
    if (options_.dryRun) return Status::Ok;
    platform::TemporaryFile file;
    if (!file.Create(".pdf")) return Status::ErrorCreatingFile;
    const Status status = run.WritePdf(file.Path(), platform::Existing::Replace);
    hint_ = PageFailureHint(status, file.Path());
    if (status != Status::Ok || run.Pages().empty()) return status;
    output_.MakeWay();
    const auto result = platform::RunAndWait(
        {"lp", "-s", "-d", options_.printer, "-t", plan_.run.title, "--", file.Path()});
    if (result == 0) return Status::Ok;
    if (!output_.GoesOn()) return Status::FunctionCancelled;
    hint_ = result ? Tr("Printer \"%1\" did not take the pages.", options_.printer)
                   : Tr("The print command \"lp\" was not found; it comes with CUPS (package "
                        "cups-client).");
    return Status::ResourceError;
  }

  Status WritePages(PageRun& run) {
    const double dpi = options_.dpi > 0 ? options_.dpi : kUsualDpi;
    for (size_t i = 0; i < run.Pages().size(); ++i) {
      PicturePointer page = NewPictureRecord();
      if (page == nullptr) return Status::MemoryAllocationError;
      if (!options_.dryRun) {
        const Status drawn = run.DrawPage(i, dpi, page->image);
        hint_ = PageFailureHint(drawn, {});
        RETURN_IF_BAD(drawn);
        page->width = page->image.Width();
        page->height = page->image.Height();
      }
      page->bitsPerPixel = 24;
      page->metadata.dpiX = page->metadata.dpiY = dpi;
      const CatalogPageOptions write{.dryRun = options_.dryRun, .prefix = plan_.prefix};
      const Status status = WriteCatalogPage(*page, write, job_, destinations_[i]);
      hint_ = PageFailureHint(status, destinations_[i]);
      RETURN_IF_BAD(status);
      pagesWritten_ = i + 1;
    }
    return Status::Ok;
  }

  int Report(const PageRun& run, Status status) {
    if (status != Status::Ok) {
      std::string name;
      if (pagesWritten_ < destinations_.size()) name = destinations_[pagesWritten_];
      if (name.empty()) name = options_.dest;  // a page that cannot be drawn
      output_.Failure(name, status, hint_);
    }
    const auto outcomes = run.Outcomes();
    const std::set<size_t> unwritten =
        status == Status::Ok ? std::set<size_t>() : PicturesFrom(run, pagesWritten_);
    for (size_t i = 0; i < files_.size(); ++i) {
      const PageOutcome& outcome = outcomes[i];
      if (outcome.status != Status::Ok) {
        output_.FileFailed(files_[i].name, outcome.status, outcome.hint);
      } else if (unwritten.contains(i)) {
        if (output_.IsJson()) output_.Element(ElementOf(files_[i].name, {}, 0, status));
      } else if (outcome.page == 0) {
        output_.FileFailed(files_[i].name, Status::UnsuitableImage, plan_.leftOut);
      } else {
        Done(files_[i].name, outcome);
      }
    }
    return output_.Finish();
  }

  // The pictures on a page and all later ones.
  static std::set<size_t> PicturesFrom(const PageRun& run, size_t first) {
    std::set<size_t> pictures;
    for (size_t page = first; page < run.Pages().size(); ++page) {
      for (const PageItem& item : run.Pages()[page].items) {
        if (const auto* const picture = std::get_if<PictureItem>(&item))
          pictures.insert(picture->picture);
      }
    }
    return pictures;
  }

  void Done(const std::string& name, const PageOutcome& outcome) {
    const std::string& destination = destinations_[static_cast<size_t>(outcome.page) - 1];
    if (!output_.IsJson()) return output_.FileDone(name, destination);
    output_.CountFile();
    output_.Element(ElementOf(name, destination, outcome.page, Status::Ok));
  }

  static Json ElementOf(const std::string& name, const std::string& destination, int32_t page,
                        Status status) {
    Json element;
    PutName(element, "file", name);
    PutName(element, "destination", destination);
    element["page"] = page;
    PutStatus(element, status);
    return element;
  }

  const PageCommandOptions& options_;
  const PagePlan plan_;
  BatchJob& job_;
  const CommandContext& context_;
  ResultOutput output_;
  std::vector<SelectedFile> files_;
  std::vector<std::string> destinations_;  // by page
  size_t pagesWritten_ = 0;                // of those in files of their own
  std::string hint_;
};

}  // namespace

void AddPageOutput(CLI::App& app, PageCommandOptions& options, CommandContext& context) {
  AddSelection(app, options.selection, context);
  AddName(app, "-o,--out", options.out, "FILE.pdf", "Write one PDF file");
  AddName(app, "-t,--to", options.to, "EXT", "Write a picture of each page, by extension");
  AddName(app, "-d,--dest", options.dest, "DIR", "Folder for --to, created if needed");
  AddName(app, "--printer", options.printer, "NAME", "Print on a printer of the system (lp)");
  AddNumber(app, "--dpi", options.dpi, "N", 10, kMostDpi,
            "Pixels per inch of pages with --to; in PDF, the most that pictures have");
  AddChoice(app, "--overwrite", options.overwrite, "HOW",
            "If --out exists: refuse (default) or replace", {"refuse", "replace"});
  AddNumber(app, "-j,--jobs", options.jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddFlag(app, "-n,--dry-run", options.dryRun, "Only show what would be done");
  AddFlag(app, "--json", options.json,
          "Print a JSON array of {file, destination, page, status, message}");
}

int RunPages(const PageCommandOptions& options, PagePlan plan, const CommandContext& context) {
  if (const std::string wrong = OutputProblem(options); !wrong.empty())
    return UsageError(context, wrong);
  BatchJob job = NewBatchJob();
  job.remember = nullptr;
  if (!options.to.empty() && !IsPdf(options.to)) {
    if (const std::string wrong = ReadDestinationFormat(options.to, job); !wrong.empty())
      return UsageError(context, wrong);
  }
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  job.destinationFolder = options.dest;
  job.naming.beside = false;
  plan.run.reading.read = job.read;
  plan.run.jobs = static_cast<uint32_t>(options.jobs);
  plan.run.title = options.out.empty() ? std::string("Fotomill")
                                       : std::string(platform::SplitPath(options.out).base);
  const int status = PageWriter(options, std::move(plan), job, context).Run(*selection);
  const int kept = FinishBatch(job, context);
  return status != kExitOk ? status : kept;
}

}  // namespace fotomill::cli
