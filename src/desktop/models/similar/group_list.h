#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "desktop/models/similar/similar_run.h"

namespace fotomill::desktop {

// Which picture of a group is suggested to be kept. Equal ones are decided by size in pixels, then
// in bytes, then by date, then by order.
enum class BestRule {
  Largest,   // most pixels
  Sharpest,  // highest sharpness
  Oldest,
};

// Whether a file still is as it was searched.
enum class FileNow {
  Same,
  Changed,
  Gone,
  Unknown,  // the system cannot say, as without permission
};
FileNow StateNow(const SimilarPicture& picture);  // asks the file system

// The groups of a search, as shown: pictures that are gone are left out, and groups with fewer than
// two pictures. The best picture of each group comes first. Pictures can be ticked, to be moved to
// the trash; only those that are unchanged.
class GroupList {
 public:
  // A picture shown.
  struct Cell {
    size_t group = 0, picture = 0;  // as found
    bool best = false;
    bool ticked = false;
    FileNow now = FileNow::Same;
  };

  void SetGroups(std::vector<FoundGroup> groups);
  void SetRule(BestRule rule);
  BestRule Rule() const { return rule_; }

  // All pictures shown, group by group.
  const std::vector<Cell>& Cells() const { return cells_; }
  // The first cell of each group shown.
  const std::vector<size_t>& Starts() const { return starts_; }
  const SimilarPicture& Picture(size_t cell) const;
  // The cells of the group of a cell: from `first` to before `end`.
  struct Range {
    size_t first = 0, end = 0;
  };
  Range GroupOf(size_t cell) const;
  size_t CellOf(const std::string& path) const;  // number of cells if it is not shown

  // False if the picture has changed, so it cannot be ticked.
  bool Tick(size_t cell, bool ticked);
  // Files with several pages stay, too: the others may be in no other file.
  void TickAllButBest();
  void UntickAll();
  size_t TickedCount() const;
  uint64_t TickedBytes() const;
  std::vector<SimilarPicture> Ticked() const;
  // Number of groups of which every picture that is the same is ticked; and the way to keep one.
  size_t FullyTicked() const;
  void KeepBest();  // unticks the best of those groups

  // Paths of all pictures found, also of those not shown, and what has become of them.
  std::vector<SimilarPicture> All() const;
  void SetStates(const std::vector<FileNow>& states);  // in the same order
  // The sharpness of all pictures, in the same order.
  void SetSharpness(const std::vector<float>& sharpness);
  bool Measured() const;  // the sharpness of every picture that could be read is known

  // The files to compare for a cell: the whole group if it has up to `most` pictures, else the best
  // and those from this one on.
  std::vector<std::string> ToCompare(size_t cell, size_t most) const;

  // "3 pictures, 12.3 MB, distance 4"
  std::string GroupText(size_t start) const;
  // "a.jpg, 2 of 3, ticked" for screen readers
  std::string CellText(size_t cell) const;
  // "4 groups with 12 pictures, 7 ticked (12.3 MB)"
  std::string CountText() const;

 private:
  struct Mark {
    FileNow now = FileNow::Same;
    bool ticked = false;
  };
  void Arrange();
  size_t BestOf(size_t group) const;
  bool Better(const SimilarPicture& a, const SimilarPicture& b) const;

  std::vector<FoundGroup> groups_;
  std::vector<std::vector<Mark>> marks_;  // of each picture
  BestRule rule_ = BestRule::Largest;
  bool measured_ = false;
  std::vector<Cell> cells_;
  std::vector<size_t> starts_;
};

}  // namespace fotomill::desktop
