// Points, vectors and rectangles transformed by matrices.
//
// A batch goes through a kernel, which transforms a block of points, as many as suit the vectors of
// the processor. The same source is compiled for the baseline and for AVX2, and which one runs is
// decided when it is called.

#include <algorithm>
#include <bit>
#include <cmath>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Arith.h"
#include "Mp_Err.h"
#include "Mp_Lanes.h"
#include "Mp_Rect.h"
#include "Mp_Round.h"
#include "Mp_Tolerance.h"

namespace {

template <int kLanes>
using Doubles = typename Mp::Lanes<kLanes>::Doubles;
template <int kLanes>
using Bits = typename Mp::Lanes<kLanes>::Bits;

// ---------------------------------------------------------------------------------------------
// Kernels of points that cannot fail: made from a matrix, Transform turns a block of kBlock points.
// ---------------------------------------------------------------------------------------------

// 2D points, as many as fit one vector.
template <int kLanes>
class FloatPoints {
 public:
  static constexpr int kBlock = kLanes / 2;

  [[gnu::always_inline]] explicit FloatPoints(const M_Matrix3& m)
      : diagonal_(Repeat(m.m[0][0], m.m[1][1])),
        crosswise_(Repeat(m.m[1][0], m.m[0][1])),
        translation_(Repeat(m.m[2][0], m.m[2][1])) {}

  [[gnu::always_inline]] void Transform(M_Vector2T<double>* points) const {
    const auto xy = Mp::Load<V>(points);
    V yx;
    if constexpr (kLanes == 2) {
      yx = __builtin_shufflevector(xy, xy, 1, 0);
    } else {
      yx = __builtin_shufflevector(xy, xy, 1, 0, 3, 2);
    }
    Mp::Store(points, diagonal_ * xy + crosswise_ * yx + translation_);
  }

 private:
  using V = Doubles<kLanes>;

  [[gnu::always_inline]] static V Repeat(double even, double odd) {
    if constexpr (kLanes == 2) {
      return V{even, odd};
    } else {
      return V{even, odd, even, odd};
    }
  }

  V diagonal_, crosswise_, translation_;
};

// (x, y, z) x m.
template <int kLanes>
class Vectors3 {
 public:
  static constexpr int kBlock = kLanes;

  explicit Vectors3(const M_Matrix3& m) : m_(m) {}

  [[gnu::always_inline]] void Transform(M_Vector3T<double>* vectors) const {
    const auto& a = m_.m;
    const auto p = Mp::Triples<kLanes>::Load(&vectors->x);
    const Mp::Triples<kLanes> transformed = {a[0][0] * p.x + a[1][0] * p.y + a[2][0] * p.z,
                                             a[0][1] * p.x + a[1][1] * p.y + a[2][1] * p.z,
                                             a[0][2] * p.x + a[1][2] * p.y + a[2][2] * p.z};
    transformed.Store(&vectors->x);
  }

 private:
  const M_Matrix3& m_;
};

// What a point is multiplied by instead of a division, and its w then. Where w counts as zero the
// factor is 1, which leaves a point as it is, and w is kept.
template <int kLanes>
struct Divisor {
  Doubles<kLanes> factor, w;

  [[gnu::always_inline]] explicit Divisor(const Doubles<kLanes>& given) {
    const auto ones = Doubles<kLanes>{} + 1.0;
    // |w|, by its bits.
    const auto magnitude = (Doubles<kLanes>)((Bits<kLanes>)given & INT64_MAX);
    const auto isNearZero = (Bits<kLanes>)(magnitude < Mp::kTolerance);
    // The bits in which 1 and w differ.
    const auto difference = ((Bits<kLanes>)ones ^ (Bits<kLanes>)given) & isNearZero;
    factor = 1.0 / (Doubles<kLanes>)((Bits<kLanes>)given ^ difference);
    w = (Doubles<kLanes>)((Bits<kLanes>)ones ^ difference);
  }
};

// (x, y, z, 1) x m, divided by w.
template <int kLanes>
class Points3 {
 public:
  static constexpr int kBlock = kLanes;

