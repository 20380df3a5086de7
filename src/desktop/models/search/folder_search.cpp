#include "desktop/models/search/folder_search.h"

#include <utility>

#include "batch/picture_failure.h"
#include "catalog/search/picture_search.h"
#include "desktop/models/files/folder_walk.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

namespace {

constexpr double kReportInterval = 0.2;  // seconds

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
    WalkFolder(folder_, true, stop_,
               {.files = [this](const std::vector<std::string>& names) { SearchIn(names); },
                .problem = [this](const std::string& why) { news_.problems.push_back(why); }});
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

  void SearchIn(const std::vector<std::string>& names) {
    std::vector<std::string> paths;
    for (const std::string& name : names) paths.push_back(platform::JoinFolder(folder_, name));
    search_.Run(paths,
                {.examined = [&](size_t i, const ExaminedFile& file) { Take(names[i], file); },
                 .hint = FailureText});
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
