#include "Law.h"

namespace {

// The functions of a width, which differ in their names only. 16.16 is 32-bit on the same bits.
template <class Point, class Rect>
void TestWidth(auto setPt, auto copyPt, auto equalPt, auto setRect, auto copyRect, auto equalRect,
               auto empty, auto inset, auto offset, auto center, auto ptInRect, auto pt2Rect,
               auto sect, auto unite, auto compare) {
  Holds([&](Rect r, Rect s, Point p, Point q, Digit shared) {
    // Edges that touch, and rectangles that differ in some.
    if (shared < 0) s.left = r.right, s.top = r.top;
    if (shared > 4) s.right = r.right, s.bottom = r.bottom;
    if (shared > 6) s.left = r.left, s.top = r.top;
    if (shared % 2) q.h = p.h;
    // Set, copied, spanned, moved, shrunk, centred; what two share; and, three times, their union.
    Rect expected[10];
    bool relations[] = {true, true, true, true, true, true, true, true, true, false};
    const auto expect = [&](auto start, auto end, auto at) {
      const int64_t r0 = r.*start, r1 = r.*end, s0 = s.*start, s1 = s.*end, p0 = p.*at, q0 = q.*at;
      const auto wrapped = [](int64_t edge) { return static_cast<decltype(r.left)>(edge); };
      const int64_t w = wrapped(r1 - r0), w2 = wrapped(s1 - s0), mid = r0 + wrapped(w - w2) / 2;
      const int64_t low = std::max(r0, s0), high = std::min(r1, s1);
      const int64_t starts[] = {p0,  s0,  std::min(p0, q0), r0 + p0, r0 + p0,
                                mid, low, std::min(r0, s0)};
      const int64_t ends[] = {q0,       s1,   std::max(p0, q0), r1 + p0, r1 - p0,
                              mid + w2, high, std::max(r1, s1)};
      for (size_t i = 0; i < 8; ++i) {
        expected[i].*start = wrapped(starts[i]);
        expected[i].*end = wrapped(ends[i]);
      }
      const bool isAt = r0 == s0 && (sizeof(r.left) > 2 || r1 == s1);
      const bool isIn = r0 <= s0 && r1 >= s1, isInside = r0 < s0 && r1 > s1;
      const bool touch = (s0 <= r0 && r0 <= s1) || (r0 <= s0 && s0 <= r1);
      const bool holds[] = {isAt,     w > w2, w >= w2,    w < w2, w <= w2,
                            isInside, isIn,   low < high, touch};
      for (size_t i = 0; i < 9; ++i) relations[i] &= holds[i];
    };
    expect(&Rect::left, &Rect::right, &Point::h);
    expect(&Rect::top, &Rect::bottom, &Point::v);
    for (uint32_t i = 0; i < 10; ++i) Equal(compare(i, &r, &s), relations[i]);

    const bool isNone = r.right <= r.left || r.bottom <= r.top;
    const bool isNone2 = s.right <= s.left || s.bottom <= s.top;
    Equal(empty(&r), isNone);
    Equal(equalRect(&r, &s), (BitsOf(r) == BitsOf(s) || (isNone && isNone2)));
    Equal(ptInRect(&p, &r), (r.left <= p.h && p.h < r.right && r.top <= p.v && p.v < r.bottom));
    if (!relations[7]) expected[6] = {};
    if (isNone || isNone2) expected[7] = isNone2 ? r : s;
    expected[8] = expected[7];
    expected[9] = isNone ? s : expected[7];  // Into s, that of two empty ones is s.
    Rect actual[] = {r, r, r, r, r, s, r, r, r, s};
    Point set, copied;
    Equal((setPt(&set, p.h, p.v) | copyPt(&q, &copied)), 0);
    Check(BitsOf(set) == BitsOf(p) && BitsOf(copied) == BitsOf(q));
    Equal((setRect(actual, p.h, p.v, q.h, q.v) | copyRect(&s, actual + 1)), 0);
    Equal((pt2Rect(&p, &q, actual + 2) | offset(actual + 3, p.h, p.v)), 0);
    Equal((inset(actual + 4, p.h, p.v) | center(&r, actual + 5)), 0);
    Equal(sect(&r, &s, actual + 6), relations[7]);
    Equal((unite(&r, &s, actual + 7) | unite(actual + 8, &s, actual + 8)), 0);
    Equal(unite(&r, actual + 9, actual + 9), 0);
    Equal(equalPt(&p, &q), BitsOf(p) == BitsOf(q));
    Equal(BitsOf(actual), BitsOf(expected));
  });
}

TEST(Rect, WidthsBehaveAlike) {
  TestWidth<M_Point, M_Rect>(M_SetPt, M_CopyPt, M_EqualPt, M_SetRect, M_CopyRect, M_EqualRect,
                             M_EmptyRect, M_InsetRect, M_OffsetRect, M_CenterRect, M_PtInRect,
                             M_Pt2Rect, M_SectRect, M_UnionRect, M_RectCompare);
  TestWidth<M_LPoint, M_LRect>(M_SetLPt, M_CopyLPt, M_EqualLPt, M_SetLRect, M_CopyLRect,
                               M_EqualLRect, M_EmptyLRect, M_InsetLRect, M_OffsetLRect,
                               M_CenterLRect, M_LPtInRect, M_LPt2Rect, M_SectLRect, M_UnionLRect,
                               M_LRectCompare);
  TestWidth<M_FixedPoint, M_FixedRect>(
      M_SetFixedPt, M_CopyFixedPt, M_EqualFixedPt, M_SetFixedRect, M_CopyFixedRect,
      M_EqualFixedRect, M_EmptyFixedRect, M_InsetFixedRect, M_OffsetFixedRect, M_CenterFixedRect,
      M_FixedPtInRect, M_FixedPt2Rect, M_SectFixedRect, M_UnionFixedRect, M_FixedRectCompare);
}

TEST(Rect, HalvesAndWhRects) {
  Holds([](M_Rect r, M_Point p, M_Point q, const M_WHRect& a, M_WHRect b, Digit i) {
    Check(&M_TopLeft(r).v == &r.top && &M_BottomRight(r).v == &r.bottom);
    if (i >= 0) b = a;
    if (i >= 4) b.values[i % 4] ^= 1;
    Equal(M_EqualWHRect(&a, &b), (BitsOf(a) == BitsOf(b)));
    M_WHRect set, copied;
    M_SetWHRect(&set, a.values[0], a.values[1], a.values[2], a.values[3]);
    M_CopyWHRect(&b, &copied);
    Check(BitsOf(set) == BitsOf(a) && BitsOf(copied) == BitsOf(b));
    // The horizontal distance spills into the vertical one.
    Equal(M_DeltaPoint(p, q), static_cast<int32_t>((p.v - q.v) * 65536LL | (p.h - q.h)));
    const M_Point sum = {static_cast<int16_t>(p.v + q.v), static_cast<int16_t>(p.h + q.h)};
    Equal(M_AddPt(p, &q), 0);
    Equal(BitsOf(q), BitsOf(sum));
  });
}

// A bearing, truncated, with 3.1416 for pi but along an axis.
TEST(Rect, AnglesOfPoints) {
  Holds([](const M_Rect& r, M_Point p, Digit kind) {
    if (kind < 0) p.h = static_cast<int16_t>((r.left + r.right) / 2);
    if (kind % 2) p.v = static_cast<int16_t>((r.top + r.bottom) / 2);
    const double dx = p.h - (r.left + r.right) / 2.0, up = (r.top + r.bottom) / 2.0 - p.v;
    // Straight up is 360.
    const double upright = up > 0 ? 360 : up < 0 ? 180 : 90;
    const double bearing =
        dx != 0 ? std::fmod(450 - std::atan2(up, dx) * 180 / 3.1416, 360) : upright;
    const double rest = std::abs(bearing - std::round(bearing));
    RC_PRE(rest == 0 || rest > 1e-6);
    int16_t angle;
    Equal(M_PtToAngle(&r, p, &angle), 0);
    Equal(angle, static_cast<int16_t>(bearing));
  });
}

TEST(Rect, FloatIntersections) {
  Holds([](const M_FloatRect& a, M_FloatRect b, Digit shared) {
    if (shared < 0) b.left = a.right, b.top = a.top;
    if (shared > 4) b.right = a.right, b.bottom = a.bottom;
    // A NaN in a is passed over, one in b taken.
    const M_FloatRect inner = {a.left > b.left ? a.left : b.left, a.top > b.top ? a.top : b.top,
                               a.right < b.right ? a.right : b.right,
                               a.bottom < b.bottom ? a.bottom : b.bottom};
    const bool isOverlap = inner.left < inner.right && inner.top < inner.bottom;
    M_FloatRect out = {7, 7, 7, 7};
    Equal(M_SectFloatRect(&a, &b, &out), isOverlap);
    Equal(BitsOf(out), BitsOf(isOverlap ? inner : M_FloatRect()));
  });
}

TEST(Rect, Conversions) {
  static_assert(M_RECT_OUT_OF_RANGE == 10);
  Holds([](const M_FixedRect& r, M_LRect l, std::array<Digit, 4> near, bool isNear) {
    const auto test = [&](auto toShort, auto toLong, int64_t addLeftTop, int64_t addRightBottom) {
      const auto whole = [](int64_t sum) { return static_cast<int16_t>(sum >> 16); };
      const M_LRect expected = {whole(r.left + addLeftTop), whole(r.top + addLeftTop),
                                whole(r.right + addRightBottom), whole(r.bottom + addRightBottom)};
      M_LRect asLong;
      M_Rect asShort;
      Equal((toLong(&r, &asLong) | toShort(&r, &asShort)), 0);
      const M_LRect widened = {asShort.left, asShort.top, asShort.right, asShort.bottom};
      Check(BitsOf(asLong) == BitsOf(expected) && BitsOf(widened) == BitsOf(expected));
    };
    test(M_FixedRect2Rect, M_FixedRect2LRect, 0x8000, 0x8000);
    test(M_FixedRect2RectIn, M_FixedRect2LRectIn, 0xFFFF, 0);
    test(M_FixedRect2RectOut, M_FixedRect2LRectOut, 0, 0xFFFF);

    if (isNear) l = {near[0] - 32768, near[1] - 32768, near[2] + 32767, near[3] + 32767};
    const bool isOut = l.left < -32768 || l.top < -32768 || l.right > 32767 || l.bottom > 32767;
    const auto cut = [](int32_t i) { return static_cast<int16_t>(i); };
    const auto fixed = [](int64_t i) { return static_cast<int32_t>(i * 65536); };
    const M_FixedRect expected = {fixed(l.left), fixed(l.top), fixed(l.right), fixed(l.bottom)};
    const M_Rect given = {7, 7, 7, 7}, s = {cut(l.top), cut(l.left), cut(l.bottom), cut(l.right)};
    M_Rect out = given;
    M_FixedRect f, g;
    Equal(M_LRect2Rect(&l, &out), (isOut ? M_RECT_OUT_OF_RANGE : 0));
    Equal(BitsOf(out), BitsOf(isOut ? given : s));
    Equal((M_LRect2FixedRect(&l, &f) | M_Rect2FixedRect(&s, &g)), 0);
    Check(BitsOf(f) == BitsOf(expected) && BitsOf(g) == BitsOf(expected));
  });
}

}  // namespace