  explicit Points3(const M_Matrix4& m) : m_(m) {}

  [[gnu::always_inline]] void Transform(M_Vector3T<double>* points) const {
    const auto& a = m_.m;
    const auto p = Mp::Triples<kLanes>::Load(&points->x);
    const auto column = [&](int j) __attribute__((always_inline)) {
      return a[0][j] * p.x + a[1][j] * p.y + a[2][j] * p.z + a[3][j];
    };
    const Divisor<kLanes> divisor(column(3));
    const Mp::Triples<kLanes> transformed = {column(0) * divisor.factor, column(1) * divisor.factor,
                                             column(2) * divisor.factor};
    transformed.Store(&points->x);
  }

 private:
  const M_Matrix4& m_;
};

// (x, y, z, w) x m, in parts of kLanes coordinates.
template <int kLanes>
class Vectors4 {
 public:
  static constexpr int kBlock = 1;
  static constexpr int kParts = 4 / kLanes;
  using V = Doubles<kLanes>;

  [[gnu::always_inline]] explicit Vectors4(const M_Matrix4& m) {
    for (int i = 0; i < 4; ++i) {
      for (int part = 0; part < kParts; ++part) {
        rows_[i][part] = Mp::Load<V>(&m.m[i][part == 0 ? 0 : 2]);
      }
    }
  }

  [[gnu::always_inline]] V Part(const M_Vector4T<double>& p, int part) const {
    return p.x * rows_[0][part] + p.y * rows_[1][part] + p.z * rows_[2][part] +
           p.w * rows_[3][part];
  }

  [[gnu::always_inline]] static void StorePart(M_Vector4T<double>* vector, int part,
                                               const V& value) {
    Mp::Store(part == 0 ? &vector->x : &vector->z, value);
  }

  [[gnu::always_inline]] void Transform(M_Vector4T<double>* vector) const {
    const M_Vector4T<double> p = *vector;
    for (int part = 0; part < kParts; ++part) {
      StorePart(vector, part, Part(p, part));
    }
  }

 private:
  V rows_[4][kParts];
};

// (x, y, z, w) x m, divided by w.
template <int kLanes>
class Points4 {
 public:
  static constexpr int kBlock = kLanes;

  explicit Points4(const M_Matrix4& m) : m_(m) {}

  [[gnu::always_inline]] void Transform(M_Vector4T<double>* points) const {
    const auto& a = m_.m;
    const auto p = Mp::Quadruples<kLanes>::Load(points);
    const auto column = [&](int j) __attribute__((always_inline)) {
      return p.x * a[0][j] + p.y * a[1][j] + p.z * a[2][j] + p.w * a[3][j];
    };
    const Divisor<kLanes> divisor(column(3));
    const Mp::Quadruples<kLanes> transformed = {column(0) * divisor.factor,
                                                column(1) * divisor.factor,
                                                column(2) * divisor.factor, divisor.w};
    transformed.Store(points);
  }

 private:
  const M_Matrix4& m_;
};

// ---------------------------------------------------------------------------------------------
// Kernel of integer points: h and v rounded, within bounds
// ---------------------------------------------------------------------------------------------

// What a kind of integer point needs to know beside its coordinates.
struct ShortTraits {
  using Point = M_Point;
  using Coord = int16_t;
  static constexpr int kFieldOfH = 1;
  static constexpr double kUnit = 1.0;
  static constexpr double kLowest = -32768.0;
  static constexpr double kHighest = 32767.0;
  static constexpr int16_t kPlace = Mp_PLACE_TRANSFORM_POINTS;
  static constexpr int16_t kDetail = Mp_STR_IN_POINT_TRANSFORMATION;
};

struct FixedTraits {
  using Point = M_FixedPoint;
  using Coord = int32_t;
  static constexpr int kFieldOfH = 0;
  static constexpr double kUnit = 65536.0;
  static constexpr double kLowest = -2147483648.0;
  static constexpr double kHighest = 2147483647.0;
  static constexpr int16_t kPlace = Mp_PLACE_TRANSFORM_FIX_POINTS;
  static constexpr int16_t kDetail = Mp_STR_IN_FIXED_POINT_TRANSFORMATION;
};

// A lane of 64 bits is one 16.16 point or two short ones: four or two fields. Integers come and go
// as the last places of doubles of the magnitude of 2^52.
template <class Traits, int kLanes>
class IntegerPoints {
 public:
  static constexpr int kPointsInLane = 8 / sizeof(typename Traits::Point);
  static constexpr int kBlock = kLanes * kPointsInLane;

