#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Things done to files that can be taken back.
enum class DeedKind {
  Rename,
  Move,
  Copy,
  Trash,
  Create,  // a function wrote `to` from `from`, in nobody's place
  Turn,    // the picture in `from` was rotated or flipped
};

class PreviousFile;

// One file of a deed, by absolute paths.
struct FileStep {
  std::string from;
  std::string to;                               // empty for Trash and Turn
  std::shared_ptr<PreviousFile> previous = {};  // Turn: what the file was before; after TakeBack, what it was before that
};

// What was done in one go, in order.
struct FileDeed {
  DeedKind kind = DeedKind::Rename;
  std::vector<FileStep> steps;
};

// Why a step was not done.
struct DeedFailure {
  std::string path;
  std::string reason;  // a whole sentence
};

// What came of a deed: the steps that were done, and why others were not.
struct DeedResult {
  FileDeed done;
  std::vector<DeedFailure> failures;
  std::string note = {};  // a remark on what was done, as a sentence
};

// Told before each step; false ends the deed there.
using DeedProgress = std::function<bool(size_t index, size_t count)>;

// The steps of a deed on files and folders: into `folder` under their own names, or into the trash. Files that are there
// already are left out of a move, and a copy gets a number, as it does where the name is taken.
FileDeed PlanDeed(DeedKind kind, const std::vector<std::string>& paths, const std::string& folder = {});

// Does the steps of a deed. Nothing is ever replaced: where a name is taken meanwhile the step fails. Files keep their
// times. May take long; any thread.
DeedResult CarryOut(const FileDeed& deed, const DeedProgress& progress = {});
// Takes a deed back, last step first: files go back to where they were, copies that nobody has changed and outputs go to
// the trash.
DeedResult TakeBack(const FileDeed& deed, const DeedProgress& progress = {});

// Deletes files permanently, and folders with what is in them.
DeedResult DeleteForGood(const std::vector<std::string>& paths, const DeedProgress& progress = {});

// "rename of 12 files", "move of beach.jpg"
std::string DeedName(const FileDeed& deed);

// What can be taken back and done again, up to a number of deeds.
class UndoList {
 public:
  explicit UndoList(size_t most) : most_(most) {}
  // A new deed; what had been taken back can no longer be done again. Deeds without steps are not kept.
  void Add(FileDeed deed);
  bool CanUndo() const { return !done_.empty(); }
  bool CanRedo() const { return !undone_.empty(); }
  std::string UndoName() const { return CanUndo() ? DeedName(done_.back()) : std::string(); }
  std::string RedoName() const { return CanRedo() ? DeedName(undone_.back()) : std::string(); }
  // Hands out what is to be taken back or done again; the result comes back by Undone or Redone.
  FileDeed TakeUndo();
  FileDeed TakeRedo();
  void Undone(FileDeed deed);
  void Redone(FileDeed deed);

 private:
  void Keep(std::vector<FileDeed>& list, FileDeed deed);

  const size_t most_;
  std::vector<FileDeed> done_, undone_;
};

}  // namespace fotomill::desktop
