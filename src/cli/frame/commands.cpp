#include "cli/frame/commands.h"

#include "cli/commands/config.h"
#include "cli/commands/contact_sheet.h"
#include "cli/commands/convert.h"
#include "cli/commands/doctor.h"
#include "cli/commands/exif.h"
#include "cli/commands/formats.h"
#include "cli/commands/history.h"
#include "cli/commands/info.h"
#include "cli/commands/match.h"
#include "cli/commands/operations.h"
#include "cli/commands/plugins.h"
#include "cli/commands/recipe.h"
#include "cli/commands/rename.h"
#include "cli/commands/tdb.h"
#include "cli/commands/thumbs.h"
#include "cli/commands/turn.h"
#include "cli/commands/verify.h"
#include "cli/frame/completion.h"

namespace fotomill::cli {

namespace {

// clang-format off
constexpr Command kCommands[] = {
    {"convert", "convert pictures to another format",                          Needs::Formats,  SetUpConvert},
    {"apply",   "apply operations to pictures: resize, sharpen, crop, ...",    Needs::Formats,  SetUpApply},
    {"operations", "list the operations, or explain one",                      Needs::Settings, SetUpOperations},
    {"recipe list",  "list the recipes",                                       Needs::Settings, SetUpRecipeList},
    {"recipe show",  "print a recipe",                                         Needs::Settings, SetUpRecipeShow},
    {"recipe check", "check recipes for mistakes",                             Needs::Settings, SetUpRecipeCheck},
    {"rename",  "number files, each under a base name or with its own",        Needs::Formats,  SetUpRename},
    {"contact-sheet", "draw pictures on pages, each with its name",            Needs::Formats,  SetUpContactSheet},
    {"turn",    "rotate or flip pictures, JPEG without loss",                  Needs::Formats,  SetUpTurn},
    {"info",    "tell what files hold, without decoding them",                 Needs::Formats,  SetUpInfo},
    {"formats", "list the formats and what this build can do with them",       Needs::Formats,  SetUpFormats},
    {"match",   "tell which format a file name selects, without opening it",   Needs::Formats,  SetUpMatch},
    {"exif",    "show the EXIF of pictures, or extract the thumbnail in it",   Needs::Formats,  SetUpExif},
    {"plugins", "list the plug-in formats",                                    Needs::Settings, SetUpPlugins},
    {"verify",  "decode files in full, to find damaged ones",                  Needs::Formats,  SetUpVerify},
    {"config list",  "list the configuration keys and their values",           Needs::Settings, SetUpConfigList},
    {"config get",   "print the values of keys",                               Needs::Settings, SetUpConfigGet},
    {"config set",   "give a key a value",                                     Needs::Settings, SetUpConfigSet},
    {"config unset", "give a key its default again",                           Needs::Settings, SetUpConfigUnset},
    {"config path",  "print where the configuration file is",                  Needs::Settings, SetUpConfigPath},
    {"thumbs make",  "make the thumbnail files of pictures",                   Needs::Formats,  SetUpThumbsMake},
    {"thumbs show",  "write a thumbnail as a picture",                         Needs::Formats,  SetUpThumbsShow},
    {"thumbs draw",  "write a picture as small as a thumbnail",                Needs::Formats,  SetUpThumbsDraw},
    {"thumbs list",  "tell which pictures of a folder have thumbnails",        Needs::Formats,  SetUpThumbsList},
    {"thumbs clean", "delete thumbnail files whose pictures are gone",         Needs::Formats,  SetUpThumbsClean},
    {"tdb add",      "add thumbnails of pictures to a thumbnail database",     Needs::Formats,  SetUpTdbAdd},
    {"tdb find",     "take a picture's thumbnail out of a database",           Needs::Settings, SetUpTdbFind},
    {"tdb list",     "list the records of a thumbnail database",               Needs::Settings, SetUpTdbList},
    {"tdb delete",   "mark a picture's thumbnails in a database deleted",      Needs::Settings, SetUpTdbDelete},
    {"tdb compact",  "take deleted records out of a thumbnail database",       Needs::Settings, SetUpTdbCompact},
    {"history list",  "list the files used last, and what for",               Needs::Settings, SetUpHistoryList},
    {"history add",   "record in the file history that a file was used",       Needs::Settings, SetUpHistoryAdd},
    {"history clear", "forget which files were used",                          Needs::Settings, SetUpHistoryClear},
    {"doctor",  "tell where things are, what is missing and why",               Needs::Formats,  SetUpDoctor},
    {"completion", "print a script that completes command lines in a shell",   Needs::Nothing,  SetUpCompletion},
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
