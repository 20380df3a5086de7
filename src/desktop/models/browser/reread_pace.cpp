#include "desktop/models/browser/reread_pace.h"

#include <algorithm>
#include <utility>

namespace fotomill::desktop {

namespace {

constexpr double kRest = 19;         // pause per time of reading
constexpr double kLongestRest = 60;  // seconds

}  // namespace

void RereadPace::Began(double now) {
  reading_ = true;
  began_ = now;
}

void RereadPace::Ended(double now) {
  if (std::exchange(reading_, false))
    notBefore_ = now + std::min(kRest * (now - began_), kLongestRest);
}

double RereadPace::DelayAt(double now) const { return std::max(kSoon, notBefore_ - now); }

}  // namespace fotomill::desktop
