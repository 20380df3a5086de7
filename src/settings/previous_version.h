#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// What became of the files of a previous version's data folder, by their names there.
struct CarryOver {
  std::vector<std::string> copied;
  std::vector<std::string> kept;    // the new folder has a file of that name, which stays as it is
  std::vector<std::string> failed;  // could not be copied; a later attempt may
};

// Copies what makes up a data folder from that of the previous major version: its configuration
// file, under the name that this version reads, and the files of `kCarriedFiles`. Existing files
// are never overwritten, the old ones stay where they are, and each file appears whole or not at
// all. Both folders may be the same. Whether and when to call it is for the face to decide; it
// makes the new folder when there is something to copy.
CarryOver CarryOverDataFolder(const std::string& previous, const std::string& current);

// What CarryOverDataFolder looks for in the old folder, the patterns divided by semicolons.
inline constexpr std::string_view kPreviousConfigurationFile = "Fotomill Professional 10.ini";
// Taken over as they are.
inline constexpr std::string_view kCarriedFiles =
    "*.browser;*.txt;Fotomill.tdb;FMWFileHistoryDatabase.fhdb;*.ccl;*.list";

}  // namespace fotomill
