/// \file
/// M_Matrix.h: vectors, 3x3 and 4x4 matrices, and the functions on them.
///
/// Contents
///   Vectors       M_Vector2T M_Vector3T M_Vector4T
///   Matrices      M_Matrix3 M_Matrix4
///   3x3 matrices  M_EqualMatrix M_EqualMatrixWithinEpsilon M_SetIdentityMatrix M_TranslateMatrix
///                 M_RotateMatrix M_ScaleMatrix M_ConcatMatrix M_GetMatrixType
///                 M_InverseMatrixQuiet M_InverseMatrix
///   4x4 matrices  M_EqualMatrix4 M_ZeroMatrix4 M_IdentityMatrix4 M_SetMatrix4CoB M_ConcatMatrix4
///                 M_TransposeMatrix4 M_GetMatrix4Determinant M_InverseMatrix4Quiet
///                 M_InverseMatrix4 M_CalcNormalMatrix4Quiet M_CalcNormalMatrix4
///                 M_TranslateMatrix4 M_ScaleMatrix4 M_Matrix3ToMatrix4 M_Matrix3ToMatrix4Uniform
///
/// Conventions: points are row vectors on the left, p' = p x M, so translation is in the last row,
/// the homogeneous column is the last, and in a product A x B the transform A acts first. Products
/// and sums are never fused. A value strictly between -1e-12 and 1e-12
/// counts as a zero length or w. A function that can fail returns a 32-bit code, 0 for success, or,
/// as a member, throws it as an `int`. Pointers must not be null unless their comment says so; an
/// output may be one of the inputs of its type. Everything may be called from any thread.
#ifndef M_MATRIX_H
#define M_MATRIX_H

#include <cstddef>
#include <cstdint>

#include "M_Rect.h"
#include "M_Utils.h"

#pragma GCC visibility push(default)

// ---------------------------------------------------------------------------------------------
// Vectors
// ---------------------------------------------------------------------------------------------

/// A point or vector in the plane.
template <class T>
struct M_Vector2T {
  T x;
  T y;
};
static_assert(sizeof(M_Vector2T<double>) == 16 && offsetof(M_Vector2T<double>, y) == 8);

/// A point or vector in space, or a homogeneous point of the plane.
template <class T>
struct M_Vector3T {
  T x;
  T y;
  T z;
};
static_assert(sizeof(M_Vector3T<double>) == 24 && offsetof(M_Vector3T<double>, y) == 8);
static_assert(offsetof(M_Vector3T<double>, z) == 16);

/// A homogeneous point of space, or a direction where w is 0.
template <class T>
struct M_Vector4T {
  T x;
  T y;
  T z;
  T w;

  /// Scales x, y and z to unit length and keeps w. A w that is not 0 is reported, but no failure.
  /// Throws M_ERR_ZERO_VECTOR, after a report, when x^2 + y^2 + z^2 counts as zero; the vector is
  /// then untouched. For doubles only.
  void Normalize();
};
static_assert(sizeof(M_Vector4T<double>) == 32 && offsetof(M_Vector4T<double>, y) == 8);
static_assert(offsetof(M_Vector4T<double>, z) == 16 && offsetof(M_Vector4T<double>, w) == 24);

template <>
void M_Vector4T<double>::Normalize();

// ---------------------------------------------------------------------------------------------
// Matrices
// ---------------------------------------------------------------------------------------------

/// Nine doubles, row by row: a transform of (x, y, 1) with the translation in m[2].
struct M_Matrix3 {
  double m[3][3];

  /// *p := (p x M) / w', each component divided, with z then 1. Throws M_ERR_W_IS_ZERO, after a
  /// report, when w' counts as zero; p is then untouched.
  void TransformPointAndDivide(M_Vector3T<double>* p) const;

  /// The same for `count` points. The first that fails ends it: those before it are transformed,
  /// it and those behind it untouched.
  void TransformPointsAndDivide(int count, M_Vector3T<double>* pts) const;

  /// The same without a look at w'; a w' of 0 gives infinities or NaNs.
  void TransformPointAndDivideFast(M_Vector3T<double>* p) const;
  void TransformPointsAndDivideFast(int count, M_Vector3T<double>* pts) const;

