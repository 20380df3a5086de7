#pragma once

#include <span>
#include <string>
#include <string_view>

#include "pages/model/paper.h"
#include "pages/page_run.h"
#include "printing/page_option.h"

namespace fotomill {

// The page itself. Lengths in millimeters.
struct PageSetup {
  PaperSize paper;
  double margin = 0;
};

// What becomes of options: how to make the pages.
struct PagePlan {
  PageRunOptions run;
  std::string prefix;        // of the names of pages that are pictures
  std::string leftOut = {};  // why a picture may be on no page
};

// A kind of pages, as a row of the table.
struct PageKind {
  const char* name;    // "contact"
  const char* label;   // in a window, in English
  double (*margin)();  // the default, in millimeters
  std::span<const PageOption> options;
  // Completes a plan. Returns what is wrong with the values, empty on success.
  std::string (*complete)(const PageValues& values, const PageSetup& setup, PagePlan& plan);
  bool onPaper = true;  // else web pages: values are only checked, see gallery_plan.h
};

std::span<const PageKind* const> PageKinds();
// Finds a kind by name; there must be one.
const PageKind& PageKindOf(std::string_view name);
// The options that all kinds share: paper, landscape, margin, brightness, contrast. Besides them,
// `dpi` sets the most pixels per inch that pictures have, 0: the kind's default.
std::span<const PageOption> SharedPageOptions();

// Makes a plan from values, and from the settings for the kind: those whose keys begin with
// Catalog, Grafcat, PhotoPrn or Print. Returns what is wrong with the values, translated; empty on
// success.
std::string PlanPages(const PageKind& kind, const PageValues& values, PagePlan& plan);

}  // namespace fotomill
