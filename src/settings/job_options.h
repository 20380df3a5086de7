#pragma once

#include "core/choice_lists.h"

namespace fotomill {

struct EncodeOptions;
struct ExifTextOptions;
struct GpsLocation;
struct HistoryOptions;
struct ReadOptions;
struct ReduceOptions;
struct FaceOptions;
struct ThumbnailOptions;
struct ThumbnailUpdateOptions;

// What a job needs of the settings in force, as the small structs that its subjects define. Filled
// once, where a job begins, on the thread that the settings belong to; the job then runs with its
// own copy, whatever is changed meanwhile.

// What codecs depend on, by the keys that the structs name. A new key of a codec is one field there
// and one line here.
ReadOptions ReadOptionsFromSettings();
EncodeOptions EncodeOptionsFromSettings();  // the keys that EncodeOptions names

// FXColorDither and FXMonoDither (other numbers than those of the lists as the last one),
// FXBidirectional, FXMonomode, FXGrayLevel, FXThreshold, DitherBrightness and DitherContrast, each
// clamped to its range.
ReduceOptions ReduceOptionsFromSettings();

// ExifShowTypes.
ExifTextOptions ExifTextOptionsFromSettings();
// ExifDistinceUnits.
choice::DistanceUnit DistanceUnitFromSettings();
// ExifDefaultLocation. False, with `location` at zero, when it holds no location.
[[nodiscard]] bool GpsLocationFromSettings(GpsLocation& location);

HistoryOptions HistoryOptionsFromSettings();  // the keys that HistoryOptions names
FaceOptions FaceOptionsFromSettings();
ThumbnailOptions ThumbnailOptionsFromSettings();  // the keys that ThumbnailOptions names
ThumbnailUpdateOptions ThumbnailUpdateOptionsFromSettings();  // the keys that it names
// Takes up what the user chose in the offer to update thumbnails.
void StoreThumbnailUpdate(const ThumbnailUpdateOptions& options);

// WriteFileComments.
bool WritesCommentsFromSettings();

}  // namespace fotomill
