/// \file
/// M_CMatrixImpl.h: the inline parts of M_Matrix.h, those that only move numbers or pass a call on.
///
/// What calculates is in the library: compiled by a client it could be contracted, or reordered by
/// the client's flags, and give other bits.
#ifndef M_CMATRIX_IMPL_H
#define M_CMATRIX_IMPL_H

#include <iterator>
#include <type_traits>
#include <utility>
#include <vector>

#include "M_Matrix.h"

inline void M_Matrix3::Transpose() {
  std::swap(m[0][1], m[1][0]);
  std::swap(m[0][2], m[2][0]);
  std::swap(m[1][2], m[2][1]);
}

inline void M_Matrix3::AssignFromByDroppingZ(const M_Matrix4& m4) {
  *this = {{{m4.m[0][0], m4.m[0][1], m4.m[0][3]},
            {m4.m[1][0], m4.m[1][1], m4.m[1][3]},
            {m4.m[3][0], m4.m[3][1], m4.m[3][3]}}};
}

inline void M_Matrix4::Transpose() {
  for (int i = 0; i < 4; ++i) {
    for (int j = 0; j < i; ++j) std::swap(m[i][j], m[j][i]);
  }
}

// ---------------------------------------------------------------------------------------------
// Templates. The library has the specialisations that are declared here; whatever else a client
// calls them with is converted to one of these, or refused.
// ---------------------------------------------------------------------------------------------

#pragma GCC visibility push(default)

template <>
bool M_IsConvex(const M_Vector2T<double>* first, const M_Vector2T<double>* last);
template <>
bool M_IsConvex(const M_Vector3T<double>* first, const M_Vector3T<double>* last);
template <>
bool M_IsConvex(const M_Vector4T<double>* first, const M_Vector4T<double>* last);
template <>
bool M_IsConvex(std::vector<M_Vector2T<double>>::const_iterator first,
                std::vector<M_Vector2T<double>>::const_iterator last);
template <>
bool M_IsConvex(std::vector<M_Vector3T<double>>::const_iterator first,
                std::vector<M_Vector3T<double>>::const_iterator last);
template <>
bool M_IsConvex(std::vector<M_Vector4T<double>>::const_iterator first,
                std::vector<M_Vector4T<double>>::const_iterator last);

template <>
void M_ComputeConvexHull(const M_Vector2T<double>* first, const M_Vector2T<double>* last,
                         std::vector<M_Vector2T<double>>& out);
template <>
void M_ComputeConvexHull(const M_Vector3T<double>* first, const M_Vector3T<double>* last,
                         std::vector<M_Vector3T<double>>& out);
template <>
void M_ComputeConvexHull(const M_Vector4T<double>* first, const M_Vector4T<double>* last,
                         std::vector<M_Vector4T<double>>& out);
template <>
void M_ComputeConvexHull(const qelcore::geom::PointT<float>* first,
                         const qelcore::geom::PointT<float>* last,
                         std::vector<qelcore::geom::PointT<float>>& out);
template <>
void M_ComputeConvexHull(std::vector<M_Vector2T<double>>::const_iterator first,
                         std::vector<M_Vector2T<double>>::const_iterator last,
                         std::vector<M_Vector2T<double>>& out);
template <>
void M_ComputeConvexHull(std::vector<M_Vector3T<double>>::const_iterator first,
                         std::vector<M_Vector3T<double>>::const_iterator last,
                         std::vector<M_Vector3T<double>>& out);
template <>
void M_ComputeConvexHull(std::vector<M_Vector4T<double>>::const_iterator first,
                         std::vector<M_Vector4T<double>>::const_iterator last,
                         std::vector<M_Vector4T<double>>& out);
template <>
void M_ComputeConvexHull(std::vector<qelcore::geom::PointT<float>>::const_iterator first,
                         std::vector<qelcore::geom::PointT<float>>::const_iterator last,
                         std::vector<qelcore::geom::PointT<float>>& out);

template <>
int32_t M_IsFloatPointInConcavePoly(const M_Vector2T<double>* point, const M_Vector2T<double>* poly,
                                    int32_t count, double tolerance, unsigned char* inside);
template <>
int32_t M_IsFloatPointInConcavePoly(const M_Vector2T<float>* point, const M_Vector2T<float>* poly,
                                    int32_t count, double tolerance, unsigned char* inside);

template <>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const M_TransformPoly2D& poly);
template <>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const M_TransformPoly3D& poly);

template <>
void M_Vector4T<double>::Normalize();

