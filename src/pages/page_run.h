#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "batch/batch_file.h"
#include "batch/job.h"
#include "core/status.h"
#include "pages/model/page.h"
#include "pages/pdf/pdf_document.h"
#include "pages/picture_reading.h"

namespace fotomill {

// Makes pages from pictures, which are in selection order.
using PageGenerator = std::function<std::vector<Page>(std::span<const PagePicture>)>;

// Callbacks of a run, on the calling thread.
struct PageRunHost {
  std::function<void(size_t done, size_t total)> progress;  // in pictures
  std::function<bool()> goesOn;                             // false: cancel
  std::function<void()> tick;                               // a few times a second
};

// How to draw a selection on pages.
struct PageRunOptions {
  PageGenerator generator;
  PagePictureOptions reading;
  double dpi = 0;          // resolution of pictures; 0: PDF keeps all of their pixels
  int32_t quality = 90;    // of JPEG pictures that are reduced
  uint32_t jobs = 0;       // pictures at a time; 0: one per core
  std::string title = {};  // of the document
  // for PagePicture::texts: with macros, see operations/macros.h
  std::vector<std::string> texts = {};
  std::string copyrightHolder = {};
};

// What became of a file.
struct PageOutcome {
  Status status = Status::Ok;
  std::string hint = {};  // printed after the message
  int32_t page = 0;       // the first page it is on, from 1
};

// A selection on its way to pages.
class PageRun {
 public:
  // `files` must outlive the run.
  PageRun(std::span<const BatchFile> files, const PageRunOptions& options, PageRunHost host);

  // Reads the facts of all pictures, in parallel, and makes the pages. False if the run was
  // canceled.
  bool Open();
  // Makes the pages with other options. Facts that do not depend on what has changed are not read
  // again. False as above.
  bool Change(const PageRunOptions& options);
  // The pages, without failed pictures. Empty if there are none.
  const std::vector<Page>& Pages() const { return pages_; }
  // By file.
  std::span<const PageOutcome> Outcomes() const { return outcomes_; }

  // Writes the pages as a PDF document. Pictures that cannot be decoded are left out, and the pages
  // are made anew without them. Ok, FunctionCancelled, or why the document cannot be written.
  Status WritePdf(const std::string& path, platform::Existing existing);
  // Draws a page at a resolution. A picture that cannot be decoded leaves its place empty. Ok,
  // FunctionCancelled, MemoryAllocationError, ResourceError without a font.
  Status DrawPage(size_t page, double dpi, PackedImage& image);

 private:
  struct Need {
    size_t picture;
    int32_t width, height;  // largest use in pixels; 0: all of them
  };
  std::vector<Need> Needs() const;
  void MakePages();
  void Fail(size_t file, Status status);
  bool GoesOn() const { return !host_.goesOn || host_.goesOn(); }
  Status WritePictures(PdfDocument& document);

  std::span<const BatchFile> files_;
  PageRunOptions options_;
  const PageRunHost host_;
  std::vector<PagePicture> pictures_;  // of readable files
  std::vector<PageOutcome> outcomes_;
  std::vector<Page> pages_;
  bool opened_ = false;
};

}  // namespace fotomill
