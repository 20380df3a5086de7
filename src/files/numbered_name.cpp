#include "files/numbered_name.h"

#include <utility>

#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr int kMostLostRaces = 100;

}  // namespace

VariantSearch MakeNumberedVariant(std::string& path, int64_t first, int64_t last,
                                  const TakenTest& taken, const StopToken& stop) {
  const platform::PathParts parts = platform::SplitPath(path);
  for (int64_t number = first; number <= last; ++number) {
    if (stop.Asked()) return VariantSearch::Stopped;
    if (number - first == kMostVariants) return VariantSearch::GivenUp;
    const std::string base = std::string(parts.base) + " [" + std::to_string(number) + "]";
    std::string variant = platform::JoinPath({parts.drive, parts.folder, base, parts.extension});
    const platform::Existence existence = taken(variant);
    if (existence == platform::Existence::Unknown) return VariantSearch::Unknown;
    if (existence == platform::Existence::Yes) continue;
    path = std::move(variant);
    return VariantSearch::Found;
  }
  return VariantSearch::AllTaken;
}

bool LostRace(Status status, const std::string& path) {
  return status == Status::ErrorCreatingFile && platform::IsRegularFile(path);
}

bool RetryLostRaces(const std::function<bool()>& attempt) {
  for (int race = 0; race < kMostLostRaces; ++race) {
    if (attempt()) return true;
  }
  return false;
}

}  // namespace fotomill
