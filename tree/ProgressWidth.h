// The width of the waiting tree's progress bar, in pixels of its 50-pixel track.
#pragma once

namespace orvex::tree {

constexpr int kProgressTrack = 50;

// The bar for `count` items of `total`. A total of 1 or more gives count * 50 / total (clamped to the
// track). An unknown total (below 1) gives a bar that grows quickly at first and slows down:
// floor(50 * (1 - 0.5 * ln(1 + (e^2 - 1) * e^(-0.4 * count)))), never above 49, so that only the final
// report fills the track.
int ProgressWidth(int total, int count);

} // namespace orvex::tree
