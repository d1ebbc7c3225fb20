// Rectangles as sets of points, and conversions.

#include "Input.h"

namespace {

template <class Rect, class Point, auto kSect, auto kUnion, auto kContains, auto kEmpty>
void CheckSets(Input& input) {
  const auto a = input.Any<Rect>(), b = input.Any<Rect>();
  const auto p = input.Any<Point>();
  Rect both, either;
  const bool meet = kSect(&a, &b, &both) != 0;
  Require(meet == (kEmpty(&both) == 0));
  Require((kContains(&p, &a) && kContains(&p, &b)) == (meet && kContains(&p, &both)));
  kUnion(&a, &b, &either);
  if (kContains(&p, &a) || kContains(&p, &b)) Require(kContains(&p, &either) != 0);
}

}  // namespace

void Run(Input& input) {
  CheckSets<M_Rect, M_Point, M_SectRect, M_UnionRect, M_PtInRect, M_EmptyRect>(input);
  CheckSets<M_LRect, M_LPoint, M_SectLRect, M_UnionLRect, M_LPtInRect, M_EmptyLRect>(input);
  CheckSets<M_FixedRect, M_FixedPoint, M_SectFixedRect, M_UnionFixedRect, M_FixedPtInRect,
            M_EmptyFixedRect>(input);
  auto fixed = input.Any<M_FixedRect>();
  // Further out they wrap.
  for (M_Fixed* edge : {&fixed.left, &fixed.top, &fixed.right, &fixed.bottom}) *edge /= 2;
  M_LRect inner, outer, nearest;
  M_FixedRect2LRectIn(&fixed, &inner);
  M_FixedRect2LRectOut(&fixed, &outer);
  M_FixedRect2LRect(&fixed, &nearest);
  Require(inner.left >= outer.left && inner.right <= outer.right);
  Require(nearest.left >= outer.left && nearest.bottom <= outer.bottom);
  const auto longs = input.Any<M_LRect>();
  M_Rect shorts = {};
  if (M_LRect2Rect(&longs, &shorts) == 0) {
    // Only one side of each edge is looked at.
    Require(shorts.left == static_cast<int16_t>(longs.left) && longs.left >= INT16_MIN);
    Require(shorts.bottom == static_cast<int16_t>(longs.bottom) && longs.bottom <= INT16_MAX);
  }
  const auto m = input.Any<M_Matrix3>();
  auto floats = input.Any<M_FloatRect>();
  Vector2 corners[4];
  M_TransformBounds(m, outer);
  M_TransformRect(&m, &shorts, corners, nullptr);
  M_TransformFloatRect(&m, &floats, corners, nullptr);
}
