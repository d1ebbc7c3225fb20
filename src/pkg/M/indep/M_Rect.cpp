// Points and rectangles. One template serves all widths that behave alike; the exported functions
// give it its names.

#include "M_Rect.h"

#include <algorithm>
#include <cmath>

#include "Mp_Arith.h"
#include "Mp_Lanes.h"
#include "Mp_Rect.h"

namespace {

using Mp::IsEmpty;
using Mp::WrapAdd;
using Mp::WrapSub;

// The type of a record's coordinates.
template <class Point>
using CoordOf = decltype(Point::h);
template <class Rect>
using EdgeOf = decltype(Rect::left);

template <class Point>
int32_t Set(Point* pt, CoordOf<Point> h, CoordOf<Point> v) {
  pt->h = h;
  pt->v = v;
  return 0;
}

template <class Rect>
int32_t Set(Rect* r, EdgeOf<Rect> left, EdgeOf<Rect> top, EdgeOf<Rect> right, EdgeOf<Rect> bottom) {
  r->left = left;
  r->top = top;
  r->right = right;
  r->bottom = bottom;
  return 0;
}

template <class Record>
int32_t Copy(const Record* from, Record* to) {
  *to = *from;
  return 0;
}

template <class Point>
int32_t IsSamePoint(const Point* a, const Point* b) {
  return a->h == b->h && a->v == b->v;
}

template <class Rect>
bool HasSameEdges(const Rect& a, const Rect& b) {
  return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}

template <class Rect>
int32_t IsSameRect(const Rect* a, const Rect* b) {
  return HasSameEdges(*a, *b) || (IsEmpty(*a) && IsEmpty(*b));
}

template <class Rect>
int32_t Inset(Rect* r, EdgeOf<Rect> dh, EdgeOf<Rect> dv) {
  return Set(r, WrapAdd(r->left, dh), WrapAdd(r->top, dv), WrapSub(r->right, dh),
             WrapSub(r->bottom, dv));
}

template <class Rect>
int32_t Offset(Rect* r, EdgeOf<Rect> dh, EdgeOf<Rect> dv) {
  return Set(r, WrapAdd(r->left, dh), WrapAdd(r->top, dv), WrapAdd(r->right, dh),
             WrapAdd(r->bottom, dv));
}

// Where a span of this size starts to lie in the middle of another.
template <class Int>
Int CenteredStart(Int start, Int end, Int size) {
  const Int spare = WrapSub(WrapSub(end, start), size);
  return WrapAdd(start, static_cast<Int>(spare / 2));
}

template <class Rect>
int32_t Center(const Rect* container, Rect* r) {
  const auto width = WrapSub(r->right, r->left);
  const auto height = WrapSub(r->bottom, r->top);
  const auto left = CenteredStart(container->left, container->right, width);
  const auto top = CenteredStart(container->top, container->bottom, height);
  return Set(r, left, top, WrapAdd(left, width), WrapAdd(top, height));
}

template <class Point, class Rect>
int32_t IsInside(const Point* pt, const Rect* r) {
  return r->left <= pt->h && pt->h < r->right && r->top <= pt->v && pt->v < r->bottom;
}

template <class Point, class Rect>
int32_t Span(const Point* a, const Point* b, Rect* r) {
  const auto [left, right] = std::minmax({a->h, b->h});
  const auto [top, bottom] = std::minmax({a->v, b->v});
  return Set(r, left, top, right, bottom);
}

// All edges at once, in a record's own order: two starts, left and top, and then their ends.
template <class Rect>
struct Edges {
  typedef EdgeOf<Rect> Vector __attribute__((vector_size(sizeof(Rect))));

