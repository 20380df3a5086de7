#pragma once

#include <map>
#include <string>
#include <string_view>

#include "printing/page_kind.h"

namespace fotomill::desktop {

// What a Print and pages window is to make: a kind of pages with the values of its options. Values
// that a key stands for come from the settings and are stored there with every change. Belongs to
// the thread of the settings.
class PageOrder {
 public:
  explicit PageOrder(std::string_view kind) { Choose(kind); }

  // Another kind; the values of each are kept. Paper and orientation are common to all.
  void Choose(std::string_view kind);
  const PageKind& Kind() const { return *kind_; }
  // The value of an option; its default if none is given.
  std::string ValueOf(const PageOption& option) const;
  // Changes a value; flags are "yes" or empty. False if it is the same.
  bool Set(const PageOption& option, const std::string& value);
  // Sets paper and orientation, in millimeters; a paper with a name gets that.
  bool SetPaper(const PaperSize& size);
  // The paper in its orientation; A4 while its text makes no sense.
  PaperSize Paper() const;
  // Makes a plan. Returns what is wrong, translated; empty on success.
  std::string Plan(PagePlan& plan) const;
  PageValues Values() const;

 private:
  struct ByKind {
    PageValues values;
    bool loaded = false;
  };

  const PageKind* kind_ = nullptr;
  PageValues paper_;  // of all kinds
  bool paperLoaded_ = false;
  std::map<std::string, ByKind> kinds_;
};

}  // namespace fotomill::desktop
