#include "files/undo_list.h"

#include <map>
#include <utility>

#include "files/previous_file.h"

namespace fotomill {

void UndoList::Keep(std::vector<FileOperation>& list, FileOperation operation) {
  if (operation.steps.empty()) return;
  list.push_back(std::move(operation));
  Shorten(list);
}

void UndoList::Shorten(std::vector<FileOperation>& list) const {
  if (list.size() > most_) list.erase(list.begin(), list.end() - static_cast<ptrdiff_t>(most_));
}

void UndoList::SetLimit(size_t most) {
  most_ = most;
  Shorten(done_);
  Shorten(undone_);
}

void UndoList::Add(FileOperation operation) {
  if (operation.steps.empty()) return;
  undone_.clear();
  Keep(done_, std::move(operation));
}

FileOperation UndoList::PopUndo() {
  FileOperation operation = std::move(done_.back());
  done_.pop_back();
  return operation;
}

FileOperation UndoList::PopRedo() {
  FileOperation operation = std::move(undone_.back());
  undone_.pop_back();
  return operation;
}

void UndoList::KeepLast(std::vector<FileOperation>& list, FileOperation operation) const {
  if (!operation.steps.empty() && list.size() < most_)
    list.insert(list.begin(), std::move(operation));
}

void UndoList::NotUndone(FileOperation operation) { KeepLast(done_, std::move(operation)); }
void UndoList::NotRedone(FileOperation operation) { KeepLast(undone_, std::move(operation)); }

// Contents that were put back are new files, which the operations before and after must know, or
// they take them for changes by others.
void UndoList::FollowFiles(const FileOperation& operation) {
  std::map<std::string, const PreviousFile*> files;
  for (const FileStep& step : operation.steps) {
    if (step.previous != nullptr) files.emplace(step.from, step.previous.get());
  }
  if (files.empty()) return;
  for (auto* list : {&done_, &undone_}) {
    for (FileOperation& other : *list) {
      for (FileStep& step : other.steps) {
        for (FileAlong& one : step.along) {
          const auto along = files.find(one.path);
          if (along != files.end() && one.made.there) along->second->Update(one.made);
        }
        const auto found = files.find(step.to.empty() ? step.from : step.to);
        if (found == files.end()) continue;
        if (step.previous != nullptr) step.previous->Follow(*found->second);
        if (step.made.there) found->second->Update(step.made);
      }
    }
  }
}

void UndoList::Undone(FileOperation operation) {
  FollowFiles(operation);
  Keep(undone_, std::move(operation));
}

void UndoList::Redone(FileOperation operation) {
  FollowFiles(operation);
  Keep(done_, std::move(operation));
}

}  // namespace fotomill