  // The greater starts and lesser ends of two, or else the lesser starts and greater ends.
  static Vector Choose(const Rect& a, const Rect& b, bool isInner) {
    const EdgeOf<Rect> forStarts = isInner ? 0 : -1, forEnds = ~forStarts;
    const auto p = Mp::Load<Vector>(&a);
    const auto q = Mp::Load<Vector>(&b);
    const Vector isFirst = (p > q) ^ Vector { forStarts, forStarts, forEnds, forEnds };
    return (p & isFirst) | (q & ~isFirst);
  }
};

// An empty rectangle has no inner edges in order with any other, so it need not be tested.
template <class Rect>
int32_t Intersect(const Rect* a, const Rect* b, Rect* out) {
  using Vector = typename Edges<Rect>::Vector;
  const Vector inner = Edges<Rect>::Choose(*a, *b, true);
  const Vector isAfter = __builtin_shufflevector(inner, inner, 2, 3, 0, 1) > inner;
  const EdgeOf<Rect> isOverlap = isAfter[0] & isAfter[1];
  if (out) Mp::Store(out, inner & isOverlap);
  return -isOverlap;
}

template <class Rect>
int32_t Unite(const Rect* a, const Rect* b, Rect* out) {
  if (IsEmpty(*b)) {
    // Kept on purpose: into b, the union of two empty rectangles is b, else it is a.
    if (out == b && IsEmpty(*a)) return 0;
    return Copy(a, out);
  }
  if (IsEmpty(*a)) return Copy(b, out);
  Mp::Store(out, Edges<Rect>::Choose(*a, *b, false));
  return 0;
}

// Kept on purpose: where the short rectangles compare all edges, the others compare two.
bool IsRelation0(const M_Rect& a, const M_Rect& b) { return HasSameEdges(a, b); }
template <class Rect>
bool IsRelation0(const Rect& a, const Rect& b) {
  return a.left == b.left && a.top == b.top;
}

template <class Rect>
auto Width(const Rect& r) {
  return WrapSub(r.right, r.left);
}

template <class Rect>
auto Height(const Rect& r) {
  return WrapSub(r.bottom, r.top);
}

template <class Rect>
bool Encloses(const Rect& a, const Rect& b) {
  return a.left <= b.left && a.right >= b.right && a.top <= b.top && a.bottom >= b.bottom;
}

template <class Rect>
bool EnclosesStrictly(const Rect& a, const Rect& b) {
  return a.left < b.left && a.right > b.right && a.top < b.top && a.bottom > b.bottom;
}

// Whether one of two closed spans holds the other's start.
template <class Int>
bool Touch(Int startA, Int endA, Int startB, Int endB) {
  return (startB <= startA && startA <= endB) || (startA <= startB && startB <= endA);
}

template <class Rect>
int32_t Compare(uint32_t relation, const Rect& a, const Rect& b) {
  switch (relation) {
    case 0:
      return IsRelation0(a, b);
    case 1:
      return Width(a) > Width(b) && Height(a) > Height(b);
    case 2:
      return Width(a) >= Width(b) && Height(a) >= Height(b);
    case 3:
      return Compare(1, b, a);
    case 4:
      return Compare(2, b, a);
    case 5:
      return EnclosesStrictly(a, b);
    case 6:
      return Encloses(a, b);
    case 7:
      return Intersect<Rect>(&a, &b, nullptr);
    case 8:
      return Touch(a.top, a.bottom, b.top, b.bottom) && Touch(a.left, a.right, b.left, b.right);
    default:
      return 0;
  }
}

constexpr M_Fixed kFixedHalf = 0x8000;
constexpr M_Fixed kAlmostOne = 0xFFFF;

// Added before the fraction is dropped, an amount rounds: none down, a half to nearest, almost one
// up.
template <class Rect>
int32_t FromFixed(const M_FixedRect* from, Rect* to, M_Fixed addLeftTop, M_Fixed addRightBottom) {
  const auto whole = [](M_Fixed edge, M_Fixed add) {
    return static_cast<EdgeOf<Rect>>(WrapAdd(edge, add) >> 16);
  };
  return Set(to, whole(from->left, addLeftTop), whole(from->top, addLeftTop),
             whole(from->right, addRightBottom), whole(from->bottom, addRightBottom));
}

template <class Rect>
int32_t ToFixed(const Rect* from, M_FixedRect* to) {
  const auto fixed = [](int32_t edge) { return Mp::WrapMul(edge, 0x10000); };
  return Set(to, fixed(from->left), fixed(from->top), fixed(from->right), fixed(from->bottom));
}

}  // namespace

