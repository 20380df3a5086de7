#pragma once

#include <span>
#include <string>
#include <vector>

#include "batch/job.h"
#include "catalog/history/file_history.h"
#include "pages/gallery/gallery_build.h"
#include "pages/page_run.h"
#include "printing/page_kind.h"

namespace fotomill::desktop {

// The pictures of a selection as a batch.
std::vector<BatchFile> FilesOf(const std::vector<std::string>& paths);

// "picture.jpg: Damaged file." for each file that failed.
std::vector<std::string> ProblemLines(std::span<const BatchFile> files,
                                      std::span<const PageOutcome> outcomes);

// The function of a kind in the file history.
FileFunction HistoryFunctionOf(const PageKind& kind);

// Writes pages as a PDF file, which is replaced if it exists: opens the job's progress box, reports
// each picture, closes the box. After Abort, there is no file. Ok, FunctionCancelled, or why the
// file cannot be written.
Status WritePagesPdf(std::span<const BatchFile> files, const PagePlan& plan, FileFunction function,
                     const std::string& path, BatchJob& job);

// Builds a web gallery, with a progress box likewise. Statuses of BuildGallery.
Status WriteGallery(std::vector<BatchFile> files, const GalleryOptions& gallery, BatchJob& job);

}  // namespace fotomill::desktop
