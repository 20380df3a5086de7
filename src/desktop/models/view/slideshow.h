#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <random>
#include <vector>

namespace fotomill::desktop {

// The user's slideshow settings.
struct SlideshowChoices {
  static constexpr int32_t kMostSeconds = 3600;

  int32_t seconds = 4;  // per picture, 1 to kMostSeconds
  bool random = false;  // false: list order
  bool repeat = true;   // start over after the last picture

  bool operator==(const SlideshowChoices&) const = default;
};

// The saved settings, from the file "FMWSlideshow.txt" in the data folder: Seconds, Random and
// Repeat in the section [Slideshow]. Missing or invalid values get defaults.
SlideshowChoices LoadSlideshowChoices();
// False if they cannot be written.
[[nodiscard]] bool SaveSlideshowChoices(const SlideshowChoices& choices);

// The order of a slideshow through a list.
class Slideshow {
 public:
  // Starts at `place` in a list of `count`; the same seed gives the same order.
  Slideshow(const SlideshowChoices& choices, size_t count, size_t place, uint32_t seed);

  // The place after the current one, `place`; none at the end. In random order, every place comes
  // once per round, and never twice in a row. If the length of the list changes, a new round
  // starts.
  std::optional<size_t> Next(size_t place, size_t count);
  // The next place, if it does not depend on list order.
  std::optional<size_t> Upcoming() const;

 private:
  void BeginRound(size_t first, size_t count);

  SlideshowChoices choices_;
  std::mt19937 random_;
  std::vector<size_t> order_;  // of a random round
  size_t shown_ = 0;           // number of those already shown
};

}  // namespace fotomill::desktop