  /// Whether no |m[i][j]| > eps. A NaN passes.
  bool IsZeroWithinEpsilon(double eps) const;

  /// Whether no element differs from the identity's by more than eps. A NaN passes.
  bool IsIdentityWithinEpsilon(double eps) const;

  void Transpose();
  double Determinant() const;

  /// Makes this its adjugate: M x adj(M) = det(M) I.
  void Adjoint();

  M_Matrix3& operator+=(const M_Matrix3& other);
  M_Matrix3& operator-=(const M_Matrix3& other);

  /// The 2D part of a 3D transform: rows and columns 0, 1 and 3.
  void AssignFromByDroppingZ(const M_Matrix4& m4);

  /// m4 without one row and one column, each 0..3. For an index that is not, none is left out, and
  /// of four rows or columns the first three are taken.
  void AssignFromByDroppingIndices(const M_Matrix4& m4, int row, int col);
};
static_assert(sizeof(M_Matrix3) == 72);

/// Sixteen doubles, row by row: a transform of (x, y, z, w) with the translation in m[3].
struct M_Matrix4 {
  double m[4][4];

  /// *p := (p x M) x (1 / w'), with w then 1. Throws M_ERR_W_IS_ZERO, after a report, when w'
  /// counts as zero; p is then untouched.
  void TransformPointAndDivide(M_Vector4T<double>* p) const;

  /// The same for `count` points. The first that fails ends it: those before it are transformed,
  /// it and those behind it untouched.
  void TransformPointsAndDivide(int count, M_Vector4T<double>* pts) const;

  /// The same without a look at w'; a w' of 0 gives infinities or NaNs.
  void TransformPointAndDivideFast(M_Vector4T<double>* p) const;
  void TransformPointsAndDivideFast(int count, M_Vector4T<double>* pts) const;

  /// Whether no |m[i][j]| > eps. A NaN passes.
  bool IsZeroWithinEpsilon(double eps) const;

  /// Whether no element differs from the identity's by more than eps. A NaN passes.
  bool IsIdentityWithinEpsilon(double eps) const;

  /// Whether no element is an infinity or a NaN.
  bool IsFinite() const;

  /// M := M x P, where P is the identity with P[2][3] = 1 / d, P[3][2] = -1 and P[3][3] = 0. A d of
  /// 0 is not looked for.
  void Project(double d);

  void Transpose();

  M_Matrix4& operator+=(const M_Matrix4& other);
  M_Matrix4& operator-=(const M_Matrix4& other);
};
static_assert(sizeof(M_Matrix4) == 128);

// ---------------------------------------------------------------------------------------------
// Comparison within a tolerance: whether no two elements differ by more than eps. A NaN passes.
// ---------------------------------------------------------------------------------------------

bool M_EqualMatrixWithinEpsilon(const M_Matrix3& a, const M_Matrix3& b, double eps);
bool M_EqualMatrixWithinEpsilon(const M_Matrix4& a, const M_Matrix4& b, double eps);

