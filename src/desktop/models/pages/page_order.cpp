#include "desktop/models/pages/page_order.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "desktop/models/pages/order_keys.h"

namespace fotomill::desktop {

namespace {

constexpr double kSame = 1;  // papers differ by more, in millimeters

bool IsPaper(std::string_view option) { return option == "paper" || option == "landscape"; }

bool Same(const PaperSize& a, const PaperSize& b) {
  return std::abs(a.width - b.width) < kSame && std::abs(a.height - b.height) < kSame;
}

// "A4", or "120x200mm".
std::string TextOf(const PaperSize& size) {
  for (const NamedSize& paper : Papers()) {
    if (Same(paper.size, size)) return paper.name;
  }
  char text[64];
  std::snprintf(text, sizeof text, "%.0fx%.0fmm", size.width, size.height);
  return text;
}

}  // namespace

void PageOrder::Choose(std::string_view kind) {
  kind_ = &PageKindOf(kind);
  if (!std::exchange(paperLoaded_, true)) {
    for (const PageOption& option : SharedPageOptions()) {
      if (IsPaper(option.name)) paper_.Set(option.name, LoadOption("", option.name));
    }
  }
  ByKind& own = kinds_[kind_->name];
  if (std::exchange(own.loaded, true)) return;
  for (const auto options : {SharedPageOptions(), kind_->options}) {
    for (const PageOption& option : options) {
      const std::string stored = LoadOption(kind_->name, option.name);
      if (!IsPaper(option.name))
        own.values.Set(option.name, stored.empty() ? option.usual : stored);
    }
  }
}

std::string PageOrder::ValueOf(const PageOption& option) const {
  if (IsPaper(option.name)) return paper_.Text(option.name);
  return kinds_.at(kind_->name).values.Text(option.name);
}

bool PageOrder::Set(const PageOption& option, const std::string& value) {
  if (ValueOf(option) == value) return false;
  const bool paper = IsPaper(option.name);
  (paper ? paper_ : kinds_[kind_->name].values).Set(option.name, value);
  StoreOption(paper ? "" : kind_->name, option.name, value);
  return true;
}

bool PageOrder::SetPaper(const PaperSize& size) {
  const bool wide = size.width > size.height;
  bool changed = false;
  for (const PageOption& option : SharedPageOptions()) {
    if (option.name == std::string_view("paper"))
      changed = Set(option, TextOf(wide ? size.Turned() : size)) || changed;
    if (option.name == std::string_view("landscape"))
      changed = Set(option, wide ? "yes" : "") || changed;
  }
  return changed;
}

PaperSize PageOrder::Paper() const {
  const PaperSize size =
      ParseSize(paper_.Text("paper"), Papers()).value_or(PaperSize{.width = 210, .height = 297});
  return paper_.Flag("landscape") ? size.Turned() : size;
}

PageValues PageOrder::Values() const {
  PageValues values = kinds_.at(kind_->name).values;
  for (const char* const name : {"paper", "landscape"}) values.Set(name, paper_.Text(name));
  return values;
}

std::string PageOrder::Plan(PagePlan& plan) const { return PlanPages(*kind_, Values(), plan); }

}  // namespace fotomill::desktop
