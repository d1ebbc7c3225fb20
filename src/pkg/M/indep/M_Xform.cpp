// Points, vectors and rectangles transformed by matrices.
//
// A batch goes through a kernel, which transforms whole blocks of points, as many as fit the
// vectors of the processor. The same source is compiled for the baseline and for AVX2, and which
// one runs is decided when it is called.

#include <algorithm>
#include <bit>
#include <cmath>
#include <iterator>
#include <limits>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Arith.h"
#include "Mp_Err.h"
#include "Mp_Out.h"
#include "Mp_Rect.h"
#include "Mp_Round.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector.h"

namespace {

using Mp::Lanes;
using Mp::Triples;

template <int kLanes>
using Doubles = typename Lanes<kLanes>::Doubles;

// ---------------------------------------------------------------------------------------------
// Which vectors
// ---------------------------------------------------------------------------------------------

template <class Kernel, int kLanes>
[[gnu::noinline]] int32_t Blocks(const typename Kernel::Matrix& m, int32_t count,
                                 typename Kernel::Point* points) {
  return Kernel::template Run<kLanes>(m, count, points);
}

#if defined(__x86_64__) && !defined(M_BASELINE_VECTORS)
constexpr int kMostLanes = 4;

template <class Kernel>
[[gnu::noinline, gnu::target("avx2")]] int32_t WideBlocks(const typename Kernel::Matrix& m,
                                                          int32_t count,
                                                          typename Kernel::Point* points) {
  return Kernel::template Run<kMostLanes>(m, count, points);
}

bool HasWideVectors() { return __builtin_cpu_supports("avx2"); }
#else
constexpr int kMostLanes = 2;

template <class Kernel>
int32_t WideBlocks(const typename Kernel::Matrix& m, int32_t count,
                   typename Kernel::Point* points) {
  return Blocks<Kernel, kMostLanes>(m, count, points);
}

bool HasWideVectors() { return true; }
#endif

// Transforms whole blocks, at most `count` points, and returns how many points that were.
template <class Kernel>
int32_t TransformBlocks(const typename Kernel::Matrix& m, int32_t count,
                        typename Kernel::Point* points) {
  return HasWideVectors() ? WideBlocks<Kernel>(m, count, points)
                          : Blocks<Kernel, 2>(m, count, points);
}

// What is left over fills a block of its own, so that every point goes through the same
// instructions. That leaves no room even for the sign of a NaN, which is that of one operand of a
// sum or the other, as the compiler has placed them.
template <class Kernel>
int32_t TransformAll(const typename Kernel::Matrix* m, int32_t count,
                     typename Kernel::Point* points) {
  if (count < 1) return 0;
  const int32_t done = TransformBlocks<Kernel>(*m, count, points);
  if (done < count) {
    typename Kernel::Point block[kMostLanes] = {};
    std::copy(points + done, points + count, block);
    TransformBlocks<Kernel>(*m, kMostLanes, block);
    std::copy_n(block, count - done, points + done);
  }
  return 0;
}

// ---------------------------------------------------------------------------------------------
// Kernels. Run<kLanes>(m, count, points) transforms whole blocks of at most kMostLanes points, in
// place, and returns how many points it has transformed.
// ---------------------------------------------------------------------------------------------

// 2D points, as many as fit one vector.
struct FloatPoints {
  using Matrix = M_Matrix3;
  using Point = M_Vector2T<double>;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& m, int32_t count, Point* points) {
    using V = Doubles<kLanes>;
    constexpr int kBlock = kLanes / 2;
    const V byX = Row<kLanes>(m.m[0]);
    const V byY = Row<kLanes>(m.m[1]);
    const V translation = Row<kLanes>(m.m[2]);
    int32_t i = 0;
    for (; i <= count - kBlock; i += kBlock) {
      const V xy = Mp::Load<V>(points + i);
      V x, y;
      if constexpr (kLanes == 2) {
        x = __builtin_shufflevector(xy, xy, 0, 0);
        y = __builtin_shufflevector(xy, xy, 1, 1);
      } else {
        x = __builtin_shufflevector(xy, xy, 0, 0, 2, 2);
        y = __builtin_shufflevector(xy, xy, 1, 1, 3, 3);
      }
      Mp::Store(points + i, byX * x + byY * y + translation);
    }
    return i;
  }

 private:
  template <int kLanes>
  [[gnu::always_inline]] static Doubles<kLanes> Row(const double* row) {
    if constexpr (kLanes == 2) {
      return Doubles<2>{row[0], row[1]};
    } else {
      return Doubles<4>{row[0], row[1], row[0], row[1]};
    }
  }
};

