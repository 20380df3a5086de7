#include "cli/frame/commands.h"

#include "cli/commands/archive/archive.h"
#include "cli/commands/config.h"
#include "cli/commands/contact_sheet.h"
#include "cli/commands/convert.h"
#include "cli/commands/doctor.h"
#include "cli/commands/exif/exif.h"
#include "cli/commands/exif/exif_edit.h"
#include "cli/commands/exif/exif_gps.h"
#include "cli/commands/faces.h"
#include "cli/commands/formats.h"
#include "cli/commands/history.h"
#include "cli/commands/info.h"
#include "cli/commands/match.h"
#include "cli/commands/operations.h"
#include "cli/commands/pages/gallery.h"
#include "cli/commands/pages/pages.h"
#include "cli/commands/plugins.h"
#include "cli/commands/recipe.h"
#include "cli/commands/rename.h"
#include "cli/commands/search/find.h"
#include "cli/commands/search/similar.h"
#include "cli/commands/tag.h"
#include "cli/commands/tdb.h"
#include "cli/commands/thumbs.h"
#include "cli/commands/touch.h"
#include "cli/commands/transcode.h"
#include "cli/commands/turn.h"
#include "cli/commands/verify.h"
#include "cli/completion/completion.h"
#include "cli/frame/manual.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// clang-format off
constexpr Command kCommands[] = {
    {"convert", TrLater("convert pictures to another format"),                          Needs::Formats,  SetUpConvert},
    {"apply",   TrLater("apply operations to pictures: resize, sharpen, crop, ..."),    Needs::Formats,  SetUpApply},
    {"operations", TrLater("list the operations, or explain one"),                      Needs::Settings, SetUpOperations},
    {"recipe list",  TrLater("list the recipes"),                                       Needs::Settings, SetUpRecipeList},
    {"recipe show",  TrLater("print a recipe"),                                         Needs::Settings, SetUpRecipeShow},
    {"recipe check", TrLater("check recipes for mistakes"),                             Needs::Settings, SetUpRecipeCheck},
    {"rename",  TrLater("rename files in sequence: a base name and a number"),          Needs::Formats,  SetUpRename},
    {"contact-sheet", TrLater("arrange pictures on pages, with their names"),           Needs::Formats,  SetUpContactSheet},
    {"pages contact", TrLater("put many pictures on pages of paper, with their names"),  Needs::Formats,  SetUpPagesContact},
    {"pages catalog", TrLater("put pictures on pages with details, a footer and links"), Needs::Formats,  SetUpPagesCatalog},
    {"pages photo",   TrLater("put photo prints of exact sizes on as few sheets as possible"), Needs::Formats, SetUpPagesPhoto},
    {"pages print",   TrLater("put each picture on a page of its own"),                 Needs::Formats,  SetUpPagesPrint},
    {"pages poster",  TrLater("put a picture on many sheets that are glued together"),  Needs::Formats,  SetUpPagesPoster},
    {"pages cube",    TrLater("put pictures on the faces of a cube to cut out"),        Needs::Formats,  SetUpPagesCube},
    {"pages dodecahedron", TrLater("put pictures on the faces of a dodecahedron to cut out"), Needs::Formats, SetUpPagesDodecahedron},
    {"pages papers",  TrLater("list papers and print sizes"),                           Needs::Settings, SetUpPagesPapers},
    {"gallery", TrLater("build a folder of web pages with pictures"),                   Needs::Formats,  SetUpGallery},
    {"gallery theme", TrLater("write the files of the built-in gallery theme"),         Needs::Nothing,  SetUpGalleryTheme},
    {"touch",   TrLater("set the times of files, such as when they were taken"),        Needs::Formats,  SetUpTouch},
    {"turn",    TrLater("rotate or flip pictures, JPEG losslessly"),                    Needs::Formats,  SetUpTurn},
    {"transcode", TrLater("store JPEG files in JPEG XL and back, without loss"),        Needs::Formats,  SetUpTranscode},
    {"tag",     TrLater("set keywords, ratings, labels and comments"),                   Needs::Formats,  SetUpTag},
    {"info",    TrLater("show size, depth and other facts without decoding pictures"),  Needs::Formats,  SetUpInfo},
    {"formats", TrLater("list the formats and what this build can do with them"),       Needs::Formats,  SetUpFormats},
    {"match",   TrLater("show which format a file name selects, without opening it"),   Needs::Formats,  SetUpMatch},
    {"exif",    TrLater("show EXIF, or extract the embedded thumbnail"),                Needs::Formats,  SetUpExif},
    {"exif set",    TrLater("set EXIF tags, everything else unchanged"),                Needs::Formats,  SetUpExifSet},
    {"exif unset",  TrLater("remove EXIF tags, everything else unchanged"),             Needs::Formats,  SetUpExifUnset},
    {"exif copy",   TrLater("copy EXIF from one picture to others"),                    Needs::Formats,  SetUpExifCopy},
    {"exif shift",  TrLater("move the dates and times in EXIF"),                        Needs::Formats,  SetUpExifShift},
    {"exif owner",  TrLater("set owner, copyright and equipment from the configuration"), Needs::Formats, SetUpExifOwner},
    {"exif gps",    TrLater("set where pictures were taken, from a track, a list or by hand"), Needs::Formats, SetUpExifGps},
    {"exif strip",  TrLater("remove metadata for good, pixels unchanged"),              Needs::Formats,  SetUpExifStrip},
    {"archive list",    TrLater("list what is in a ZIP or RAR archive"),                Needs::Settings, SetUpArchiveList},
    {"archive extract", TrLater("extract files from a ZIP or RAR archive"),             Needs::Settings, SetUpArchiveExtract},
    {"archive create",  TrLater("create a ZIP archive, encrypted if you like"),         Needs::Settings, SetUpArchiveCreate},
    {"archive test",    TrLater("verify the checksums of a ZIP or RAR archive"),        Needs::Settings, SetUpArchiveTest},
    {"faces",   TrLater("find faces in pictures"),                                      Needs::Formats,  SetUpFaces},
    {"plugins", TrLater("list the plug-in formats"),                                    Needs::Formats,  SetUpPlugins},
    {"find",    TrLater("find pictures by name, keywords, date and other facts"),       Needs::Formats,  SetUpFind},
    {"similar", TrLater("find pictures that look alike"),                               Needs::Formats,  SetUpSimilar},
    {"verify",  TrLater("decode files completely to find damaged ones"),                Needs::Formats,  SetUpVerify},
    {"config list",  TrLater("list the configuration keys and their values"),           Needs::Settings, SetUpConfigList},
    {"config get",   TrLater("print the values of keys"),                               Needs::Settings, SetUpConfigGet},
    {"config describe", TrLater("explain keys: what they do, which values they take"), Needs::Settings, SetUpConfigDescribe},
    {"config set",   TrLater("set a key"),                                              Needs::Settings, SetUpConfigSet},
    {"config unset", TrLater("reset a key to its default"),                             Needs::Settings, SetUpConfigUnset},
    {"config path",  TrLater("print the path of the configuration file"),               Needs::Settings, SetUpConfigPath},
    {"thumbs make",  TrLater("create thumbnail files of pictures"),                     Needs::Formats,  SetUpThumbsMake},
    {"thumbs show",  TrLater("write a thumbnail as a picture"),                         Needs::Formats,  SetUpThumbsShow},
    {"thumbs draw",  TrLater("write a picture scaled down to thumbnail size"),          Needs::Formats,  SetUpThumbsDraw},
    {"thumbs list",  TrLater("show which pictures of a folder have thumbnails"),        Needs::Formats,  SetUpThumbsList},
    {"thumbs clean", TrLater("delete thumbnail files without a picture"),               Needs::Formats,  SetUpThumbsClean},
    {"tdb add",      TrLater("add thumbnails of pictures to a thumbnail database"),     Needs::Formats,  SetUpTdbAdd},
    {"tdb find",     TrLater("extract a picture's thumbnail from a database"),          Needs::Settings, SetUpTdbFind},
    {"tdb list",     TrLater("list the records of a thumbnail database"),               Needs::Settings, SetUpTdbList},
    {"tdb delete",   TrLater("mark the thumbnails of pictures as deleted"),             Needs::Settings, SetUpTdbDelete},
    {"tdb compact",  TrLater("remove deleted records from a thumbnail database"),       Needs::Settings, SetUpTdbCompact},
    {"history list",  TrLater("list recently used files and what was done with them"),  Needs::Settings, SetUpHistoryList},
    {"history add",   TrLater("record the use of a file in the file history"),          Needs::Settings, SetUpHistoryAdd},
    {"history clear", TrLater("delete the file history"),                               Needs::Settings, SetUpHistoryClear},
    {"doctor",  TrLater("show paths and libraries, and what is disabled or missing"),   Needs::Formats,  SetUpDoctor},
    {"manual",  TrLater("write the man pages into a folder"),                           Needs::Nothing,  SetUpManual},
    {"completion", TrLater("print a completion script for a shell"),                    Needs::Nothing,  SetUpCompletion},
};
// clang-format on

}  // namespace

std::span<const Command> Commands() { return kCommands; }

const Command* FindCommand(std::string_view name) {
  for (const Command& command : kCommands) {
    if (command.name == name) return &command;
  }
  return nullptr;
}

}  // namespace fotomill::cli
