// SPDX-License-Identifier: MIT
//
// How often the screen is captured: the first changes after quiet at once, changes that go on the
// less often the more CPU time they cost.

#ifndef RASTER_TOOLS_LIVE_PACE_H
#define RASTER_TOOLS_LIVE_PACE_H

#include <algorithm>
#include <chrono>

namespace tool::live {

class Pace {
 public:
  using Clock = std::chrono::steady_clock;

  /// Rests of 1 / maxRate to 1 / busyRate seconds; if that is the smaller one, always of that.
  Pace(double maxRate, double busyRate)
      : shortest(secondsOf(1 / maxRate)),
        longest(std::max(shortest, secondsOf(1 / busyRate))),
        rest(shortest) {}

  /// A capture began, and what came of it has been sent. `spent` is the CPU time so far, in which
  /// is what viewers that were late have cost.
  void captured(Clock::time_point began, Clock::duration spent) {
    owed =
        std::max(owed - (began - start), Clock::duration()) + kRestsPerCost * (spent - spentBefore);
    owed = std::min(owed, 2 * longest);
    rest = std::clamp(owed - longest, shortest, longest);
    start = began;
    spentBefore = spent;
  }
  /// The next capture is not due before that.
  Clock::time_point restsUntil() const { return start + rest; }
  Clock::time_point lastCapture() const { return start; }

 private:
  // A window that moves keeps 40 captures a second, a terminal that scrolls has 20 to 25.
  static constexpr int kRestsPerCost = 80;

  static Clock::duration secondsOf(double seconds) {
    return std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(seconds));
  }

  Clock::duration shortest;
  Clock::duration longest;
  Clock::duration rest;
  Clock::duration owed = {};  ///< of rests at the last capture; up to the longest one may wait
  Clock::time_point start;
  Clock::duration spentBefore = {};
};

}  // namespace tool::live

#endif
