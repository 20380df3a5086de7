#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <random>
#include <vector>

namespace fotomill::desktop {

// What the user chose of a slide show.
struct SlideshowChoices {
  static constexpr int32_t kMostSeconds = 3600;

  int32_t seconds = 4;  // that a picture stays, 1 to kMostSeconds
  bool random = false;  // else in the order of the list
  bool repeat = true;   // from the beginning after the last picture

  bool operator==(const SlideshowChoices&) const = default;
};

// The choices of the last time, kept in the data folder in the file "FMWSlideshow.txt": Seconds,
// Random and Repeat in the section [Slideshow]. What is not there or makes no sense is as at first.
SlideshowChoices LoadSlideshowChoices();
// False when they could not be written.
[[nodiscard]] bool SaveSlideshowChoices(const SlideshowChoices& choices);

// The order in which a slideshow goes through the places of a list.
class Slideshow {
 public:
  // Begins at `place` of a list of `count`; equal seeds give equal orders.
  Slideshow(const SlideshowChoices& choices, size_t count, size_t place, uint32_t seed);

  // The place that comes after `place`, which is shown; none at the end. In random order every
  // place comes once in a round, and none twice in a row. A list of another length begins a new
  // round.
  std::optional<size_t> Next(size_t place, size_t count);
  // The place that comes next, as far as that is no matter of the list's order.
  std::optional<size_t> Upcoming() const;

 private:
  void BeginRound(size_t first, size_t count);

  SlideshowChoices choices_;
  std::mt19937 random_;
  std::vector<size_t> order_;  // of a random round
  size_t shown_ = 0;           // how many of them have been
};

}  // namespace fotomill::desktop