/// How what clients call the templates with becomes what these have been compiled for.
namespace M_Detail {

template <class T, class... Others>
inline constexpr bool kIsOneOf = (std::is_same_v<T, Others> || ...);

/// False, but not before a template is instantiated.
template <class...>
inline constexpr bool kNever = false;

template <class Iterator, class = void>
struct ValueOf {
  using type = void;
};
template <class Iterator>
struct ValueOf<Iterator, std::void_t<typename std::iterator_traits<Iterator>::value_type>> {
  using type = typename std::iterator_traits<Iterator>::value_type;
};

/// The const pointer or iterator that both ends of a range of points convert to; void if there is
/// none, or if they are ends of ranges of something else: an array of a derived class may be walked
/// with other strides.
template <class T, class First, class Last>
struct Range {
  using VectorIterator = typename std::vector<T>::const_iterator;
  static constexpr bool kIsOfT = std::is_same_v<typename ValueOf<First>::type, T> &&
                                 std::is_same_v<typename ValueOf<Last>::type, T>;
  template <class Listed>
  static constexpr bool kIs =
      std::is_convertible_v<First, Listed>&& std::is_convertible_v<Last, Listed>;
  using type = std::conditional_t<
      !kIsOfT, void,
      std::conditional_t<kIs<const T*>, const T*,
                         std::conditional_t<kIs<VectorIterator>, VectorIterator, void>>>;
};
template <class First, class Last>
struct Range<void, First, Last> {
  using type = void;
};

template <class First, class Last>
bool IsConvex(First first, Last last) {
  using T = typename ValueOf<First>::type;
  using Listed = typename Range<T, First, Last>::type;
  if constexpr (kIsOneOf<T, M_Vector2T<double>, M_Vector3T<double>, M_Vector4T<double>> &&
                !std::is_void_v<Listed>) {
    return M_IsConvex(static_cast<Listed>(first), static_cast<Listed>(last));
  } else {
    static_assert(kNever<First, Last>,
                  "M_IsConvex takes pointers to M_Vector2T<double>, M_Vector3T<double> or "
                  "M_Vector4T<double>, or iterators of a std::vector of these.");
    return false;
  }
}

template <class First, class Last, class Out>
void ComputeConvexHull(First first, Last last, Out& out) {
  using T = typename ValueOf<First>::type;
  using Listed = typename Range<T, First, Last>::type;
  if constexpr (kIsOneOf<T, M_Vector2T<double>, M_Vector3T<double>, M_Vector4T<double>,
                         qelcore::geom::PointT<float>> &&
                !std::is_void_v<Listed> && std::is_same_v<Out, std::vector<T>>) {
    M_ComputeConvexHull(static_cast<Listed>(first), static_cast<Listed>(last), out);
  } else {
    static_assert(kNever<First, Last>,
                  "M_ComputeConvexHull takes pointers to M_Vector2T<double>, M_Vector3T<double>, "
                  "M_Vector4T<double> or qelcore::geom::PointT<float>, or iterators of a "
                  "std::vector of these, and a std::vector of the same points for the result.");
  }
}

/// Whether these may be the point and the polygon of a hit test.
template <class T, class Point, class Poly>
inline constexpr bool kIsHitTest = std::is_convertible_v<Point, const T*>&&
    std::is_convertible_v<Poly, const T*>&& std::is_same_v<typename ValueOf<Poly>::type, T>;

template <class Point, class Poly>
int32_t IsPointInside(Point point, Poly poly, int32_t count, double tolerance,
                      unsigned char* inside) {
  using OfDouble = M_Vector2T<double>;
  using OfFloat = M_Vector2T<float>;
  if constexpr (kIsHitTest<OfDouble, Point, Poly>) {
    return M_IsFloatPointInConcavePoly<OfDouble>(point, poly, count, tolerance, inside);
  } else if constexpr (kIsHitTest<OfFloat, Point, Poly>) {
    return M_IsFloatPointInConcavePoly<OfFloat>(point, poly, count, tolerance, inside);
  } else {
    static_assert(kNever<Point, Poly>,
                  "M_IsFloatPointInConcavePoly takes pointers to M_Vector2T<double> or "
                  "M_Vector2T<float>, the same for the point and the polygon.");
    return 0;
  }
}

}  // namespace M_Detail

template <class Iterator>
bool M_IsConvex(Iterator first, Iterator last) {
  return M_Detail::IsConvex(first, last);
}
template <class First, class Last>
bool M_IsConvex(First first, Last last) {
  return M_Detail::IsConvex(first, last);
}

template <class Iterator>
void M_ComputeConvexHull(Iterator first, Iterator last,
                         std::vector<typename std::iterator_traits<Iterator>::value_type>& out) {
  M_Detail::ComputeConvexHull(first, last, out);
}
template <class First, class Last, class Out>
void M_ComputeConvexHull(First first, Last last, Out& out) {
  M_Detail::ComputeConvexHull(first, last, out);
}

template <class Point>
int32_t M_IsFloatPointInConcavePoly(const Point* point, const Point* poly, int32_t count,
                                    double tolerance, unsigned char* inside) {
  return M_Detail::IsPointInside(point, poly, count, tolerance, inside);
}
template <class Point, class Poly>
int32_t M_IsFloatPointInConcavePoly(Point point, Poly poly, int32_t count, double tolerance,
                                    unsigned char* inside) {
  return M_Detail::IsPointInside(point, poly, count, tolerance, inside);
}

template <class Poly>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const Poly& poly) {
  if constexpr (std::is_convertible_v<const Poly&, const M_TransformPoly3D&>) {
    return M_GetMinimumEdgeDistance<M_TransformPoly3D>(point, poly);
  } else if constexpr (std::is_convertible_v<const Poly&, const M_TransformPoly2D&>) {
    return M_GetMinimumEdgeDistance<M_TransformPoly2D>(point, poly);
  } else {
    static_assert(M_Detail::kNever<Poly>,
                  "M_GetMinimumEdgeDistance takes a M_TransformPoly2D or a M_TransformPoly3D.");
    return -1;
  }
}

template <class T>
void M_Vector4T<T>::Normalize() {
  static_assert(M_Detail::kNever<T>, "Only a M_Vector4T<double> can be normalized.");
}

#pragma GCC visibility pop

#endif  // M_CMATRIX_IMPL_H