  explicit IntegerPoints(const M_Matrix3& m) : m_(m) {}

  // Leaves the block as it is and returns false if a result is out of bounds or a NaN.
  [[gnu::always_inline]] bool Transform(typename Traits::Point* points) const {
    const auto& a = m_.m;
    const auto fields = Mp::Load<B>(points);
    B rounded = {};
    B isInside = ~B{};
    for (int i = 0; i < kPointsInLane; ++i) {
      const int h = 2 * i + Traits::kFieldOfH;
      const int v = 2 * i + 1 - Traits::kFieldOfH;
      const V x = Get(fields, h);
      const V y = Get(fields, v);
      const double tx = a[2][0] * Traits::kUnit;
      const double ty = a[2][1] * Traits::kUnit;
      rounded |= Round(a[0][0] * x + a[1][0] * y + tx, &isInside) << Shift(h);
      rounded |= Round(a[0][1] * x + a[1][1] * y + ty, &isInside) << Shift(v);
    }
    if (!Mp::HoldsInAll<kLanes>(isInside)) return false;
    Mp::Store(points, rounded);
    return true;
  }

 private:
  using V = Doubles<kLanes>;
  using B = Bits<kLanes>;

  static constexpr int kBits = 8 * sizeof(typename Traits::Coord);
  static constexpr uint64_t kField = ~uint64_t{0} >> (64 - kBits);

  // Where a field starts, counted in the order of memory.
  static constexpr int Shift(int field) {
    return std::endian::native == std::endian::little ? field * kBits : 64 - (field + 1) * kBits;
  }

  [[gnu::always_inline]] static V Get(const B& fields, int field) {
    // Without its sign a field is larger by half its range.
    constexpr uint64_t kSign = (kField >> 1) + 1;
    const V base = V{} + 0x1p52;
    const B bits = (fields >> Shift(field) & kField) ^ kSign;
    return (V)(bits | (B)base) - (0x1p52 + static_cast<double>(kSign));
  }

  // As Mp::RoundHalfUp, but modulo the range of a field; clears the lanes of `isInside` that are
  // out of bounds or a NaN.
  [[gnu::always_inline]] static B Round(const V& d, B* isInside) {
    // Rounds what is added to a whole number, in its last places.
    constexpr double kWhole = 0x1.8p52;
    // The one value below 0 where the sum with 0.5 lies in another whole number than the
    // difference.
    constexpr double kBelowHalf = -0x1.fffffffffffffp-2;
    const V up = d + 0.5;
    // Both bounds in one: where they lie the sum is exact.
    const auto magnitude = (V)((B)up & INT64_MAX);
    *isInside &= (B)(magnitude < Traits::kHighest + 0.5);
    const V whole = up + kWhole;
    const auto isTooHigh = (B)(whole - kWhole > up) | (B)(d == kBelowHalf);
    // A comparison that holds is -1.
    return ((B)whole + isTooHigh) & kField;
  }

