#include "cli/commands/exif/exif_edit.h"

#include <algorithm>
#include <memory>
#include <string>

#include "batch/rewrite/exif_file.h"
#include "cli/frame/options.h"
#include "cli/selection/rewrite_options.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/exif_transfer.h"
#include "metadata/edit/strip.h"
#include "metadata/exif/exif_names.h"
#include "metadata/exif/exif_tags.h"
#include "platform/existence.h"
#include "platform/file_view.h"
#include "settings/exif_settings.h"
#include "texts/name_hint.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// Runs a rewriting command over its files.
int RunExifRewrite(RewriteOptions& options, decltype(RewriteFunction::rewrite) rewrite,
                   const CommandContext& context) {
  const auto selection = SelectForRewrite(options, context);
  if (!selection) return kExitUsage;
  RewriteFunction function = RewriteFunctionOf(options);
  function.unchanged = TrLater("already so.");
  function.listedTwice = TrLater("listed twice; already changed.");
  function.rewrite = std::move(rewrite);
  return RunRewriteJob(options, *selection, context, [&](BatchJob& job) {
    (void)RunRewrite(selection->files, function, job);  // TerminalBox always opens
  });
}

ExifChanger Always(const ExifChanges& changes) {
  return [changes](const ExifDirectories&, std::string&) { return changes; };
}

std::string UnknownTag(const std::string& name) {
  const std::vector<std::string_view> names = ExifTagNames();
  return Tr("There is no EXIF tag \"%1\".", name) + NearestNameHint(name, names);
}

bool IsFile(const std::string& name) {
  return platform::ExistenceOf(name) == platform::Existence::Yes;
}

// Splits a command line into files and TAG=VALUE, or TAG.
class TagArguments {
 public:
  explicit TagArguments(CommandContext& context) : context_(context) {}

  // Removes everything but files from the names. False after printing a message.
  bool Take(bool withValues) {
    std::vector<std::string> files;
    for (std::string& word : context_.names.values) {
      const size_t equals = word.find('=');
      if (withValues && equals == std::string::npos) {
        files.push_back(std::move(word));
        continue;
      }
      const std::string name = word.substr(0, withValues ? equals : std::string::npos);
      const auto tag = FindExifTagByName(name);
      if (!tag && (IsFile(word) || (!withValues && !IsMistyped(name)))) {
        files.push_back(std::move(word));
      } else if (!tag) {
        return Refuse(UnknownTag(name));
      } else if (!(withValues ? Set(*tag, word.substr(equals + 1)) : Unset(*tag))) {
        return false;
      }
    }
    context_.names.values = std::move(files);
    return !changes_.empty() ||
           Refuse(withValues ? Tr("Name at least one TAG=VALUE.") : Tr("Name at least one TAG."));
  }
  const ExifChanges& Changes() const { return changes_; }

 private:
  bool Refuse(const std::string& message) {
    (void)UsageError(context_, message);
    return false;
  }
  // Whether a name is neither a file nor a tag, but similar to a tag.
  static bool IsMistyped(const std::string& name) {
    const std::vector<std::string_view> names = ExifTagNames();
    return !NearestNameHint(name, names).empty();
  }

  bool Set(uint16_t tag, const std::string& text) {
    ExifEntry entry;
    std::string reason;
    if (!ParseExifInput(tag, text, entry, reason)) return Refuse(reason);
    return Add({PlaceOfExifTag(tag), tag, std::move(entry)});
  }
  bool Unset(uint16_t tag) {
    const ExifTag* row = FindExifTag(tag);
    const bool ordinary = row != nullptr && row->editClass == kExifOrdinary;
    // unknown tags in the Exif directory never affect how the picture is decoded
    if (ordinary || (row == nullptr && PlaceOfExifTag(tag) == ExifPlace::Exif))
      return Add({PlaceOfExifTag(tag), tag, {}});
    return Refuse(Tr("\"%1\" describes the structure of the file and cannot be changed.",
                     row == nullptr ? "Unknown" : row->name));
  }
  bool Add(DirectoryChange change) {
    if (std::ranges::find(changes_, change.tag, &DirectoryChange::tag) != changes_.end())
      return Refuse(Tr("\"%1\" was given twice.", ExifTagName(change.tag)));
    changes_.push_back(std::move(change));
    return true;
  }