// (x, y, z) x m.
struct Vectors3 {
  using Matrix = M_Matrix3;
  using Point = M_Vector3T<double>;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& matrix, int32_t count, Point* points) {
    const Matrix m = matrix;
    const auto& a = m.m;
    int32_t i = 0;
    for (; i <= count - kLanes; i += kLanes) {
      const auto p = Triples<kLanes>::Load(&points[i].x);
      const Triples<kLanes> transformed = {a[0][0] * p.x + a[1][0] * p.y + a[2][0] * p.z,
                                           a[0][1] * p.x + a[1][1] * p.y + a[2][1] * p.z,
                                           a[0][2] * p.x + a[1][2] * p.y + a[2][2] * p.z};
      transformed.Store(&points[i].x);
    }
    return i;
  }
};

// 1 / w, and 1 where w counts as zero: times 1 is not divided.
template <int kLanes>
[[gnu::always_inline]] inline Doubles<kLanes> Reciprocal(const Doubles<kLanes>& w) {
  const auto isNearZero = (w > -Mp::kTolerance) & (w < Mp::kTolerance);
  const Doubles<kLanes> ones = Doubles<kLanes>{} + 1.0;
  return 1.0 / (isNearZero ? ones : w);
}

// (x, y, z, 1) x m, divided by w.
struct Points3 {
  using Matrix = M_Matrix4;
  using Point = M_Vector3T<double>;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& matrix, int32_t count, Point* points) {
    const Matrix m = matrix;
    const auto& a = m.m;
    int32_t i = 0;
    for (; i <= count - kLanes; i += kLanes) {
      const auto p = Triples<kLanes>::Load(&points[i].x);
      const auto w = a[0][3] * p.x + a[1][3] * p.y + a[2][3] * p.z + a[3][3];
      const auto r = Reciprocal<kLanes>(w);
      const Triples<kLanes> transformed = {
          (a[0][0] * p.x + a[1][0] * p.y + a[2][0] * p.z + a[3][0]) * r,
          (a[0][1] * p.x + a[1][1] * p.y + a[2][1] * p.z + a[3][1]) * r,
          (a[0][2] * p.x + a[1][2] * p.y + a[2][2] * p.z + a[3][2]) * r};
      transformed.Store(&points[i].x);
    }
    return i;
  }
};

// A matrix of 4 x 4 as the vectors of its rows: one each, or two of two lanes.
template <int kLanes>
struct Rows {
  static constexpr int kParts = 4 / kLanes;
  using V = Doubles<kLanes>;
  V parts[4][kParts];

  [[gnu::always_inline]] explicit Rows(const M_Matrix4& m) {
    for (int i = 0; i < 4; ++i) {
      for (int j = 0; j < kParts; ++j) parts[i][j] = Mp::Load<V>(&m.m[i][j * kLanes]);
    }
  }

  // One part of p x m.
  [[gnu::always_inline]] V Transform(const M_Vector4T<double>& p, int part) const {
    return p.x * parts[0][part] + p.y * parts[1][part] + p.z * parts[2][part] +
           p.w * parts[3][part];
  }
};

struct Vectors4 {
  using Matrix = M_Matrix4;
  using Point = M_Vector4T<double>;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& m, int32_t count, Point* points) {
    const Rows<kLanes> rows(m);
    for (int32_t i = 0; i < count; ++i) {
      const Point p = points[i];
      for (int part = 0; part < rows.kParts; ++part) {
        Mp::Store(&points[i].x + part * kLanes, rows.Transform(p, part));
      }
    }
    return count;
  }
};

// (x, y, z, w) x m, divided by w.
struct Points4 {
  using Matrix = M_Matrix4;
  using Point = M_Vector4T<double>;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& m, int32_t count, Point* points) {
    using V = Doubles<kLanes>;
    const Rows<kLanes> rows(m);
    constexpr int kLast = Rows<kLanes>::kParts - 1;
    const V ones = V{} + 1.0;
    int32_t i = 0;
    for (; i <= count - kLanes; i += kLanes) {
      V p[kLanes][kLast + 1];
      for (int k = 0; k < kLanes; ++k) {
        for (int part = 0; part <= kLast; ++part) p[k][part] = rows.Transform(points[i + k], part);
      }
      // The divisions of a block are one division of a vector.
      V w, end;
      if constexpr (kLanes == 2) {
        w = __builtin_shufflevector(p[0][kLast], p[1][kLast], 1, 3);
      } else {
        const V w01 = __builtin_shufflevector(p[0][kLast], p[1][kLast], 1, 5, 3, 7);
        const V w23 = __builtin_shufflevector(p[2][kLast], p[3][kLast], 1, 5, 3, 7);
        w = __builtin_shufflevector(w01, w23, 2, 3, 6, 7);
      }
      const V r = Reciprocal<kLanes>(w);
      const auto isNearZero = (w > -Mp::kTolerance) & (w < Mp::kTolerance);
      end = isNearZero ? w : ones;
      for (int k = 0; k < kLanes; ++k) {
        for (int part = 0; part <= kLast; ++part) {
          V scaled = p[k][part] * r[k];
          if (part == kLast) scaled[kLanes - 1] = end[k];
          Mp::Store(&points[i + k].x + part * kLanes, scaled);
        }
      }
    }
    return i;
  }
};

