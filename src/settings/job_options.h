#pragma once

#include <string>

#include "core/choice_lists.h"

namespace fotomill {

struct EncodeOptions;
struct ExifTextOptions;
struct GpsLocation;
struct HistoryOptions;
struct ReadOptions;
struct ReduceOptions;
struct FaceOptions;
struct FileTimeRule;
struct TagSources;
struct ThumbnailOptions;
struct ThumbnailUpdateOptions;

// Copies of the current settings for jobs, as small structs defined
// by their subjects. Taken once when a job starts, on the thread
// that owns the settings; later changes do not affect the job.

// The settings of codecs, by the keys named in the structs. A new codec key is one field there and
// one line here.
ReadOptions ReadOptionsFromSettings();
EncodeOptions EncodeOptionsFromSettings();  // the keys named in EncodeOptions

// FXColorDither and FXMonoDither (out-of-range values become the last entry),
// FXBidirectional, FXMonomode, FXGrayLevel, FXThreshold, DitherBrightness and DitherContrast,
// each clamped to its range.
ReduceOptions ReduceOptionsFromSettings();

// ExifShowTypes.
ExifTextOptions ExifTextOptionsFromSettings();
// ExifDistinceUnits.
choice::DistanceUnit DistanceUnitFromSettings();
// ExifDefaultLocation. False, with `location` zero, if it is not set.
[[nodiscard]] bool GpsLocationFromSettings(GpsLocation& location);

HistoryOptions HistoryOptionsFromSettings();  // the keys named in HistoryOptions
FaceOptions FaceOptionsFromSettings();
ThumbnailOptions ThumbnailOptionsFromSettings();  // the keys named in ThumbnailOptions
ThumbnailUpdateOptions ThumbnailUpdateOptionsFromSettings();  // the keys named there
// Stores the user's choice about updating thumbnails.
void StoreThumbnailUpdate(const ThumbnailUpdateOptions& options);

// FileCommentPath and TextCommentExtension.
TagSources TagSourcesFromSettings();
// FileTimeYear to FileTimeSecond (now if the year is 0), FileTimeSequential, FileTimeIncrement,
// FileTimeUpdateAccess and FileTimeUpdateWrite.
FileTimeRule FileTimeRuleFromSettings();
// WriteFileComments.
bool WritesCommentsFromSettings();
// TextCommentExtension; empty if FileCommentPath is set, as comment files in a folder of their own
// may belong to pictures of other folders, and stay there when a picture moves.
std::string CommentExtensionBesideFromSettings();

}  // namespace fotomill