  CommandContext& context_;
  ExifChanges changes_;
};

struct ShiftOptions {
  RewriteOptions rewrite;
  std::string by;
};

std::shared_ptr<RewriteOptions> SetUp(CLI::App& app, CommandContext& context, const char* names,
                                      const char* help) {
  auto options = std::make_shared<RewriteOptions>();
  AddSelection(app, options->selection, context);
  context.names.Declare(names, help, 0);
  AddRewriteOptions(app, *options);
  return options;
}

// Removes the first argument that is a time difference from the names.
std::optional<int64_t> TakeShift(std::vector<std::string>& names) {
  const auto found = std::ranges::find_if(
      names, [](const std::string& name) { return ParseTimeShift(name).has_value(); });
  if (found == names.end()) return {};
  const auto shift = ParseTimeShift(*found);
  names.erase(found);
  return shift;
}

// Parses a list of names to flags; none, after printing a message, for an unknown name.
std::optional<uint32_t> ParseKept(const std::string& list, const CommandContext& context) {
  if (list == "none") return 0;
  std::vector<std::string_view> names;
  for (const KeptName& known : KeptNames()) names.push_back(known.name);
  uint32_t kept = 0;
  std::string_view rest = list;
  while (true) {
    const std::string_view name = rest.substr(0, rest.find(','));
    const auto found = std::ranges::find(KeptNames(), name, &KeptName::name);
    if (found == KeptNames().end()) {
      (void)UsageError(context, Tr("--keep: \"%1\" is not one of orientation, profile, copyright, "
                                   "exif, gps, xmp, iptc, comments.",
                                   name) +
                                    NearestNameHint(name, names));
      return {};
    }
    kept |= found->bit;
    if (name.size() == rest.size()) return kept;
    rest.remove_prefix(name.size() + 1);
  }
}

struct StripOptions {
  RewriteOptions rewrite;
  std::string keep;
  bool gpsOnly = false;
};

int RunStrip(StripOptions& options, const CommandContext& context) {
  StripRequest strip{kKeepUsually, options.gpsOnly};
  if (!options.keep.empty()) {
    const auto kept = ParseKept(options.keep, context);
    if (!kept) return kExitUsage;
    strip.kept = *kept;
  }
  return RunExifRewrite(
      options.rewrite,
      [&](const std::string& source, const std::string& destination, const RewriteRequest& request,
          const WriteOptions& write) {
        return StripFile(source, destination, strip, request, write);
      },
      context);
}

}  // namespace

int RunExifEdit(RewriteOptions& options, const ExifChanger& changer,
                const CommandContext& context) {
  return RunExifRewrite(
      options,
      [&](const std::string& source, const std::string& destination, const RewriteRequest& request,
          const WriteOptions& write) {
        return EditExifFile(source, destination, changer, request, write);
      },
      context);
}

void SetUpExifSet(CLI::App& app, CommandContext& context) {
  auto options = SetUp(app, context, "FILE... TAG=VALUE...",
                       "Pictures or folders, and tags with their new values");
  SetFooter(app,
            "A tag is named as fotomill exif shows it, as the standard calls it, or by its number "
            "(0x9003). A value is typed as it\n"
            "is shown, or plain: Flash=16, \"Exposure time=1/250\", \"Orientation of image=Top "
            "Left\". JPEG, TIFF, PNG, WebP and\n"
            "HD Photo files; pixels, maker notes and everything else stay the same bytes.",
            "fotomill exif set holiday --in-place Artist=\"Ann Lee\" \"Image title=At the lake\"");
  context.run = [options, &context] {
    TagArguments arguments(context);
    if (!arguments.Take(true)) return kExitUsage;
    return RunExifEdit(*options, Always(arguments.Changes()), context);
  };
}

void SetUpExifUnset(CLI::App& app, CommandContext& context) {
  auto options =
      SetUp(app, context, "FILE... TAG...", "Pictures or folders, and tags that are removed");
  SetFooter(app,
            "A tag is named as fotomill exif shows it, as the standard calls it, or by its number "
            "(0x9003). A file that has the\n"
            "name of a tag is written with its folder: ./Flash.",
            "fotomill exif unset photo.jpg --in-place Artist \"Body serial number\"");
  context.run = [options, &context] {
    TagArguments arguments(context);
    if (!arguments.Take(false)) return kExitUsage;
    return RunExifEdit(*options, Always(arguments.Changes()), context);
  };
}

