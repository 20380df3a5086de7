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

// Imports the data folder of the previous major version: copies its configuration file, under the
// new name, and the files of `kCarriedFiles`. Existing files are never overwritten, the old ones
// are kept, and each file is copied completely or not at all. Both folders may be the same. Creates
// the new folder if there is something to copy.
CarryOver CarryOverDataFolder(const std::string& previous, const std::string& current);

// The same for the data folder if both versions share it and it has only the previous
// version's configuration file; nullopt otherwise. Call before loading the
// configuration.
std::optional<CarryOver> CarryOverAtFirstStart();
// A note about it for the user, a sentence.
std::string CarryOverText(const CarryOver& carried);

// The files to import; patterns are separated by semicolons.
inline constexpr std::string_view kPreviousConfigurationFile = "Fotomill Professional 10.ini";
// Copied unchanged.
inline constexpr std::string_view kCarriedFiles =
    "*.browser;*.txt;Fotomill.tdb;FMWFileHistoryDatabase.fhdb;*.ccl;*.list";

}  // namespace fotomill