extern "C" {

// ---------------------------------------------------------------------------------------------
// 3x3 matrices: transforms of the plane
// ---------------------------------------------------------------------------------------------

/// *equal = whether all elements are equal; a NaN equals nothing. Always 0.
int32_t M_EqualMatrix(const M_Matrix3* a, const M_Matrix3* b, bool* equal);

/// Always 0.
int32_t M_SetIdentityMatrix(M_Matrix3* m);

/// m := m x T, with T[2] = (tx, ty, 1). Always 0.
int32_t M_TranslateMatrix(M_Matrix3* m, double tx, double ty);

/// m := m x R, the rotation about (cx, cy) that takes (1, 0) to (cos, sin) of the angle: clockwise
/// where y runs downwards. 0 degrees leaves m untouched. Always 0.
int32_t M_RotateMatrix(M_Matrix3* m, double degrees, double cx, double cy);

/// m := m x S, the scale that keeps (cx, cy) in place. A scale of (1, 1) leaves m untouched. Always
/// 0.
int32_t M_ScaleMatrix(M_Matrix3* m, double sx, double sy, double cx, double cy);

/// b := b x a, so b's transform acts first (the 4x4 call is the other way round: out := a x b).
/// Always 0.
int32_t M_ConcatMatrix(const M_Matrix3* a, M_Matrix3* b);

/// What M_GetMatrixType tells, by exact comparison.
enum : uint32_t {
  M_MATRIX_IDENTITY = 0,
  M_MATRIX_TRANSLATE = 1,
  M_MATRIX_SCALE = 2,
  M_MATRIX_SCALE_TRANSLATE = 3,
  M_MATRIX_AFFINE = 4,       ///< m[0][1] or m[1][0] is not 0: rotation or skew.
  M_MATRIX_PERSPECTIVE = 5,  ///< The last column is not (0, 0, 1).
};

/// *type = the first kind that fits, the most general first. Always 0.
int32_t M_GetMatrixType(const M_Matrix3* m, uint32_t* type);

/// dst := the inverse of src, by Gauss-Jordan elimination. M_ERR_NOT_INVERTIBLE, with *reportable
/// set, when the first or second pivot lies strictly between -1e-20 and 1e-20: dst is then the
/// identity or half-way, respectively. A third pivot in that band is no failure: the result is 0
/// and dst half-way. `reportable` may be null. Never reports.
int32_t M_InverseMatrixQuiet(const M_Matrix3* src, M_Matrix3* dst, bool* reportable);

/// As M_InverseMatrixQuiet, and reports a failure.
int32_t M_InverseMatrix(const M_Matrix3* src, M_Matrix3* dst);

// ---------------------------------------------------------------------------------------------
// 4x4 matrices: transforms of space
// ---------------------------------------------------------------------------------------------

/// *equal = whether all elements are equal; a NaN equals nothing. Always 0.
int32_t M_EqualMatrix4(const M_Matrix4* a, const M_Matrix4* b, bool* equal);

/// Always 0.
int32_t M_ZeroMatrix4(M_Matrix4* m);

/// Always 0.
int32_t M_IdentityMatrix4(M_Matrix4* m);

/// The change of basis whose first three columns are u, v and w: p x m = (p.u, p.v, p.w). Always 0.
int32_t M_SetMatrix4CoB(const M_Vector3T<double>* u, const M_Vector3T<double>* v,
                        const M_Vector3T<double>* w, M_Matrix4* m);

/// out := a x b, so a's transform acts first (the 3x3 call is the other way round). Always 0.
int32_t M_ConcatMatrix4(const M_Matrix4* a, const M_Matrix4* b, M_Matrix4* out);

/// Always 0.
int32_t M_TransposeMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// Expands along the first row. Always 0.
int32_t M_GetMatrix4Determinant(const M_Matrix4* m, double* det);

/// dst := the inverse of src: the adjugate divided by the determinant. M_ERR_NOT_INVERTIBLE, with
/// *reportable set, when |determinant| < 1e-16, whatever the scale of src: dst is then the
/// adjugate, not divided. `reportable` may be null. Never reports.
int32_t M_InverseMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable);

/// As M_InverseMatrix4Quiet, and reports a failure.
int32_t M_InverseMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// dst := the transposed inverse of src, which transforms normals. Fails as M_InverseMatrix4Quiet;
/// dst is then the transposed adjugate. Never reports.
int32_t M_CalcNormalMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable);

/// As M_CalcNormalMatrix4Quiet, but reports a failure, and dst is then the adjugate as it is.
int32_t M_CalcNormalMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// m := m x T, with T[3] = (tx, ty, tz, 1). Always 0.
int32_t M_TranslateMatrix4(M_Matrix4* m, double tx, double ty, double tz);

/// m := m x diag(sx, sy, sz, 1). Always 0.
int32_t M_ScaleMatrix4(M_Matrix4* m, double sx, double sy, double sz);

/// The 2D transform as one of space that leaves z alone; its last column is dropped. Always 0.
int32_t M_Matrix3ToMatrix4(const M_Matrix3* m3, M_Matrix4* m4);

/// As M_Matrix3ToMatrix4, but where m3 scales x and y alike z is scaled alike, too. Always 0.
int32_t M_Matrix3ToMatrix4Uniform(const M_Matrix3* m3, M_Matrix4* m4);

}  // extern "C"

#pragma GCC visibility pop

#include "M_CMatrixImpl.h"

#endif  // M_MATRIX_H
