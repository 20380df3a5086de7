#include "cli/commands/exif/exif_gps.h"

#include <memory>
#include <string>

#include "cli/commands/exif/exif_edit.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/edit/gps_place.h"
#include "metadata/gps.h"
#include "platform/file_view.h"
#include "settings/exif_settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct GpsOptions {
  RewriteOptions rewrite;
  std::string gpx, offset, at, place;
};

// Looks up a place by name. Returns an error message, empty on success.
std::string ReadListedPlace(const std::string& name, GpsPlace& place) {
  std::string list;
  if (const std::string wrong = ReadLocations(list); !wrong.empty()) return wrong;
  size_t badLine = 0;
  const auto found = FindListedPlace(list, name, badLine);
  if (found) {
    place = *found;
    return {};
  }
  const std::string path = LocationsPath();
  if (badLine != 0) return Tr("Line %1 of \"%2\" is not a place: NAME = LAT,LON.", badLine, path);
  return Tr("There is no place \"%1\" in \"%2\".", name, path);
}

// Reads a track; `hint` is the reason for a failure, a sentence.
Status ReadTrack(const std::string& path, GpsTrack& track, std::string& hint) {
  platform::FileView file;
  if (!file.Open(path)) {
    hint = ReasonSentence();
    return Status::FileOpenError;
  }
  const Status status = track.Parse(file.Bytes());
  if (status != Status::Ok) hint = Tr("\"%1\" is not a GPX track.", path);
  if (status != Status::Ok || !track.Empty()) return status;
  hint = Tr("\"%1\" has no points with a time.", path);
  return Status::InformationError;
}

// Creates the changer for the options; `track` is read later. Returns an error message, empty on
// success.
std::string MakeChanger(const GpsOptions& options, const std::shared_ptr<GpsTrack>& track,
                        ExifChanger& changer) {
  const int ways = (options.gpx.empty() ? 0 : 1) + (options.at.empty() ? 0 : 1) +
                   (options.place.empty() ? 0 : 1);
  if (ways != 1) return Tr("Choose one of --gpx, --at and --place.");
  if (!options.offset.empty() && options.gpx.empty()) return Tr("--offset needs --gpx.");
  const auto offset = ParseTimeShift(options.offset);
  if (!options.offset.empty() && !offset)
    return Tr("\"%1\" is not an offset such as +1:30:00.", options.offset);
  if (!options.gpx.empty()) {
    changer = [track, offset](const ExifDirectories& old, std::string& reason) {
      return TrackPlace(*track, offset, old, reason);
    };
    return {};
  }
  GpsPlace place;
  std::string wrong;
  if (!options.place.empty()) {
    wrong = ReadListedPlace(options.place, place);
  } else if (!ParseGpsDegrees(options.at, place.latitude, place.longitude)) {
    wrong = Tr("\"%1\" is not LAT,LON in decimal degrees.", options.at);
  }
  changer = [place](const ExifDirectories&, std::string&) { return PlaceEntries(place); };
  return wrong;
}

}  // namespace

void SetUpExifGps(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<GpsOptions>();
  AddSelection(app, options->rewrite.selection, context);
  AddName(app, "--gpx", options->gpx, "TRACK",
          "Take the places from a GPX track, by the time each picture was taken");
  AddName(app, "--offset", options->offset, "SHIFT",
          "What is added to the camera's time to get that of the track, UTC: +1:30:00 (default: "
          "the EXIF offset, else 0)");
  AddName(app, "--at", options->at, "LAT,LON",
          "The place in decimal degrees, north and east positive");
  AddName(app, "--place", options->place, "NAME", "A place of the list ExifLocationsFile");
  AddRewriteOptions(app, options->rewrite);
  SetFooter(app,
            "A track gives latitude, longitude, altitude and time; between two points they are "
            "interpolated. A line of ExifLocationsFile, in the\n"
            "data folder unless it has a path, is NAME = LAT,LON in decimal degrees, or as in "
            "ExifDefaultLocation.",
            "fotomill exif gps holiday --in-place --gpx walk.gpx --offset=-2:00");
  context.run = [options, &context] {
    ExifChanger changer;
    const auto track = std::make_shared<GpsTrack>();
    if (const std::string wrong = MakeChanger(*options, track, changer); !wrong.empty())
      return UsageError(context, wrong);
    std::string hint;
    const Status status =
        options->gpx.empty() ? Status::Ok : ReadTrack(options->gpx, *track, hint);
    if (status != Status::Ok) {
      ResultOutput output(context, options->rewrite.json);
      output.FileFailed(options->gpx, status, hint);
      return output.Finish();
    }
    return RunExifEdit(options->rewrite, changer, context);
  };
}

}  // namespace fotomill::cli