extern "C" {

int32_t M_SetPt(M_Point* pt, int16_t h, int16_t v) { return Set(pt, h, v); }
int32_t M_SetLPt(M_LPoint* pt, int32_t h, int32_t v) { return Set(pt, h, v); }
int32_t M_SetFixedPt(M_FixedPoint* pt, M_Fixed h, M_Fixed v) { return Set(pt, h, v); }

int32_t M_CopyPt(const M_Point* from, M_Point* to) { return Copy(from, to); }
int32_t M_CopyLPt(const M_LPoint* from, M_LPoint* to) { return Copy(from, to); }
int32_t M_CopyFixedPt(const M_FixedPoint* from, M_FixedPoint* to) { return Copy(from, to); }

int32_t M_EqualPt(const M_Point* a, const M_Point* b) { return IsSamePoint(a, b); }
int32_t M_EqualLPt(const M_LPoint* a, const M_LPoint* b) { return IsSamePoint(a, b); }
int32_t M_EqualFixedPt(const M_FixedPoint* a, const M_FixedPoint* b) { return IsSamePoint(a, b); }

int32_t M_AddPt(M_Point from, M_Point* to) {
  return Set(to, WrapAdd(to->h, from.h), WrapAdd(to->v, from.v));
}

int32_t M_DeltaPoint(const M_Point& a, const M_Point& b) {
  const int32_t dh = a.h - b.h;
  const int32_t dv = a.v - b.v;
  // Kept on purpose: dh spills into the upper half.
  return Mp::WrapMul(dv, 0x10000) | dh;
}

int32_t M_SetRect(M_Rect* r, int16_t left, int16_t top, int16_t right, int16_t bottom) {
  return Set(r, left, top, right, bottom);
}
int32_t M_SetLRect(M_LRect* r, int32_t left, int32_t top, int32_t right, int32_t bottom) {
  return Set(r, left, top, right, bottom);
}
int32_t M_SetFixedRect(M_FixedRect* r, M_Fixed left, M_Fixed top, M_Fixed right, M_Fixed bottom) {
  return Set(r, left, top, right, bottom);
}

int32_t M_SetWHRect(M_WHRect* r, int16_t first, int16_t second, int16_t third, int16_t fourth) {
  *r = {{first, second, third, fourth}};
  return 0;
}

int32_t M_CopyRect(const M_Rect* from, M_Rect* to) { return Copy(from, to); }
int32_t M_CopyLRect(const M_LRect* from, M_LRect* to) { return Copy(from, to); }
int32_t M_CopyFixedRect(const M_FixedRect* from, M_FixedRect* to) { return Copy(from, to); }
int32_t M_CopyWHRect(const M_WHRect* from, M_WHRect* to) { return Copy(from, to); }

int32_t M_EqualRect(const M_Rect* a, const M_Rect* b) { return IsSameRect(a, b); }
int32_t M_EqualLRect(const M_LRect* a, const M_LRect* b) { return IsSameRect(a, b); }
int32_t M_EqualFixedRect(const M_FixedRect* a, const M_FixedRect* b) { return IsSameRect(a, b); }
int32_t M_EqualWHRect(const M_WHRect* a, const M_WHRect* b) {
  return std::equal(a->values, a->values + 4, b->values);
}

int32_t M_EmptyRect(const M_Rect* r) { return IsEmpty(*r); }
int32_t M_EmptyLRect(const M_LRect* r) { return IsEmpty(*r); }
int32_t M_EmptyFixedRect(const M_FixedRect* r) { return IsEmpty(*r); }

int32_t M_InsetRect(M_Rect* r, int16_t dh, int16_t dv) { return Inset(r, dh, dv); }
int32_t M_InsetLRect(M_LRect* r, int32_t dh, int32_t dv) { return Inset(r, dh, dv); }
int32_t M_InsetFixedRect(M_FixedRect* r, M_Fixed dh, M_Fixed dv) { return Inset(r, dh, dv); }

int32_t M_OffsetRect(M_Rect* r, int16_t dh, int16_t dv) { return Offset(r, dh, dv); }
int32_t M_OffsetLRect(M_LRect* r, int32_t dh, int32_t dv) { return Offset(r, dh, dv); }
int32_t M_OffsetFixedRect(M_FixedRect* r, M_Fixed dh, M_Fixed dv) { return Offset(r, dh, dv); }

int32_t M_CenterRect(const M_Rect* container, M_Rect* r) { return Center(container, r); }
int32_t M_CenterLRect(const M_LRect* container, M_LRect* r) { return Center(container, r); }
int32_t M_CenterFixedRect(const M_FixedRect* container, M_FixedRect* r) {
  return Center(container, r);
}

M_Point& M_TopLeft(M_Rect& r) { return reinterpret_cast<M_Point&>(r.top); }
M_Point& M_BottomRight(M_Rect& r) { return reinterpret_cast<M_Point&>(r.bottom); }

int32_t M_PtInRect(const M_Point* pt, const M_Rect* r) { return IsInside(pt, r); }
int32_t M_LPtInRect(const M_LPoint* pt, const M_LRect* r) { return IsInside(pt, r); }
int32_t M_FixedPtInRect(const M_FixedPoint* pt, const M_FixedRect* r) { return IsInside(pt, r); }

int32_t M_Pt2Rect(const M_Point* a, const M_Point* b, M_Rect* r) { return Span(a, b, r); }
int32_t M_LPt2Rect(const M_LPoint* a, const M_LPoint* b, M_LRect* r) { return Span(a, b, r); }
int32_t M_FixedPt2Rect(const M_FixedPoint* a, const M_FixedPoint* b, M_FixedRect* r) {
  return Span(a, b, r);
}

int32_t M_PtToAngle(const M_Rect* r, M_Point pt, int16_t* angle) {
  // Kept on purpose: 3.1416 stands for pi, here and in 282.744 = 90 x 3.1416.
  constexpr double kPi = 3.1416;
  constexpr double kQuarterTurn = 282.744;
  const double dx = pt.h - (r->left + r->right) * 0.5;
  // Upwards. Not -dy: the sign of zero decides that straight left is 270 rather than 269.
  const double up = (r->top + r->bottom) * 0.5 - pt.v;
  double a = 0;
  if (dx != 0) {
    a = std::atan2(up, dx) * 180.0;
  } else if (up != 0) {
    a = up > 0 ? kQuarterTurn : -kQuarterTurn;
  }
  a = a / -kPi + 360.0 + 90.0;
  // From 270 to 630. Kept on purpose: exactly 360, straight up, stays 360.
  if (a > 360.0) a -= 360.0;
  *angle = static_cast<int16_t>(a);
  return 0;
}

int32_t M_SectRect(const M_Rect* a, const M_Rect* b, M_Rect* out) { return Intersect(a, b, out); }
int32_t M_SectLRect(const M_LRect* a, const M_LRect* b, M_LRect* out) {
  return Intersect(a, b, out);
}
int32_t M_SectFixedRect(const M_FixedRect* a, const M_FixedRect* b, M_FixedRect* out) {
  return Intersect(a, b, out);
}

// Apart from the others: what a NaN does depends on the form of each test.
int32_t M_SectFloatRect(const M_FloatRect* a, const M_FloatRect* b, M_FloatRect* out) {
  using Pair = Mp::Lanes<2>;
  const auto startsA = Mp::Load<Pair::Doubles>(&a->left),
             endsA = Mp::Load<Pair::Doubles>(&a->right);
  const auto startsB = Mp::Load<Pair::Doubles>(&b->left),
             endsB = Mp::Load<Pair::Doubles>(&b->right);
  const Pair::Doubles starts = startsA > startsB ? startsA : startsB;
  const Pair::Doubles ends = endsA < endsB ? endsA : endsB;
  const auto holds = (ends > starts) & ~((startsA >= endsA) | (startsB >= endsB));
  const bool isOverlap = (holds[0] & holds[1]) != 0;
  if (out) {
    const auto kept = Pair::Bits{} - isOverlap;
    Mp::Store(&out->left, reinterpret_cast<Pair::Bits>(starts) & kept);
    Mp::Store(&out->right, reinterpret_cast<Pair::Bits>(ends) & kept);
  }
  return isOverlap;
}

int32_t M_UnionRect(const M_Rect* a, const M_Rect* b, M_Rect* out) { return Unite(a, b, out); }
int32_t M_UnionLRect(const M_LRect* a, const M_LRect* b, M_LRect* out) { return Unite(a, b, out); }
int32_t M_UnionFixedRect(const M_FixedRect* a, const M_FixedRect* b, M_FixedRect* out) {
  return Unite(a, b, out);
}

int32_t M_RectCompare(uint32_t relation, const M_Rect* a, const M_Rect* b) {
  return Compare(relation, *a, *b);
}
int32_t M_LRectCompare(uint32_t relation, const M_LRect* a, const M_LRect* b) {
  return Compare(relation, *a, *b);
}
int32_t M_FixedRectCompare(uint32_t relation, const M_FixedRect* a, const M_FixedRect* b) {
  return Compare(relation, *a, *b);
}

int32_t M_FixedRect2Rect(const M_FixedRect* from, M_Rect* to) {
  return FromFixed(from, to, kFixedHalf, kFixedHalf);
}
int32_t M_FixedRect2LRect(const M_FixedRect* from, M_LRect* to) {
  return FromFixed(from, to, kFixedHalf, kFixedHalf);
}
int32_t M_FixedRect2RectIn(const M_FixedRect* from, M_Rect* to) {
  return FromFixed(from, to, kAlmostOne, 0);
}
int32_t M_FixedRect2LRectIn(const M_FixedRect* from, M_LRect* to) {
  return FromFixed(from, to, kAlmostOne, 0);
}
int32_t M_FixedRect2RectOut(const M_FixedRect* from, M_Rect* to) {
  return FromFixed(from, to, 0, kAlmostOne);
}
int32_t M_FixedRect2LRectOut(const M_FixedRect* from, M_LRect* to) {
  return FromFixed(from, to, 0, kAlmostOne);
}

int32_t M_Rect2FixedRect(const M_Rect* from, M_FixedRect* to) { return ToFixed(from, to); }
int32_t M_LRect2FixedRect(const M_LRect* from, M_FixedRect* to) { return ToFixed(from, to); }

int32_t M_LRect2Rect(const M_LRect* from, M_Rect* to) {
  // Kept on purpose: each edge is checked on one side only.
  if (from->left < INT16_MIN || from->top < INT16_MIN || from->right > INT16_MAX ||
      from->bottom > INT16_MAX) {
    return M_RECT_OUT_OF_RANGE;
  }
  return Set(to, static_cast<int16_t>(from->left), static_cast<int16_t>(from->top),
             static_cast<int16_t>(from->right), static_cast<int16_t>(from->bottom));
}

}  // extern "C"
