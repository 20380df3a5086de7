#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_options.h"
#include "core/choice_lists.h"

namespace fotomill {

template <int32_t side> struct SquareThumbnailRecord;
using ThumbnailRecord = SquareThumbnailRecord<96>;

// Maintains thumbnails after a browser has listed a
// folder: creates in-memory records, removes orphaned
// thumbnail files, and offers to create missing ones.

// Settings for that; see the keys.
struct ThumbnailUpdateOptions {
  bool offers = true;                     // UpdateThumbnailsFlag
  int32_t choice = 101;                   // UpdateThumbnailsOptions: the initial choice
  bool compacts = false;                  // UseThumbnailCompacting
  int32_t compactionDays = 30;            // ThumbnailCompactInterval
  ThumbnailOptions making;                // for records in memory
};

// A browser, as input and for its state.
struct ThumbnailBrowser {
  std::string folder;
  // names in its list: all files shown, without folders and drives
  std::vector<std::string> files;
  choice::ThumbnailMode mode = choice::kDiskBased;
  choice::ViewMode view = choice::kViewNormal;
  bool asks = true;            // false if the user wants no more offers here
  bool compacts = true;        // removes orphans
  ThumbnailUpdateOptions options = {};
};

// Values of UpdateThumbnailsOptions, and the texts of the dialog "Update Thumbnails", which shows
// ThumbnailUpdateQuestion, kThumbnailUpdateRequest and these choices.
inline constexpr int32_t kUpdateCreate = 101, kUpdateLater = 102, kUpdateNotHere = 103,
                         kUpdateNever = 104;
// One choice in the dialog.
struct ThumbnailUpdateChoice {
  int32_t value;
  const char* text;
};
// In display order.
extern const ThumbnailUpdateChoice kThumbnailUpdateChoices[4];
// The dialog.
inline constexpr const char* kThumbnailUpdateTitle = "Update Thumbnails";
inline constexpr const char* kThumbnailUpdateRequest =
    "Please select one of the following options.";
// `count`: files without a current thumbnail.
std::string ThumbnailUpdateQuestion(int32_t count);

// The interface to the browser window.
class ThumbnailUpdateFace {
 public:
  virtual ~ThumbnailUpdateFace() = default;
  // Shows that `done` of `total` files are processed, with a text such as "Scanning FOLDER". Return
  // false to cancel without an offer.
  virtual bool ShowProgress(const std::string& text, size_t done, size_t total) = 0;
  // Virtual mode: stores a record for a file of the list, replacing an earlier one.
  virtual void AttachRecord(const std::string& file, const ThumbnailRecord& record) = 0;
  // Shows the dialog for `count` files with an initial choice. Returns the choice, or 0 if the
  // dialog was closed.
  virtual int32_t AskForUpdate(int32_t count, int32_t selected) = 0;
  // Creates thumbnail files for these files; returns the number created.
  virtual int32_t BuildThumbnails(const std::vector<std::string>& files) = 0;
  virtual void Refresh() = 0;  // redraw the thumbnails
  // Save the choice in the options for later offers.
  virtual void KeepChoice(const ThumbnailUpdateOptions& options) { (void)options; }
};

// Runs all steps, except in the database modes and on removable drives. True if an offer was made;
// the choice is then in the browser and its options.
bool OfferThumbnailUpdate(ThumbnailBrowser& browser, ThumbnailUpdateFace& face);

// Whether the folder's next compaction is due, counting compactions by any browser in this or
// earlier runs.
bool IsCompactionDue(const ThumbnailBrowser& browser);
// Deletes thumbnail files without a file in the browser's list. False, with no change, if the
// options do not compact, on optical and unknown drives, or if the folder cannot be read. On
// success, the time is saved for the folder.
bool RemoveOrphanThumbnails(const ThumbnailBrowser& browser);

}  // namespace fotomill
