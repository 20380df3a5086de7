#include "desktop/models/search/folder_search.h"

#include <algorithm>
#include <utility>

#include "batch/picture_failure.h"
#include "catalog/search/picture_search.h"
#include "core/natural_order.h"
#include "desktop/models/browser/folder_listing.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

namespace {

constexpr double kReportInterval = 0.2;  // seconds
constexpr int kDeepest = 64;             // of nested folders

class Search {
 public:
  Search(FolderSearch&& search, const StopToken& stop,
         const std::function<void(SearchNews news)>& report)
      : folder_(std::move(search.folder)),
        stop_(stop),
        report_(report),
        index_(search.index),
        search_(std::move(search.criteria), 0, WithStop(std::move(search.facts), stop), index_) {}

  void Run() {
    SearchIn("", 0);
    Report();
  }

 private:
  static FactsOptions WithStop(FactsOptions facts, const StopToken& stop) {
    facts.stop = stop;
    return facts;
  }

  void Report() {
    reported_ = platform::MonotonicSeconds();
    report_(std::exchange(news_, {}));
  }

  // `below` is relative to the searched folder.
  void SearchIn(const std::string& below, int depth) {
    const std::string folder = below.empty() ? folder_ : platform::JoinFolder(folder_, below);
    FolderListing listing = ListForBrowser(folder, false, stop_);
    if (listing.state != FolderState::Listed) {
      news_.problems.push_back(listing.problem);
      return;
    }
    std::ranges::sort(listing.items, [](const FolderItem& a, const FolderItem& b) {
      return CompareNatural(a.name, b.name) < 0;
    });
    std::vector<std::string> names, paths, folders;
    for (const FolderItem& item : listing.items) {
      std::string name = below.empty() ? item.name : platform::JoinFolder(below, item.name);
      const std::string path = platform::JoinFolder(folder_, name);
      if (!item.folder) {
        paths.push_back(path);
        names.push_back(std::move(name));
      } else if (depth < kDeepest && !platform::FactsOf(path).link) {
        folders.push_back(std::move(name));
      }
    }
    search_.Run(paths,
                {.examined = [&](size_t i, const ExaminedFile& file) { Take(names[i], file); },
                 .hint = FailureText});
    for (const std::string& next : folders) {
      if (stop_.Asked()) return;
      SearchIn(next, depth + 1);
    }
  }

  void Take(const std::string& name, const ExaminedFile& file) {
    ++news_.examined;
    if (file.found) news_.found.push_back(name);
    if (file.status != Status::Ok) {
      const std::string why = file.hint.empty() ? StatusText(file.status) : file.hint;
      news_.problems.push_back(name + ": " + why);
    }
    if (platform::MonotonicSeconds() - reported_ > kReportInterval) Report();
  }

  const std::string folder_;
  const StopToken stop_;
  const std::function<void(SearchNews news)>& report_;
  PictureIndex index_;
  PictureSearch search_;
  SearchNews news_;
  double reported_ = 0;
};

}  // namespace

void RunFolderSearch(FolderSearch search, const StopToken& stop,
                     const std::function<void(SearchNews news)>& report) {
  Search(std::move(search), stop, report).Run();
}

}  // namespace fotomill::desktop
