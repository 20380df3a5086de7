#include "files/rename_plan.h"

#include <algorithm>
#include <map>
#include <unordered_map>
#include <utility>

namespace fotomill {

namespace {

class Planner {
 public:
  explicit Planner(std::span<const RenamedFile> files) : files_(files), planned_(files.size()) {
    for (size_t i = 0; i < files.size(); ++i) byOldName_.emplace(files[i].from, i);
  }

  std::vector<RenameGroup> Plan(const std::function<std::string(const std::string&)>& spareName) {
    std::unordered_map<std::string_view, size_t> newNames;
    for (size_t i = 0; i < files_.size(); ++i) {
      if (newNames.emplace(files_[i].to, i).second) continue;
      planned_[i] = true;
      late_.push_back(i);
    }
    for (size_t i = 0; i < files_.size(); ++i) {
      if (!planned_[i]) AddFrom(i, spareName);
    }
    for (const size_t i : late_) groups_.push_back({StepOf(i)});
    return std::move(groups_);
  }

 private:
  RenameStep StepOf(size_t i) const { return {i, files_[i].from, files_[i].to}; }

  // Adds a file, after those that have to give up their names for it.
  void AddFrom(size_t first, const std::function<std::string(const std::string&)>& spareName) {
    std::vector<size_t> chain;
    for (size_t next = first;;) {
      planned_[next] = true;
      chain.push_back(next);
      const auto holder = byOldName_.find(files_[next].to);
      if (holder == byOldName_.end()) break;
      next = holder->second;
      if (next == first) return AddCircle(chain, spareName);
      if (planned_[next]) break;
    }
    for (size_t i = chain.size(); i > 0; --i) groups_.push_back({StepOf(chain[i - 1])});
  }

  void AddCircle(const std::vector<size_t>& chain,
                 const std::function<std::string(const std::string&)>& spareName) {
    const RenamedFile& first = files_[chain[0]];
    const std::string spare = spareName(first.from);
    RenameGroup group{{chain[0], first.from, spare}};
    for (size_t i = chain.size(); i > 1; --i) group.push_back(StepOf(chain[i - 1]));
    group.push_back({chain[0], spare, first.to});
    groups_.push_back(std::move(group));
  }

  const std::span<const RenamedFile> files_;
  std::vector<bool> planned_;
  std::unordered_map<std::string_view, size_t> byOldName_;
  std::vector<size_t> late_;
  std::vector<RenameGroup> groups_;
};

}  // namespace

std::vector<RenameGroup> PlanRenames(
    std::span<const RenamedFile> files,
    const std::function<std::string(const std::string& path)>& spareName) {
  return Planner(files).Plan(spareName);
}

std::vector<RenamedFile> RenamesToUndo(std::span<const RenamedFile> steps,
                                       const std::function<bool(const std::string& path)>& exists) {
  struct Moved {
    std::string first, before;  // its names at first, and before its last step
  };
  std::map<std::string, size_t> byName;  // the present names
  std::vector<Moved> files;
  std::vector<std::string> names;
  for (const RenamedFile& step : steps) {
    const auto known = byName.find(step.from);
    size_t place = files.size();
    if (known != byName.end()) {
      place = known->second;
      byName.erase(known);
      files[place].before = step.from;
      names[place] = step.to;
    } else {
      files.push_back({step.from, step.from});
      names.push_back(step.to);
    }
    byName[step.to] = place;
  }
  std::vector<RenamedFile> renames;
  for (size_t i = 0; i < files.size(); ++i) {
    const auto holder = byName.find(names[i]);
    if (holder == byName.end() || holder->second != i || files[i].first == names[i]) continue;
    if (exists(names[i]) || !exists(files[i].before)) renames.push_back({files[i].first, names[i]});
  }
  return renames;
}

}  // namespace fotomill