// ---------------------------------------------------------------------------------------------
// Integer points: h and v rounded, within bounds
// ---------------------------------------------------------------------------------------------

// h and v of several points.
template <int kLanes>
struct Pairs {
  using Ints = typename Lanes<kLanes>::Ints;
  Ints h, v;
};

// One word a point.
template <int kLanes>
[[gnu::always_inline]] inline Pairs<kLanes> LoadPairs(const M_Point* points) {
  using Ints = typename Lanes<kLanes>::Ints;
  const auto words = Mp::Load<Ints>(points);
  const Ints high = words >> 16;
  const Ints low = words * 0x10000 >> 16;
  if constexpr (std::endian::native == std::endian::little) return {high, low};
  return {low, high};
}

template <int kLanes>
[[gnu::always_inline]] inline void StorePairs(const Pairs<kLanes>& p, M_Point* points) {
  const bool isLittle = std::endian::native == std::endian::little;
  const auto high = isLittle ? p.h : p.v;
  const auto low = isLittle ? p.v : p.h;
  Mp::Store(points, high * 0x10000 | (low & 0xFFFF));
}

template <int kLanes>
[[gnu::always_inline]] inline Pairs<kLanes> LoadPairs(const M_FixedPoint* points) {
  using Ints = typename Lanes<kLanes>::Ints;
  const auto a = Mp::Load<Ints>(points);
  const auto b = Mp::Load<Ints>(points + kLanes / 2);
  if constexpr (kLanes == 2) {
    return {__builtin_shufflevector(a, b, 0, 2), __builtin_shufflevector(a, b, 1, 3)};
  } else {
    return {__builtin_shufflevector(a, b, 0, 2, 4, 6), __builtin_shufflevector(a, b, 1, 3, 5, 7)};
  }
}

template <int kLanes>
[[gnu::always_inline]] inline void StorePairs(const Pairs<kLanes>& p, M_FixedPoint* points) {
  if constexpr (kLanes == 2) {
    Mp::Store(points, __builtin_shufflevector(p.h, p.v, 0, 2));
    Mp::Store(points + 1, __builtin_shufflevector(p.h, p.v, 1, 3));
  } else {
    Mp::Store(points, __builtin_shufflevector(p.h, p.v, 0, 4, 1, 5));
    Mp::Store(points + 2, __builtin_shufflevector(p.h, p.v, 2, 6, 3, 7));
  }
}

// Mp::RoundHalfUp for values that fit.
template <int kLanes>
[[gnu::always_inline]] inline typename Lanes<kLanes>::Ints Round(const Doubles<kLanes>& d) {
  using V = Doubles<kLanes>;
  using Ints = typename Lanes<kLanes>::Ints;
  const V up = d + 0.5;
  const V whole = __builtin_convertvector(__builtin_convertvector(up, Ints), V);
  const V down = whole == up ? d : d - 0.5;
  return __builtin_convertvector(d > 0.0 ? up : down, Ints);
}

// What a kind of integer point needs to know beside its coordinates. The upper bound is rejected,
// though it would fit.
struct ShortTraits {
  using Point = M_Point;
  static constexpr double kUnit = 1.0;
  static constexpr double kLowest = -32768.0;
  static constexpr double kHighest = 32767.0;
  static constexpr int16_t kPlace = Mp_PLACE_TRANSFORM_POINTS;
  static constexpr int16_t kDetail = Mp_STR_IN_POINT_TRANSFORMATION;
};

struct FixedTraits {
  using Point = M_FixedPoint;
  static constexpr double kUnit = 65536.0;
  static constexpr double kLowest = -2147483648.0;
  static constexpr double kHighest = 2147483647.0;
  static constexpr int16_t kPlace = Mp_PLACE_TRANSFORM_FIX_POINTS;
  static constexpr int16_t kDetail = Mp_STR_IN_FIXED_POINT_TRANSFORMATION;
};

