#include "catalog/thumbnails/thumbnail_update.h"

#include <algorithm>
#include <iterator>

#include "catalog/thumbnails/orphan_times.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "texts/texts.h"

namespace fotomill {

const ThumbnailUpdateChoice kThumbnailUpdateChoices[4] = {
    {kUpdateCreate, TrLater("&Create thumbnails now. This may take a few seconds.")},
    {kUpdateLater, TrLater("&Don't create thumbnails now, but display this prompt in the future.")},
    {kUpdateNotHere,
     TrLater("D&on't create thumbnails now and don't display this prompt again for this browser.")},
    {kUpdateNever, TrLater("Do&n't create thumbnails now and never display this prompt again. This "
                           "option can be reversed in Setup.")},
};

namespace {

using platform::DriveKind;

constexpr DriveKind kOfferedOn[] = {DriveKind::Fixed, DriveKind::Network, DriveKind::Optical,
                                    DriveKind::Ram};
constexpr DriveKind kCompactedOn[] = {DriveKind::Removable, DriveKind::Fixed, DriveKind::Network,
                                      DriveKind::Ram};

bool IsOn(const std::string& folder, std::span<const DriveKind> kinds) {
  return std::ranges::find(kinds, platform::VolumeOf(folder).kind) != kinds.end();
}

bool HasThumbnailFile(const std::string& path) {
  return platform::FileExists(ThumbnailPathFor(path));
}

// Creates records for pictures without a thumbnail file. False if canceled.
bool MakeRecordsInMemory(const ThumbnailBrowser& browser, ThumbnailUpdateFace& face) {
  for (size_t i = 0; i < browser.files.size(); ++i) {
    const std::string& file = browser.files[i];
    const std::string path = platform::JoinFolder(browser.folder, file);
    if (file.starts_with('.') || HasThumbnailFile(path)) continue;
    if (!face.ShowProgress(Tr("Creating thumbnails"), i, browser.files.size())) return false;
    ThumbnailRecord record;
    if (MakeThumbnailOfFile(path, browser.options.making, record) == Status::Ok)
      face.AttachRecord(file, record);
  }
  return true;
}

// Finds the files without a thumbnail file. False if canceled.
bool FindMissing(const ThumbnailBrowser& browser, ThumbnailUpdateFace& face,
                 std::vector<std::string>& missing) {
  const std::string text = Tr("Scanning %1", browser.folder);
  for (size_t i = 0; i < browser.files.size(); ++i) {
    if (!face.ShowProgress(text, i, browser.files.size())) return false;
    if (!HasThumbnailFile(platform::JoinFolder(browser.folder, browser.files[i])))
      missing.push_back(browser.files[i]);
  }
  return true;
}

int32_t SelectedChoice(int32_t stored) {
  return stored >= kUpdateCreate && stored <= kUpdateNever ? stored : kUpdateCreate;
}

void Keep(int32_t choice, ThumbnailBrowser& browser, ThumbnailUpdateFace& face) {
  browser.options.choice = choice;
  face.KeepChoice(browser.options);
}

void ApplyChoice(int32_t choice, const std::vector<std::string>& missing, ThumbnailBrowser& browser,
                 ThumbnailUpdateFace& face) {
  switch (choice) {
    case kUpdateCreate:
      Keep(choice, browser, face);
      if (face.BuildThumbnails(missing) > 0) face.Refresh();
      break;
    case kUpdateLater: Keep(choice, browser, face); break;
    // applies to this browser only, so the stored setting is kept
    case kUpdateNotHere: browser.asks = false; break;
    case kUpdateNever:
      browser.options.offers = false;
      Keep(choice, browser, face);
      break;
    default: break;
  }
}

}  // namespace

std::string ThumbnailUpdateQuestion(int32_t count) {
  return Tr(
      "%1 file(s) in this folder do not have display thumbnails associated with them. Fotomill can "
      "create these for you now.",
      count);
}

bool OfferThumbnailUpdate(ThumbnailBrowser& browser, ThumbnailUpdateFace& face) {
  const bool inFiles = browser.mode == choice::kDiskBased || browser.mode == choice::kVirtual;
  if (!inFiles || !IsOn(browser.folder, kOfferedOn)) return false;
  if (browser.mode == choice::kVirtual && !MakeRecordsInMemory(browser, face)) return false;
  if (IsCompactionDue(browser)) (void)RemoveOrphanThumbnails(browser);

  const bool showsThumbnails =
      browser.view >= choice::kViewSmall && browser.view <= choice::kViewLarge;
  if (!browser.options.offers || !showsThumbnails || !browser.asks || browser.files.empty())
    return false;
  std::vector<std::string> missing;
  if (!FindMissing(browser, face, missing) || missing.empty()) return false;
  ApplyChoice(face.AskForUpdate(static_cast<int32_t>(missing.size()),
                                SelectedChoice(browser.options.choice)),
              missing, browser, face);
  return true;
}

bool IsCompactionDue(const ThumbnailBrowser& browser) {
  const int64_t interval = int64_t{std::max(browser.options.compactionDays, 0)} * 86400;
  return browser.compacts && browser.options.compacts &&
         LastOrphanRemoval(browser.folder) < platform::Now() - interval;
}

bool RemoveOrphanThumbnails(const ThumbnailBrowser& browser) {
  if (!browser.options.compacts || !IsOn(browser.folder, kCompactedOn)) return false;
  const auto orphans = OrphanThumbnails(browser.folder, browser.files);
  if (!orphans) return false;
  for (const std::string& orphan : *orphans) (void)platform::DeleteFile(orphan);
  (void)KeepOrphanRemoval(browser.folder, platform::Now());
  return true;
}

}  // namespace fotomill