void SetUpExifCopy(CLI::App& app, CommandContext& context) {
  auto options = SetUp(app, context, "FROM TO...",
                       "The picture whose EXIF is copied, and pictures or folders that get it");
  SetFooter(
      app,
      "Everything that FROM says of who took it, when, where and how. Orientation, sizes, "
      "resolution and color space belong to the\n"
      "pixels and are not copied; maker notes would not survive the move. Other tags of TO stay.",
      "fotomill exif copy camera.jpg edited.jpg --in-place");
  context.run = [options, &context] {
    if (context.names.values.empty()) return UsageError(context, Tr("%1 is missing.", "FROM"));
    const std::string from = context.names.values.front();
    context.names.values.erase(context.names.values.begin());
    platform::FileView file;
    if (!file.Open(from))
      return UsageError(context, WithReason(Tr("\"%1\" cannot be read.", from)));
    const ExifChanges changes = CopiedEntries(GatherPictureExif(file.Bytes()));
    file.Close();
    if (changes.empty()) return UsageError(context, Tr("\"%1\" has no EXIF to copy.", from));
    return RunExifEdit(*options, Always(changes), context);
  };
}

void SetUpExifShift(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ShiftOptions>();
  AddSelection(app, options->rewrite.selection, context);
  context.names.Declare("FILE... +H:MM[:SS]",
                        "Pictures or folders, and what is added to their times", 0);
  AddName(app, "--by", options->by, "SHIFT",
          "The same as an option, for times that are subtracted: --by=-1:30:00");
  AddRewriteOptions(app, options->rewrite);
  SetFooter(app,
            "Shifts the dates and times when a picture was taken, digitized and changed. They are "
            "in the time of the camera's clock.",
            "fotomill exif shift holiday --in-place +1:30:00");
  context.run = [options, &context] {
    const auto shift =
        options->by.empty() ? TakeShift(context.names.values) : ParseTimeShift(options->by);
    if (!shift) return UsageError(context, Tr("Name a shift such as +1:30:00 or --by=-0:05."));
    return RunExifEdit(
        options->rewrite,
        [&](const ExifDirectories& old, std::string& reason) {
          return ShiftedTimes(old, *shift, reason);
        },
        context);
  };
}

void SetUpExifOwner(CLI::App& app, CommandContext& context) {
  auto options = SetUp(app, context, "FILE...", "Picture files, or folders of pictures");
  SetFooter(app,
            "Sets the tags that these configuration keys have values for: "
            "ExifPersonWhoCreatedImage, ExifCopyrightHolder,\n"
            "ExifCameraOwnerName, ExifSoftwareName, ExifEquipmentManufacturer, ExifEquipmentModel, "
            "ExifNewImageTitle.",
            "fotomill --set ExifCopyrightHolder=\"Ann Lee\" exif owner holiday --in-place");
  context.run = [options, &context] {
    ExifChanges changes;
    std::string reason;
    if (!OwnerChanges(changes, reason)) return UsageError(context, reason);
    return RunExifEdit(*options, Always(changes), context);
  };
}

void SetUpExifStrip(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<StripOptions>();
  AddSelection(app, options->rewrite.selection, context);
  CLI::Option* keep = AddName(app, "--keep", options->keep, "LIST",
                              "Metadata to keep, separated by commas: orientation, profile, "
                              "copyright, exif, gps, xmp, iptc, comments; or none "
                              "(default: orientation,profile)");
  CLI::Option* gpsOnly = AddFlag(app, "--gps-only", options->gpsOnly,
                                 "Remove only where the picture was taken, in EXIF, XMP and IPTC");
  Exclude(gpsOnly, keep);
  AddRewriteOptions(app, options->rewrite);
  SetFooter(app,
            "Removes EXIF with thumbnail, GPS and maker notes, XMP, IPTC, Photoshop data, "
            "comments, PNG texts and times, further\n"
            "pictures inside and what follows the picture. Pixels stay the same bytes. The new "
            "file is read again, and a note names what\n"
            "is left in it.",
            "fotomill exif strip holiday --dest bare");
  context.run = [options, &context] { return RunStrip(*options, context); };
}

}  // namespace fotomill::cli
