#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// Result of CarryOverDataFolder, as file names in the old folder.
struct CarryOver {
  std::vector<std::string> copied;
  std::vector<std::string> kept;    // the new folder already has such a file, which is left alone
  std::vector<std::string> failed;  // could not be copied; may be retried
};

// Imports the data folder of the previous major version: copies its configuration file, under its
// new name, and the files of `kCarriedFiles`. Existing files are never overwritten, the old ones
// stay in place, and each file is copied completely or not at all. Both folders may be the same.
// Creates the new folder if there is something to copy.
CarryOver CarryOverDataFolder(const std::string& previous, const std::string& current);

// The same for the data folder itself, which both versions share, if it has the previous version's
// configuration file and none of this version; nullopt otherwise. To be called before the
// configuration is loaded.
std::optional<CarryOver> CarryOverAtFirstStart();
// The note about it for the user, a sentence.
std::string CarryOverText(const CarryOver& carried);

// The files to import; patterns are separated by semicolons.
inline constexpr std::string_view kPreviousConfigurationFile = "Fotomill Professional 10.ini";
// Copied unchanged.
inline constexpr std::string_view kCarriedFiles =
    "*.browser;*.txt;Fotomill.tdb;FMWFileHistoryDatabase.fhdb;*.ccl;*.list";

}  // namespace fotomill
