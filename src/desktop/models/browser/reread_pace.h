#pragma once

namespace fotomill::desktop {

// When to read a changed folder again: soon after a single change, but never all the time. A folder
// that keeps changing is read for at most a twentieth of the time. Times are monotonic, in seconds.
class RereadPace {
 public:
  static constexpr double kSoon = 0.3;  // changes are collected for this long

  void Began(double now);
  void Ended(double now);  // no effect if nothing has begun
  bool Reading() const { return reading_; }
  // How long to wait after a change; at least kSoon.
  double DelayAt(double now) const;

 private:
  bool reading_ = false;
  double began_ = 0;
  double notBefore_ = 0;  // the next reading
};

}  // namespace fotomill::desktop
