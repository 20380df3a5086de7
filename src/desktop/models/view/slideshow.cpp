#include "desktop/models/view/slideshow.h"

#include <algorithm>
#include <numeric>
#include <string>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/ini_file.h"
#include "core/limits.h"
#include "core/whole_number.h"
#include "platform/files.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "FMWSlideshow.txt";
constexpr const char* kSection = "Slideshow";

int32_t NumberOf(std::string_view text, std::string_view key, int32_t least, int32_t most,
                 int32_t otherwise) {
  const auto value = FindIniValue(text, kSection, key);
  const auto number = value ? ParseNumber(*value) : std::nullopt;
  return number && *number >= least && *number <= most ? *number : otherwise;
}

}  // namespace

SlideshowChoices LoadSlideshowChoices() {
  std::string text;
  const std::string path = DataFile(kFile);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  const SlideshowChoices first;
  return {NumberOf(text, "Seconds", 1, SlideshowChoices::kMostSeconds, first.seconds),
          NumberOf(text, "Random", 0, 1, first.random ? 1 : 0) != 0,
          NumberOf(text, "Repeat", 0, 1, first.repeat ? 1 : 0) != 0};
}

bool SaveSlideshowChoices(const SlideshowChoices& choices) {
  const std::string seconds = std::to_string(choices.seconds);
  const IniEdit edits[] = {{"Seconds", seconds},
                           {"Random", choices.random ? "1" : "0"},
                           {"Repeat", choices.repeat ? "1" : "0"}};
  const EditResult result =
      EditTextFile(DataFile(kFile), limits.listFileBytes,
                   [&](std::string& text) { text = EditIni(text, kSection, edits); });
  return result == EditResult::Done || result == EditResult::Unchanged;
}

Slideshow::Slideshow(const SlideshowChoices& choices, size_t count, size_t place, uint32_t seed)
    : choices_(choices), random_(seed) {
  BeginRound(place, count);
}

// Starts with the current place, so that it is not repeated.
void Slideshow::BeginRound(size_t first, size_t count) {
  order_.resize(count);
  std::iota(order_.begin(), order_.end(), size_t{0});
  std::shuffle(order_.begin(), order_.end(), random_);
  if (first < count) std::iter_swap(order_.begin(), std::ranges::find(order_, first));
  shown_ = 1;
}

std::optional<size_t> Slideshow::Upcoming() const {
  return choices_.random && shown_ < order_.size() ? std::optional(order_[shown_]) : std::nullopt;
}

std::optional<size_t> Slideshow::Next(size_t place, size_t count) {
  if (count == 0) return {};
  if (!choices_.random) {
    if (place + 1 < count) return place + 1;
    return choices_.repeat ? std::optional<size_t>(0) : std::nullopt;
  }
  if (order_.size() != count) BeginRound(place, count);
  if (shown_ < count) return order_[shown_++];
  if (!choices_.repeat) return {};
  BeginRound(place, count);
  // The new round starts with a different place than the current one, which may come anywhere
  // later.
  if (count > 1)
    std::iter_swap(order_.begin(),
                   order_.begin() + static_cast<std::ptrdiff_t>(1 + random_() % (count - 1)));
  return order_.front();
}

}  // namespace fotomill::desktop
