/// \file
/// The hull of sorted lattice points.
#ifndef MP_HULLWALK_H
#define MP_HULLWALK_H

#include <algorithm>
#include <array>
#include <cstdint>

#include "Mp_Hull.h"
#include "Mp_HullLattice.h"

namespace Mp {

/// Twice the area of a triangle, positive when it turns counter-clockwise.
inline int64_t Turn(Key a, Key b, Key c) {
  const M_LongPoint p = ToPoint(a), q = ToPoint(b), r = ToPoint(c);
  return (int64_t{q.x} - p.x) * (int64_t{r.y} - q.y) - (int64_t{q.y} - p.y) * (int64_t{r.x} - q.x);
}

/// Leaves of a chain of points, in place, those at which it turns left. Returns how many there are.
inline size_t KeepLeftTurns(Key* points, size_t count) {
  size_t top = 1;
  for (size_t i = 1; i < count; ++i) {
    while (top >= 2 && Turn(points[top - 2], points[top - 1], points[i]) <= 0) --top;
    points[top++] = points[i];
  }
  return top;
}

inline bool IsLower(Key a, Key b) {
  const M_LongPoint p = ToPoint(a), q = ToPoint(b);
  return p.y != q.y ? p.y < q.y : p.x < q.x;
}

/// Of points on one line, by the two at either end of it: the lowest, the farthest from it and the
/// next farthest, which may lie at the same place. Kept on purpose.
inline size_t HullOfLine(const std::array<Key, 4>& ends, Key* hull) {
  const Key pivot = *std::min_element(ends.begin(), ends.end(), IsLower);
  hull[0] = pivot;
  Key* const end = std::remove_copy(ends.begin(), ends.end(), hull + 1, pivot);
  const Mp_CompareAngleAndDist isBefore(ToPoint(pivot));
  std::sort(hull + 1, end, [&](Key a, Key b) { return isBefore(ToPoint(a), ToPoint(b)); });
  return std::min<size_t>(static_cast<size_t>(end - hull), 3);
}

/// The corners of four or more sorted points, or of three that are no line, from the lowest
/// counter-clockwise, in place. Returns how many there are. Both arrays have room for all points.
inline size_t Hull(Key* sorted, size_t count, Key* scratch) {
  const Key first = sorted[0];
  const Key last = sorted[count - 1];
  const std::array<Key, 4> ends = {first, sorted[1], sorted[count - 2], last};
  // Those below the line from the first to the last stay, those above go to the end of the scratch,
  // from right to left.
  Key* below = sorted + 1;
  Key* const aboveEnd = scratch + count;
  Key* above = aboveEnd - 1;
  *above = first;  // There are points: NOLINT(clang-analyzer-cplusplus.NewDelete)
  for (size_t i = 1; i + 1 < count; ++i) {
    const Key key = sorted[i];
    const int64_t turn = Turn(first, last, key);
    *below = key;
    below += turn < 0;
    above[-1] = key;
    above -= turn > 0;
  }
  if (below == sorted + 1 && above == aboveEnd - 1) return HullOfLine(ends, sorted);
  *below++ = last;
  *--above = last;
  const size_t corners = KeepLeftTurns(sorted, static_cast<size_t>(below - sorted));
  const size_t others = KeepLeftTurns(above, static_cast<size_t>(aboveEnd - above));
  Key* const end = std::copy(above + 1, above + others - 1, sorted + corners);
  std::rotate(sorted, std::min_element(sorted, end, IsLower), end);
  return static_cast<size_t>(end - sorted);
}

}  // namespace Mp

#endif  // MP_HULLWALK_H
