#include <numbers>

#include "Law.h"

namespace {

// The widths whose functions differ in their names only. 16.16 is 32-bit on the same bits.
constexpr auto kShort = std::make_tuple(
    M_SetPt, M_CopyPt, M_EqualPt, M_SetRect, M_CopyRect, M_EqualRect, M_EmptyRect, M_InsetRect,
    M_OffsetRect, M_CenterRect, M_PtInRect, M_Pt2Rect, M_SectRect, M_UnionRect, M_RectCompare);
constexpr auto kLong =
    std::make_tuple(M_SetLPt, M_CopyLPt, M_EqualLPt, M_SetLRect, M_CopyLRect, M_EqualLRect,
                    M_EmptyLRect, M_InsetLRect, M_OffsetLRect, M_CenterLRect, M_LPtInRect,
                    M_LPt2Rect, M_SectLRect, M_UnionLRect, M_LRectCompare);
constexpr auto kFixed = std::make_tuple(
    M_SetFixedPt, M_CopyFixedPt, M_EqualFixedPt, M_SetFixedRect, M_CopyFixedRect, M_EqualFixedRect,
    M_EmptyFixedRect, M_InsetFixedRect, M_OffsetFixedRect, M_CenterFixedRect, M_FixedPtInRect,
    M_FixedPt2Rect, M_SectFixedRect, M_UnionFixedRect, M_FixedRectCompare);

template <class Rect>
bool IsEmpty(const Rect& r) {
  return r.right <= r.left || r.bottom <= r.top;
}
template <class Rect>
bool IsSame(const Rect& a, const Rect& b) {
  return BitsOf(a) == BitsOf(b);
}

// One axis of a rectangle.
struct Span {
  int64_t start, end;
};
template <class Rect>
Span Across(const Rect& r) {
  return {r.left, r.right};
}
template <class Rect>
Span Down(const Rect& r) {
  return {r.top, r.bottom};
}

template <class Int, class Point, class Rect, class Functions>
void TestWidth(const Functions& functions, Int a1, Int a2, Int b1, Int b2, Rect r, Rect s) {
  const auto& [setPt, copyPt, equalPt, setRect, copyRect, equalRect, empty, inset, offset, center,
               ptInRect, pt2Rect, sect, unite, compare] = functions;
  Point p, q;
  Equal((setPt(&p, a1, a2) | setPt(&q, b1, b2)), 0);
  Check(p.h == a1 && p.v == a2);
  Equal(equalPt(&p, &q), (a1 == b1 && a2 == b2));
  Rect t;
  Equal(setRect(&t, a1, a2, b1, b2), 0);
  Check(t.left == a1 && t.top == a2 && t.right == b1 && t.bottom == b2);
  const bool isEmpty = r.right <= r.left || r.bottom <= r.top;
  Equal(empty(&r), isEmpty);
  Equal(equalRect(&r, &s), (IsSame(r, s) || (isEmpty && IsEmpty(s))));
  const bool isIn = r.left <= p.h && p.h < r.right && r.top <= p.v && p.v < r.bottom;
  Equal(ptInRect(&p, &r), isIn);
  Equal(pt2Rect(&p, &q, &t), 0);
  Check(t.left == std::min(a1, b1) && t.right == std::max(a1, b1));
  Check(t.top == std::min(a2, b2) && t.bottom == std::max(a2, b2));
  Point copy;
  Check(copyPt(&q, &copy) == 0 && equalPt(&copy, &q));
  Check(copyRect(&r, &t) == 0 && IsSame(t, r));

  const auto wrapped = [](int64_t i) { return static_cast<Int>(i); };
  Equal(offset(&t, a1, a2), 0);
  Check(t.left == wrapped(int64_t{r.left} + a1) && t.right == wrapped(int64_t{r.right} + a1));
  Check(t.top == wrapped(int64_t{r.top} + a2) && t.bottom == wrapped(int64_t{r.bottom} + a2));
  t = r;
  Equal(inset(&t, a1, a2), 0);
  Check(t.left == wrapped(int64_t{r.left} + a1) && t.right == wrapped(int64_t{r.right} - a1));
  Check(t.top == wrapped(int64_t{r.top} + a2) && t.bottom == wrapped(int64_t{r.bottom} - a2));
  t = s;
  Equal(center(&r, &t), 0);
  const auto isCentered = [&](Span in, Span from, Span is) {
    const Int size = wrapped(from.end - from.start), spare = wrapped(in.end - in.start - size);
    return is.start == wrapped(in.start + spare / 2) && is.end == wrapped(is.start + size);
  };
  Check(isCentered(Across(r), Across(s), Across(t)));
  Check(isCentered(Down(r), Down(s), Down(t)));

  // By spans: what two have in common, and what holds both.
  const auto common = [](Span x, Span y) {
    return Span{std::max(x.start, y.start), std::min(x.end, y.end)};
  };
  const Span h = common(Across(r), Across(s)), v = common(Down(r), Down(s));
  const bool isOverlap = !isEmpty && !IsEmpty(s) && h.start < h.end && v.start < v.end;
  const Rect none = {};
  Rect inner;
  setRect(&inner, wrapped(h.start), wrapped(v.start), wrapped(h.end), wrapped(v.end));
  Check(sect(&r, &s, &t) == isOverlap && sect(&r, &s, nullptr) == isOverlap);
  Check(IsSame(t, isOverlap ? inner : none));
  Rect both = isEmpty ? IsEmpty(s) ? r : s : r;
  if (!isEmpty && !IsEmpty(s)) {
    setRect(&both, std::min(r.left, s.left), std::min(r.top, s.top), std::max(r.right, s.right),
            std::max(r.bottom, s.bottom));
  }
  Check(unite(&r, &s, &t) == 0 && IsSame(t, both));
  t = r;
  Check(unite(&t, &s, &t) == 0 && IsSame(t, both));
  t = s;
  Check(unite(&r, &t, &t) == 0 && IsSame(t, isEmpty && IsEmpty(s) ? s : both));

  const auto size = [&](Span x) { return wrapped(x.end - x.start); };
  const Int w = size(Across(r)), W = size(Across(s)), d = size(Down(r)), D = size(Down(s));
  const auto touch = [](Span x, Span y) {
    return (y.start <= x.start && x.start <= y.end) || (x.start <= y.start && y.start <= x.end);
  };
  const bool isShort = sizeof(Int) == 2;
  const bool relations[] = {
      isShort ? IsSame(r, s) : r.left == s.left && r.top == s.top,
      w > W && d > D,
      w >= W && d >= D,
      W > w && D > d,
      W >= w && D >= d,
      r.left < s.left && r.right > s.right && r.top < s.top && r.bottom > s.bottom,
      r.left <= s.left && r.right >= s.right && r.top <= s.top && r.bottom >= s.bottom,
      isOverlap,
      touch(Across(r), Across(s)) && touch(Down(r), Down(s)),
      false};
  for (uint32_t i = 0; i < 10; ++i) Equal(compare(i, &r, &s), relations[i]);
  Equal(compare(UINT32_MAX, &r, &s), 0);
}

TEST(Rect, WidthsBehaveAlike) {
  const auto check = [](M_Rect r, M_Rect s, std::array<int16_t, 4> n, bool isNear) {
    // Edges that touch, and rectangles that differ in one.
    if (isNear) s = {r.top, s.left, r.bottom, s.right};
    TestWidth<int16_t, M_Point>(kShort, n[0], n[1], n[2], n[3], r, s);
  };
  Holds(check);
  const auto checkLong = [](M_LRect r, M_LRect s, std::array<Int, 4> n, Digit shared) {
    if (shared < 0) s.left = r.right, s.top = r.top;
    if (shared > 4) s.right = r.right, s.bottom = r.bottom;
    if (shared > 7) s.left = r.left, s.top = r.top;
    TestWidth<int32_t, M_LPoint>(kLong, n[0].value, n[1].value, n[2].value, n[3].value, r, s);
    const auto fixed = [](const M_LRect& l) {
      return M_FixedRect{l.left, l.top, l.right, l.bottom};
    };
    TestWidth<int32_t, M_FixedPoint>(kFixed, n[0].value, n[1].value, n[2].value, n[3].value,
                                     fixed(r), fixed(s));
  };
  Holds(checkLong);
}

TEST(Rect, HalvesAndWhRects) {
  Holds([](M_Rect r, M_Point p, M_Point q, const M_WHRect& a, const M_WHRect& b, int16_t n) {
    Check(&M_TopLeft(r).v == &r.top && &M_TopLeft(r).h == &r.left);
    Check(&M_BottomRight(r).v == &r.bottom && &M_BottomRight(r).h == &r.right);
    M_WHRect c;
    Equal(M_SetWHRect(&c, a.values[0], a.values[1], a.values[2], a.values[3]), 0);
    Check(IsSame(c, a) && M_EqualWHRect(&a, &b) == IsSame(a, b));
    c.values[static_cast<uint16_t>(n) % 4] ^= 1;
    Check(!M_EqualWHRect(&a, &c) && M_CopyWHRect(&b, &c) == 0 && IsSame(b, c));
    const auto dh = static_cast<int32_t>(p.h) - q.h, dv = static_cast<int32_t>(p.v) - q.v;
    Equal(M_DeltaPoint(p, q), (static_cast<int32_t>(static_cast<uint32_t>(dv) << 16) | dh));
    const M_Point sum = {static_cast<int16_t>(p.v + q.v), static_cast<int16_t>(p.h + q.h)};
    Check(M_AddPt(p, &q) == 0 && IsSame(q, sum));
    // Of a point twice.
    Check(M_Pt2Rect(&M_TopLeft(r), &M_TopLeft(r), &r) == 0 && r.left == r.right &&
          r.top == r.bottom);
  });
}

// A bearing, truncated, with 3.1416 for pi.
TEST(Rect, AnglesOfPoints) {
  Holds([](const M_Rect& r, M_Point p, bool isUpright) {
    if (isUpright) p.h = static_cast<int16_t>((r.left + r.right) / 2);
    const double dx = p.h - (r.left + r.right) / 2.0, dy = p.v - (r.top + r.bottom) / 2.0;
    const double bearing = std::fmod(450 + std::atan2(dy, dx) * 180 / 3.1416, 360);
    int16_t angle = -1;
    Equal(M_PtToAngle(&r, p, &angle), 0);
    RC_PRE(std::abs(bearing - std::round(bearing)) > 2e-3);
    Equal(angle, static_cast<int16_t>(bearing));
  });
  const M_Rect r = {-10, -10, 10, 10};
  const std::tuple<M_Point, int16_t> rows[] = {{{0, 5}, 90},   {{5, 0}, 180}, {{0, -5}, 270},
                                               {{-5, 0}, 360}, {{0, 0}, 90},  {{5, 5}, 134},
                                               {{-1000, 1}, 0}};
  for (const auto& [p, expected] : rows) {
    int16_t angle;
    M_PtToAngle(&r, p, &angle);
    EXPECT_EQ(angle, expected);
  }
}

TEST(Rect, FloatIntersections) {
  Holds([](const M_FloatRect& a, M_FloatRect b, Digit shared) {
    if (shared < 0) b.left = a.right, b.top = a.top;
    if (shared > 4) b.right = a.right, b.bottom = a.bottom;
    // A NaN in a is passed over, one in b taken.
    const auto most = [](double p, double q) { return p > q ? p : q; };
    const auto least = [](double p, double q) { return p < q ? p : q; };
    const M_FloatRect inner = {most(a.left, b.left), most(a.top, b.top), least(a.right, b.right),
                               least(a.bottom, b.bottom)};
    const auto isEmpty = [](const M_FloatRect& r) {
      return r.left >= r.right || r.top >= r.bottom;
    };
    const bool isOverlap =
        !isEmpty(a) && !isEmpty(b) && inner.left < inner.right && inner.top < inner.bottom;
    M_FloatRect out = {7, 7, 7, 7};
    Equal(M_SectFloatRect(&a, &b, &out), isOverlap);
    Check(IsSame(out, isOverlap ? inner : M_FloatRect{0, 0, 0, 0}));
  });
}

TEST(Rect, Conversions) {
  Holds([](const M_FixedRect& r, M_LRect l) {
    const auto test = [&](auto toShort, auto toLong, int64_t addLeftTop, int64_t addRightBottom) {
      const auto whole = [](int64_t edge, int64_t add) {
        return static_cast<int32_t>(edge + add) >> 16;
      };
      const M_LRect expected = {whole(r.left, addLeftTop), whole(r.top, addLeftTop),
                                whole(r.right, addRightBottom), whole(r.bottom, addRightBottom)};
      M_LRect asLong;
      M_Rect asShort;
      Equal((toLong(&r, &asLong) | toShort(&r, &asShort)), 0);
      Check(IsSame(asLong, expected));
      Check(asShort.left == expected.left && asShort.top == expected.top &&
            asShort.right == expected.right && asShort.bottom == expected.bottom);
    };
    test(M_FixedRect2Rect, M_FixedRect2LRect, 0x8000, 0x8000);
    test(M_FixedRect2RectIn, M_FixedRect2LRectIn, 0xFFFF, 0);
    test(M_FixedRect2RectOut, M_FixedRect2LRectOut, 0, 0xFFFF);
    const auto fixed = [](int64_t i) { return static_cast<int32_t>(i * 65536); };
    M_FixedRect f;
    Equal(M_LRect2FixedRect(&l, &f), 0);
    Check(IsSame(f, M_FixedRect{fixed(l.left), fixed(l.top), fixed(l.right), fixed(l.bottom)}));
    M_Rect s = {77, 77, 77, 77};
    for (int32_t* edge : {&l.left, &l.top, &l.right, &l.bottom}) {
      if (*rc::gen::inRange(0, 3) == 0) *edge = *rc::gen::element(-32769, -32768, 32767, 32768, 5);
    }
    const bool isOut = l.left < -32768 || l.top < -32768 || l.right > 32767 || l.bottom > 32767;
    Equal(M_LRect2Rect(&l, &s), (isOut ? M_RECT_OUT_OF_RANGE : 0));
    const auto cut = [](int32_t i) { return static_cast<int16_t>(i); };
    Check(IsSame(s, isOut ? M_Rect{77, 77, 77, 77}
                          : M_Rect{cut(l.top), cut(l.left), cut(l.bottom), cut(l.right)}));
    Equal(M_Rect2FixedRect(&s, &f), 0);
    Check(IsSame(f, M_FixedRect{fixed(s.left), fixed(s.top), fixed(s.right), fixed(s.bottom)}));
  });
  EXPECT_EQ(M_RECT_OUT_OF_RANGE, 10);
}

}  // namespace
