#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_options.h"
#include "core/choice_lists.h"

namespace fotomill {

template <int32_t side> struct SquareThumbnailRecord;
using ThumbnailRecord = SquareThumbnailRecord<96>;

// What a browser does about thumbnails once it has listed a folder: makes the records that live in
// memory only, removes thumbnail files that have lost their picture, and offers to make those that
// are missing.

// How the user wants that: the keys named.
struct ThumbnailUpdateOptions {
  bool offers = true;                     // UpdateThumbnailsFlag
  int32_t choice = 101;                   // UpdateThumbnailsOptions: what the box begins with
  bool compacts = false;                  // UseThumbnailCompacting
  int32_t compactionDays = 30;            // ThumbnailCompactInterval
  ThumbnailOptions making;                // of records in memory
};

// What the work needs to know of a browser, and what it keeps in it.
struct ThumbnailBrowser {
  std::string folder;
  // names in its list, all files of the folder that it shows, without folders and drives
  std::vector<std::string> files;
  choice::ThumbnailMode mode = choice::kDiskBased;
  choice::ViewMode view = choice::kViewNormal;
  bool asks = true;            // false once its user wants no more offers here
  bool compacts = true;        // removes orphans
  ThumbnailUpdateOptions options = {};
};

// Values of UpdateThumbnailsOptions and the texts of the box "Update Thumbnails", which shows
// ThumbnailUpdateQuestion, kThumbnailUpdateRequest and these choices.
inline constexpr int32_t kUpdateCreate = 101, kUpdateLater = 102, kUpdateNotHere = 103,
                         kUpdateNever = 104;
// One of the answers that the offer lets the user choose.
struct ThumbnailUpdateChoice {
  int32_t value;
  const char* text;
};
// In the order in which they are shown.
extern const ThumbnailUpdateChoice kThumbnailUpdateChoices[4];
// Of the window with the question.
inline constexpr const char* kThumbnailUpdateTitle = "Update Thumbnails";
inline constexpr const char* kThumbnailUpdateRequest =
    "Please select one of the following options.";
// `count`: files without a thumbnail that is up to date.
std::string ThumbnailUpdateQuestion(int32_t count);

// The window of a browser, as far as this needs it.
class ThumbnailUpdateFace {
 public:
  virtual ~ThumbnailUpdateFace() = default;
  // `done` of `total` files are dealt with under a text such as "Scanning FOLDER". False gives up,
  // as nothing had been offered.
  virtual bool ShowProgress(const std::string& text, size_t done, size_t total) = 0;
  // Virtual mode: keeps a record with a file of the list, in place of an earlier one.
  virtual void AttachRecord(const std::string& file, const ThumbnailRecord& record) = 0;
  // Shows the box for so many files with a choice selected. The choice made, or 0 when the box was
  // closed without one.
  virtual int32_t AskForUpdate(int32_t count, int32_t selected) = 0;
  // Makes the thumbnail files of these files of the list; how many were made.
  virtual int32_t BuildThumbnails(const std::vector<std::string>& files) = 0;
  virtual void Refresh() = 0;  // the browser draws its thumbnails anew
  // The choice that the options hold is to be kept for later offers.
  virtual void KeepChoice(const ThumbnailUpdateOptions& options) { (void)options; }
};

// All of it. Never in the database modes, nor on removable drives. True when an offer was made;
// what was chosen is then in the browser and its options.
bool OfferThumbnailUpdate(ThumbnailBrowser& browser, ThumbnailUpdateFace& face);

// Whether so much time has passed since the folder's last compaction that the next one is due; in
// this run or an earlier one, by whatever browser.
bool IsCompactionDue(const ThumbnailBrowser& browser);
// Deletes thumbnail files to which no file of the browser's list belongs. False, and nothing
// happens, unless the options compact, on optical drives and drives of a kind unknown, or when the
// folder cannot be read. The time of a successful run is kept for the folder.
bool RemoveOrphanThumbnails(const ThumbnailBrowser& browser);

}  // namespace fotomill
