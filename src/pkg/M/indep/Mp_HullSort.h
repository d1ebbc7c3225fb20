/// \file
/// The order in which the hull of lattice points is found.
#ifndef MP_HULLSORT_H
#define MP_HULLSORT_H

#include <algorithm>
#include <array>
#include <cstddef>
#include <utility>

#include "Mp_HullLattice.h"

namespace Mp {

/// Coordinates are below 2^30: three digits.
inline constexpr int kDigitBits = 10;
inline constexpr size_t kDigits = size_t{1} << kDigitBits;

/// A digit of x, the last one at place 0.
inline size_t DigitOf(Key key, int place) {
  return key >> (32 + place * kDigitBits) & (kDigits - 1);
}

/// How often each value of a digit occurs, and then where those of each value start.
struct Starts {
  std::array<size_t, kDigits> at = {};

  void Sum() {
    size_t sum = 0;
    for (size_t& start : at) sum += std::exchange(start, sum);
  }
};

/// Copies keys in the order of a digit; of the same digit in the order given.
inline void Deal(const Key* from, size_t count, int place, Starts* starts, Key* to) {
  for (size_t i = 0; i < count; ++i) to[starts->at[DigitOf(from[i], place)]++] = from[i];
}

/// Sorts keys that do not differ in other digits of x than the last two, or the last three: by
/// these, and the few of the same x afterwards. Returns where the keys are then.
template <int kPlaces>
Key* SortByDigits(Key* keys, size_t count, Key* scratch) {
  std::array<Starts, kPlaces> starts;
  for (size_t i = 0; i < count; ++i) {
    for (int place = 0; place < kPlaces; ++place) {
      ++starts[static_cast<size_t>(place)].at[DigitOf(keys[i], place)];
    }
  }
  for (int place = 0; place < kPlaces; ++place) {
    starts[static_cast<size_t>(place)].Sum();
    Deal(keys, count, place, &starts[static_cast<size_t>(place)], scratch);
    std::swap(keys, scratch);
  }
  for (size_t i = 0; i < count;) {
    size_t end = i + 1;
    while (end < count && keys[end] >> 32 == keys[i] >> 32) ++end;
    if (end - i > 1) std::sort(keys + i, keys + end);
    i = end;
  }
  return keys;
}

/// Sorts keys. Both arrays have room for all; returns the one in which they are then.
inline Key* Sort(Key* keys, size_t count, Key* scratch) {
  constexpr size_t kMany = 1024;
  if (count < kMany) {
    std::sort(keys, keys + count);
    return keys;
  }
  // What is more than the cache holds is dealt out by the first digit, and the rest of the work is
  // done there, share by share.
  constexpr size_t kInCache = size_t{1} << 17;
  if (count <= kInCache) return SortByDigits<3>(keys, count, scratch);
  constexpr int kFirst = 2;
  Starts starts;
  for (size_t i = 0; i < count; ++i) ++starts.at[DigitOf(keys[i], kFirst)];
  starts.Sum();
  Deal(keys, count, kFirst, &starts, scratch);
  size_t start = 0;
  // Those of each digit have been dealt out up to where those of the next start.
  for (const size_t end : starts.at) {
    SortByDigits<kFirst>(scratch + start, end - start, keys + start);
    start = end;
  }
  return scratch;
}

}  // namespace Mp

#endif  // MP_HULLSORT_H