  const M_Matrix3& m_;
};
static_assert(ShortTraits::kHighest + 0.5 == -(ShortTraits::kLowest + 0.5));
static_assert(FixedTraits::kHighest + 0.5 == -(FixedTraits::kLowest + 0.5));

// ---------------------------------------------------------------------------------------------
// Batches
// ---------------------------------------------------------------------------------------------

template <template <int> class Kernel, class Matrix, class Point>
void TransformBatch(const Matrix* m, int32_t count, Point* points);

// What is left over fills a block of its own and goes through the same instructions as the others.
// That leaves no room even for the sign of a NaN, which is that of one operand of a sum or the
// other, as the compiler has placed them.
template <template <int> class Kernel, int kBlock, class Matrix, class Point>
[[gnu::noinline]] void TransformLeft(const Matrix* m, int32_t count, Point* points) {
  Point block[kBlock] = {};
  std::copy_n(points, count, block);
  // A constant would be a reason to compile the kernel once more for this call.
  const volatile int32_t size = kBlock;
  TransformBatch<Kernel>(m, size, block);
  std::copy_n(block, count, points);
}

// From so many points on, vectors that lie across two lines of the cache cost more than a detour of
// the first points.
constexpr int32_t kWorthAligning = 256;

// How many points, fewer than a block, lie before the first aligned one; 0 if none is aligned.
template <size_t kAlignment, int kBlock, class Point>
int32_t PointsBeforeAligned(const Point* points) {
  for (int32_t i = 1; i < kBlock; ++i) {
    if (reinterpret_cast<uintptr_t>(points + i) % kAlignment == 0) return i;
  }
  return 0;
}

template <template <int> class Kernel, int kLanes, class Matrix, class Point>
[[gnu::always_inline]] inline void TransformInLanes(const Matrix* m, int32_t count, Point* points) {
  constexpr int kBlock = Kernel<kLanes>::kBlock;
  if (count >= kWorthAligning) {
    const int32_t head = PointsBeforeAligned<kLanes * sizeof(double), kBlock>(points);
    if (head > 0) {
      TransformLeft<Kernel, kBlock>(m, head, points);
      points += head;
      count -= head;
    }
  }
  const Kernel<kLanes> kernel(*m);
  // Not unrolled: the copies need not place their operands alike.
#ifdef __clang__
#pragma clang loop unroll(disable)
#endif
  for (; count >= kBlock; count -= kBlock, points += kBlock) kernel.Transform(points);
  if constexpr (kBlock > 1) {
    if (count > 0) TransformLeft<Kernel, kBlock>(m, count, points);
  }
}

template <template <int> class Kernel, class Matrix, class Point>
[[gnu::noinline]] void TransformWithBaseline(const Matrix* m, int32_t count, Point* points) {
  TransformInLanes<Kernel, 2>(m, count, points);
}

// Whole blocks until one fails; returns the number of points that are done.
template <class Kernel, class Point>
[[gnu::always_inline]] inline int32_t TransformWhileInside(const M_Matrix3* m, int32_t count,
                                                           Point* points) {
  const Kernel kernel(*m);
  int32_t done = 0;
  while (done <= count - Kernel::kBlock && kernel.Transform(points + done)) done += Kernel::kBlock;
  return done;
}

template <template <int> class Kernel, class Matrix, class Point>
MP_TARGET_AVX2 void TransformWithAvx2(const Matrix* m, int32_t count, Point* points) {
  TransformInLanes<Kernel, 4>(m, count, points);
}

template <class Traits>
MP_TARGET_AVX2 int32_t TransformWhileInsideWithAvx2(const M_Matrix3* m, int32_t count,
                                                    typename Traits::Point* points) {
  int32_t done = TransformWhileInside<IntegerPoints<Traits, 4>>(m, count, points);
  done += TransformWhileInside<IntegerPoints<Traits, 2>>(m, count - done, points + done);
  return done;
}

template <template <int> class Kernel, class Matrix, class Point>
void TransformBatch(const Matrix* m, int32_t count, Point* points) {
  // Without points there need be no matrix.
  if (count < 1) return;
  if (Mp::HasAvx2()) return TransformWithAvx2<Kernel>(m, count, points);
  TransformWithBaseline<Kernel>(m, count, points);
}

// A coordinate of one point. False, with nothing stored, for one that is out of bounds: the upper
// one is, though it would fit.
template <class Traits>
bool StoreRounded(double value, typename Traits::Coord* out) {
  if (value >= Traits::kHighest || value <= Traits::kLowest) return false;
  *out = static_cast<typename Traits::Coord>(Mp::RoundHalfUp<int32_t>(value));
  return true;
}

template <class Traits>
int32_t TransformIntegers(const M_Matrix3* m, int32_t count, typename Traits::Point* points) {
  if (count < 1) return 0;
  const auto& a = m->m;
  const double tx = a[2][0] * Traits::kUnit;
  const double ty = a[2][1] * Traits::kUnit;
  for (int32_t i = 0; i < count;) {
    i += Mp::HasAvx2() ? TransformWhileInsideWithAvx2<Traits>(m, count - i, points + i)
                       : TransformWhileInside<IntegerPoints<Traits, 2>>(m, count - i, points + i);
    // The block at which that stopped, or what is left over, point by point.
    constexpr int32_t kBlock = IntegerPoints<Traits, 2>::kBlock;
    for (const int32_t end = i + std::min(count - i, kBlock); i < end; ++i) {
      const double h = points[i].h;
      const double v = points[i].v;
      if (!StoreRounded<Traits>(a[0][0] * h + a[1][0] * v + tx, &points[i].h) ||
          !StoreRounded<Traits>(a[0][1] * h + a[1][1] * v + ty, &points[i].v)) {
        return Mp_ReportErr(Traits::kPlace, M_ERR_OVERFLOW, Traits::kDetail);
      }
    }
  }
  return 0;
}

// ---------------------------------------------------------------------------------------------
// Rectangles
// ---------------------------------------------------------------------------------------------

constexpr int kCorners = 4;

template <class Point, class Rect>
void Corners(const Rect& r, Point* corners) {
  corners[0] = {r.left, r.top};
  corners[1] = {r.right, r.top};
  corners[2] = {r.right, r.bottom};
  corners[3] = {r.left, r.bottom};
}

M_FloatRect Bounds(const M_Vector2T<double>* corners) {
  M_FloatRect bounds = {corners[0].x, corners[0].y, corners[0].x, corners[0].y};
  for (int i = 1; i < kCorners; ++i) {
    bounds.left = std::min(bounds.left, corners[i].x);
    bounds.top = std::min(bounds.top, corners[i].y);
    bounds.right = std::max(bounds.right, corners[i].x);
    bounds.bottom = std::max(bounds.bottom, corners[i].y);
  }
  return bounds;
}

M_FloatRect TransformCorners(const M_Matrix3& m, const M_FloatRect& r,
                             M_Vector2T<double>* corners) {
  M_Vector2T<double> own[kCorners];
  if (!corners) corners = own;
  Corners(r, corners);
  TransformBatch<FloatPoints>(&m, kCorners, corners);
  return Bounds(corners);
}

template <class Rect>
M_FloatRect ToFloat(const Rect& r) {
  return {static_cast<double>(r.left), static_cast<double>(r.top), static_cast<double>(r.right),
          static_cast<double>(r.bottom)};
}

// A short coordinate's range where results are clamped. Kept on purpose: it is narrower by one at
// both ends than 16 bits.
constexpr double kShortLowest = -32767.0;
constexpr double kShortHighest = 32766.0;

double ClampToShort(double value) { return std::clamp(value, kShortLowest, kShortHighest); }

// Whether the corners of a transformed rectangle need not be those of its bounding box.
int32_t StoreIsBoundingBox(const M_Matrix3* m, unsigned char* isBoundingBox) {
  if (!isBoundingBox) return 0;
  uint32_t type;
  const int32_t code = M_GetMatrixType(m, &type);
  if (code == 0) *isBoundingBox = type == M_MATRIX_AFFINE || type == M_MATRIX_PERSPECTIVE;
  return code;
}

}  // namespace