// Stops before a block with a result that is out of bounds, or a NaN.
template <class Traits>
struct IntegerPoints {
  using Matrix = M_Matrix3;
  using Point = typename Traits::Point;

  template <int kLanes>
  [[gnu::always_inline]] static int32_t Run(const Matrix& matrix, int32_t count, Point* points) {
    using V = Doubles<kLanes>;
    const Matrix m = matrix;
    const auto& a = m.m;
    const double tx = a[2][0] * Traits::kUnit;
    const double ty = a[2][1] * Traits::kUnit;
    int32_t i = 0;
    for (; i <= count - kLanes; i += kLanes) {
      const auto p = LoadPairs<kLanes>(points + i);
      const V h = __builtin_convertvector(p.h, V);
      const V v = __builtin_convertvector(p.v, V);
      const V x = a[0][0] * h + a[1][0] * v + tx;
      const V y = a[0][1] * h + a[1][1] * v + ty;
      const auto isInside = (x < Traits::kHighest) & (x > Traits::kLowest) &
                            (y < Traits::kHighest) & (y > Traits::kLowest);
      if (!Mp::HoldsInAll<kLanes>(isInside)) break;
      StorePairs<kLanes>({Round<kLanes>(x), Round<kLanes>(y)}, points + i);
    }
    return i;
  }

  // A coordinate of one point. False, with nothing stored, for one that is out of bounds.
  template <class Int>
  static bool Store(double value, Int* out) {
    if (value >= Traits::kHighest || value <= Traits::kLowest) return false;
    *out = static_cast<Int>(Mp::RoundHalfUp<int32_t>(value));
    return true;
  }

  static int32_t Transform(const Matrix* matrix, int32_t count, Point* points) {
    const auto& a = matrix->m;
    const double tx = a[2][0] * Traits::kUnit;
    const double ty = a[2][1] * Traits::kUnit;
    for (int32_t i = 0; i < count;) {
      i += TransformBlocks<IntegerPoints>(*matrix, count - i, points + i);
      // The block at which the others stopped, or what is left over, point by point.
      for (const int32_t end = i + std::min(count - i, kMostLanes); i < end; ++i) {
        const double h = points[i].h;
        const double v = points[i].v;
        if (!Store(a[0][0] * h + a[1][0] * v + tx, &points[i].h) ||
            !Store(a[0][1] * h + a[1][1] * v + ty, &points[i].v)) {
          return Mp_ReportErr(Traits::kPlace, M_ERR_OVERFLOW, Traits::kDetail);
        }
      }
    }
    return 0;
  }
};

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
  TransformAll<FloatPoints>(&m, kCorners, corners);
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
  return TransformAll<FloatPoints>(m, count, points);
}

int32_t M_TransformPoints(const M_Matrix3* m, int32_t count, M_Point* points) {
  return IntegerPoints<ShortTraits>::Transform(m, count, points);
}

int32_t M_TransformFixPoints(const M_Matrix3* m, int32_t count, M_FixedPoint* points) {
  return IntegerPoints<FixedTraits>::Transform(m, count, points);
}

int32_t M_TransformVector3(const M_Matrix3* m, int32_t count, M_Vector3T<double>* vectors) {
  return TransformAll<Vectors3>(m, count, vectors);
}

int32_t M_TransformVector4NoDivide(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors) {
  return TransformAll<Vectors4>(m, count, vectors);
}

int32_t M_TransformVector4(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors) {
  return TransformAll<Points4>(m, count, vectors);
}

int32_t M_Transform3DFloatPoints(const M_Matrix4* m, int32_t count, M_Vector3T<double>* points) {
  return TransformAll<Points3>(m, count, points);
}

int32_t M_3DTransform2DPoints(const M_Matrix4* m, int32_t count, M_Point* points) {
  // Truncated, not rounded, and held to the bounds, on purpose: unlike M_TransformPoints.
  const auto toShort = [](double value) {
    return static_cast<int16_t>(Mp::TruncTo<int32_t>(ClampToShort(value)));
  };
  constexpr int32_t kChunk = 64;
  M_Vector3T<double> chunk[kChunk];
  for (int32_t start = 0; start < count; start += kChunk) {
    const int32_t size = std::min(count - start, kChunk);
    M_Point* const some = points + start;
    for (int32_t i = 0; i < size; ++i) {
      chunk[i] = {static_cast<double>(some[i].h), static_cast<double>(some[i].v), 0.0};
    }
    M_Transform3DFloatPoints(m, size, chunk);
    for (int32_t i = 0; i < size; ++i) M_SetPt(&some[i], toShort(chunk[i].x), toShort(chunk[i].y));
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