extern "C" {

int32_t M_TransformFloatPoints(const M_Matrix3* m, int32_t count, M_Vector2T<double>* points) {
  TransformBatch<FloatPoints>(m, count, points);
  return 0;
}

int32_t M_TransformPoints(const M_Matrix3* m, int32_t count, M_Point* points) {
  return TransformIntegers<ShortTraits>(m, count, points);
}

int32_t M_TransformFixPoints(const M_Matrix3* m, int32_t count, M_FixedPoint* points) {
  return TransformIntegers<FixedTraits>(m, count, points);
}

int32_t M_TransformVector3(const M_Matrix3* m, int32_t count, M_Vector3T<double>* vectors) {
  TransformBatch<Vectors3>(m, count, vectors);
  return 0;
}

int32_t M_TransformVector4NoDivide(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors) {
  TransformBatch<Vectors4>(m, count, vectors);
  return 0;
}

int32_t M_TransformVector4(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors) {
  TransformBatch<Points4>(m, count, vectors);
  return 0;
}

int32_t M_Transform3DFloatPoints(const M_Matrix4* m, int32_t count, M_Vector3T<double>* points) {
  TransformBatch<Points3>(m, count, points);
  return 0;
}

int32_t M_3DTransform2DPoints(const M_Matrix4* m, int32_t count, M_Point* points) {
  // Truncated, not rounded, and held to the bounds, on purpose: unlike M_TransformPoints.
  const auto toShort = [](double value) {
    return static_cast<int16_t>(Mp::TruncTo<int32_t>(ClampToShort(value)));
  };
  constexpr int32_t kChunk = 64;
  M_Vector3T<double> chunk[kChunk];
  while (count > 0) {
    const int32_t size = std::min(count, kChunk);
    for (int32_t i = 0; i < size; ++i) {
      chunk[i] = {static_cast<double>(points[i].h), static_cast<double>(points[i].v), 0.0};
    }
    M_Transform3DFloatPoints(m, size, chunk);
    for (int32_t i = 0; i < size; ++i) {
      M_SetPt(&points[i], toShort(chunk[i].x), toShort(chunk[i].y));
    }
    points += size;
    count -= size;
  }
  return 0;
}

int32_t M_TransformRect(const M_Matrix3* m, M_Rect* r, M_Vector2T<double>* corners,
                        unsigned char* isBoundingBox) {
  const M_FloatRect bounds = TransformCorners(*m, ToFloat(*r), corners);
  const auto toShort = [](double value) {
    return static_cast<int16_t>(Mp::RoundHalfUp<int32_t>(ClampToShort(value)));
  };
  M_SetRect(r, toShort(bounds.left), toShort(bounds.top), toShort(bounds.right),
            toShort(bounds.bottom));
  return StoreIsBoundingBox(m, isBoundingBox);
}

int32_t M_TransformFloatRect(const M_Matrix3* m, M_FloatRect* r, M_Vector2T<double>* corners,
                             unsigned char* isBoundingBox) {
  *r = TransformCorners(*m, *r, corners);
  return StoreIsBoundingBox(m, isBoundingBox);
}

int32_t M_TransformFixRect(const M_Matrix3* m, M_FixedRect* r, M_FixedPoint* corners,
                           unsigned char* isBoundingBox) {
  M_FixedPoint own[kCorners];
  if (!corners) corners = own;
  Corners(*r, corners);
  if (const int32_t code = M_TransformFixPoints(m, kCorners, corners)) return code;
  const auto [left, right] = std::minmax({corners[0].h, corners[1].h, corners[2].h, corners[3].h});
  const auto [top, bottom] = std::minmax({corners[0].v, corners[1].v, corners[2].v, corners[3].v});
  M_SetFixedRect(r, left, top, right, bottom);
  return StoreIsBoundingBox(m, isBoundingBox);
}

M_LRect M_TransformBounds(const M_Matrix3& m, const M_LRect& r) {
  if (Mp::IsEmpty(r)) return {0, 0, 0, 0};
  const M_FloatRect bounds = TransformCorners(m, ToFloat(r), nullptr);
  const auto down = [](double edge) {
    return Mp::TruncTo<int32_t>(std::floor(std::max(edge, -2147483648.0)));
  };
  const auto up = [](double edge) {
    return Mp::TruncTo<int32_t>(std::ceil(std::min(edge, 2147483647.0)));
  };
  return {down(bounds.left), down(bounds.top), up(bounds.right), up(bounds.bottom)};
}

}  // extern "C"
