/// \file
/// M_Matrix.h: vectors, matrices, rotations, planes, lines, polygons and hulls.
///
/// Conventions: points are row vectors on the left, p' = p x M, so translation is in the last row,
/// the homogeneous column is the last, and in a product A x B the transform A acts first. Products
/// and sums are never fused. A value strictly between -1e-12 and 1e-12 counts as a zero length or
/// w. A function that can fail returns a 32-bit code, 0 for success, or, as a member, throws it as
/// an `int`. Pointers must not be null unless their comment says so; an output may be one of the
/// inputs of its type. Everything may be called from any thread.

// Contents
//   Vectors       M_Vector2T M_Vector3T M_Vector4T
//   Matrices      M_Matrix3 M_Matrix4
//   3x3 matrices  M_EqualMatrix M_EqualMatrixWithinEpsilon M_SetIdentityMatrix M_TranslateMatrix
//                 M_RotateMatrix M_ScaleMatrix M_ConcatMatrix M_GetMatrixType
//                 M_InverseMatrixQuiet M_InverseMatrix
//   4x4 matrices  M_EqualMatrix4 M_ZeroMatrix4 M_IdentityMatrix4 M_SetMatrix4CoB M_ConcatMatrix4
//                 M_TransposeMatrix4 M_GetMatrix4Determinant M_InverseMatrix4Quiet
//                 M_InverseMatrix4 M_CalcNormalMatrix4Quiet M_CalcNormalMatrix4
//                 M_TranslateMatrix4 M_ScaleMatrix4 M_Matrix3ToMatrix4 M_Matrix3ToMatrix4Uniform
//   Decomposition M_DecomposeMatrix4 M_DecomposeMatrix4ZYX M_GetOrderedXYZRotationFromMatrix
//                 M_Correct3DDecompFor2D
//   Rotations     M_RotateMatrix4 M_RotateMatrix4XYZ M_RotateMatrix4XYZPlus
//                 M_ConvertAxisAngleToOrderedXYZRotation M_LookAtMatrix
//   Quaternions   M_QuatToMatrix4 M_Matrix4ToQuat M_Slerp
//   Planes        M_GetPlaneEquation M_GetPlaneEquation2 M_RayIntersectPlane
//   Lines         M_PerpDistTo2DLine M_Clip3DLine M_ClipLine2Rect
//   Directions    M_ComputeDirectionalComponents M_VecToAngle M_Pt2Angle M_TransformPtF
//   Polygons      M_IsFloatPointInConcavePoly M_IsFloatPointInQuad M_SignedPolygonArea2D
//                 M_IsQuadEdgeOn M_PolyPolyClip2D
//   Screen        M_TransformPoly2D M_TransformPoly3D M_GetMinimumEdgeDistance
//                 M_TransformPoint2DtoScreen M_TransformPoint3DtoScreen
//   Hulls         M_IsConvex M_ComputeConvexHull

#ifndef M_MATRIX_H
#define M_MATRIX_H

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <utility>
#include <vector>

#include "M_Rect.h"
#include "M_Utils.h"
#include "U.h"
#include "qelcore/geom/PointT.h"

#pragma GCC visibility push(default)

// ---------------------------------------------------------------------------------------------
/// \defgroup vectors Vectors
/// \par Example
/// \include vectors.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// A point or vector in the plane.
template <class T>
struct M_Vector2T {
  T x;  ///< To the right.
  T y;  ///< Downwards, where nothing else is said.
};
static_assert(sizeof(M_Vector2T<double>) == 16 && offsetof(M_Vector2T<double>, y) == 8);

/// A point or vector in space, or a homogeneous point of the plane.
template <class T>
struct M_Vector3T {
  T x;  ///< To the right.
  T y;  ///< Downwards, where nothing else is said.
  T z;  ///< Away from the viewer.
};
static_assert(sizeof(M_Vector3T<double>) == 24 && offsetof(M_Vector3T<double>, y) == 8);
static_assert(offsetof(M_Vector3T<double>, z) == 16);

/// A homogeneous point of space, or a direction where w is 0.
template <class T>
struct M_Vector4T {
  T x;  ///< To the right.
  T y;  ///< Downwards, where nothing else is said.
  T z;  ///< Away from the viewer.
  T w;  ///< What the others are divided by.

  /// Scales x, y and z to unit length and keeps w. A w that is not 0 is reported, but no failure.
  /// Throws M_ERR_ZERO_VECTOR, after a report, when x^2 + y^2 + z^2 counts as zero; the vector is
  /// then untouched. For doubles only.
  void Normalize();
};
static_assert(sizeof(M_Vector4T<double>) == 32 && offsetof(M_Vector4T<double>, y) == 8);
static_assert(offsetof(M_Vector4T<double>, z) == 16 && offsetof(M_Vector4T<double>, w) == 24);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup matrices Matrices
/// \par Example
/// \include matrices.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Nine doubles, row by row: a transform of (x, y, 1) with the translation in m[2].
struct M_Matrix3 {
  double m[3][3];  ///< By row and column.

  /// *p := (p x M) / w', each component divided, with z then 1. Throws M_ERR_W_IS_ZERO, after a
  /// report, when w' counts as zero; p is then untouched.
  void TransformPointAndDivide(M_Vector3T<double>* p) const;

  /// The same for `count` points. The first that fails ends it: those before it are transformed, it
  /// and those behind it untouched.
  void TransformPointsAndDivide(int count, M_Vector3T<double>* pts) const;

  /// *p := (p x M) / w' without a look at w'; a w' of 0 gives infinities or NaNs.
  void TransformPointAndDivideFast(M_Vector3T<double>* p) const;

  /// The same for `count` points.
  void TransformPointsAndDivideFast(int count, M_Vector3T<double>* pts) const;

  /// Whether no |m[i][j]| > eps. A NaN passes.
  bool IsZeroWithinEpsilon(double eps) const;

  /// Whether no element differs from the identity's by more than eps. A NaN passes.
  bool IsIdentityWithinEpsilon(double eps) const;

  /// Swaps rows and columns.
  void Transpose();

  /// By the first row.
  double Determinant() const;

  /// Makes this its adjugate: M x adj(M) = det(M) I.
  void Adjoint();

  /// Adds element by element.
  M_Matrix3& operator+=(const M_Matrix3& other);

  /// Subtracts element by element.
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
  double m[4][4];  ///< By row and column.

  /// *p := (p x M) x (1 / w'), with w then 1. Throws M_ERR_W_IS_ZERO, after a report, when w'
  /// counts as zero; p is then untouched.
  void TransformPointAndDivide(M_Vector4T<double>* p) const;

  /// The same for `count` points. The first that fails ends it: those before it are transformed, it
  /// and those behind it untouched.
  void TransformPointsAndDivide(int count, M_Vector4T<double>* pts) const;

  /// *p := (p x M) x (1 / w') without a look at w'; a w' of 0 gives infinities or NaNs.
  void TransformPointAndDivideFast(M_Vector4T<double>* p) const;

  /// The same for `count` points.
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

  /// Swaps rows and columns.
  void Transpose();

  /// Adds element by element.
  M_Matrix4& operator+=(const M_Matrix4& other);

  /// Subtracts element by element.
  M_Matrix4& operator-=(const M_Matrix4& other);
};
static_assert(sizeof(M_Matrix4) == 128);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup comparison_within_a_tolerance Comparison within a tolerance
/// A NaN passes.
/// \par Example
/// \include comparison_within_a_tolerance.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Whether no two elements differ by more than eps.
bool M_EqualMatrixWithinEpsilon(const M_Matrix3& a, const M_Matrix3& b, double eps);
/// Whether no two elements differ by more than eps.
bool M_EqualMatrixWithinEpsilon(const M_Matrix4& a, const M_Matrix4& b, double eps);

extern "C" {

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup matrices_3x3 3x3 matrices
/// Transforms of the plane.
/// \par Example
/// \include matrices_3x3.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// *equal = whether all elements are equal; a NaN equals nothing. Always 0.
int32_t M_EqualMatrix(const M_Matrix3* a, const M_Matrix3* b, bool* equal);

/// m := the identity. Always 0.
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

/// What M_GetMatrixType() tells, by exact comparison.
enum : uint32_t {
  M_MATRIX_IDENTITY = 0,         ///< Moves nothing.
  M_MATRIX_TRANSLATE = 1,        ///< Only the last row moves points.
  M_MATRIX_SCALE = 2,            ///< Only the diagonal does.
  M_MATRIX_SCALE_TRANSLATE = 3,  ///< Both do.
  M_MATRIX_AFFINE = 4,           ///< m[0][1] or m[1][0] is not 0: rotation or skew.
  M_MATRIX_PERSPECTIVE = 5,      ///< The last column is not (0, 0, 1).
};

/// *type = the first kind that fits, the most general first. Always 0.
int32_t M_GetMatrixType(const M_Matrix3* m, uint32_t* type);

/// dst := the inverse of src, by Gauss-Jordan elimination. M_ERR_NOT_INVERTIBLE, with *reportable
/// set, when the first or second pivot lies strictly between -1e-20 and 1e-20: dst is then the
/// identity or half-way, respectively. A third pivot in that band is no failure: the result is 0
/// and dst half-way. `reportable` may be null. Never reports.
int32_t M_InverseMatrixQuiet(const M_Matrix3* src, M_Matrix3* dst, bool* reportable);

/// As M_InverseMatrixQuiet(), and reports a failure.
int32_t M_InverseMatrix(const M_Matrix3* src, M_Matrix3* dst);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup matrices_4x4 4x4 matrices
/// Transforms of space.
/// \par Example
/// \include matrices_4x4.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// *equal = whether all elements are equal; a NaN equals nothing. Always 0.
int32_t M_EqualMatrix4(const M_Matrix4* a, const M_Matrix4* b, bool* equal);

/// m := all zeros. Always 0.
int32_t M_ZeroMatrix4(M_Matrix4* m);

/// m := the identity. Always 0.
int32_t M_IdentityMatrix4(M_Matrix4* m);

/// The change of basis whose first three columns are u, v and w: p x m = (p.u, p.v, p.w). Always 0.
int32_t M_SetMatrix4CoB(const M_Vector3T<double>* u, const M_Vector3T<double>* v,
                        const M_Vector3T<double>* w, M_Matrix4* m);

/// out := a x b, so a's transform acts first (the 3x3 call is the other way round). Always 0.
int32_t M_ConcatMatrix4(const M_Matrix4* a, const M_Matrix4* b, M_Matrix4* out);

/// dst := src with rows and columns swapped. Always 0.
int32_t M_TransposeMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// *det = the determinant, expanded along the first row. Always 0.
int32_t M_GetMatrix4Determinant(const M_Matrix4* m, double* det);

/// dst := the inverse of src: the adjugate divided by the determinant. M_ERR_NOT_INVERTIBLE, with
/// *reportable set, when |determinant| < 1e-16, whatever the scale of src: dst is then the
/// adjugate, not divided. `reportable` may be null. Never reports.
int32_t M_InverseMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable);

/// As M_InverseMatrix4Quiet(), and reports a failure.
int32_t M_InverseMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// dst := the transposed inverse of src, which transforms normals. Fails as
/// M_InverseMatrix4Quiet(); dst is then the transposed adjugate. Never reports.
int32_t M_CalcNormalMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable);

/// As M_CalcNormalMatrix4Quiet(), but reports a failure, and dst is then the adjugate as it is.
int32_t M_CalcNormalMatrix4(const M_Matrix4* src, M_Matrix4* dst);

/// m := m x T, with T[3] = (tx, ty, tz, 1). Always 0.
int32_t M_TranslateMatrix4(M_Matrix4* m, double tx, double ty, double tz);

/// m := m x diag(sx, sy, sz, 1). Always 0.
int32_t M_ScaleMatrix4(M_Matrix4* m, double sx, double sy, double sz);

/// The 2D transform as one of space that leaves z alone; its last column is dropped. Always 0.
int32_t M_Matrix3ToMatrix4(const M_Matrix3* m3, M_Matrix4* m4);

/// As M_Matrix3ToMatrix4(), but where m3 scales x and y alike z is scaled alike, too. Always 0.
int32_t M_Matrix3ToMatrix4Uniform(const M_Matrix3* m3, M_Matrix4* m4);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup decomposition Decomposition
/// \par Example
/// \include decomposition.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// What was projected away, not divided by any scale.
struct M_Shear {
  double xy;  ///< Of row 1 on row 0.
  double xz;  ///< Of row 2 on row 0.
  double yz;  ///< Of row 2 on row 1.
};
static_assert(sizeof(M_Shear) == 24);

/// A matrix taken apart.
struct M_Matrix4Decomp {
  M_Vector3T<double> translate;  ///< The last row.
  M_Vector3T<double> scale;      ///< Lengths of the rows without shear; all negative for a mirror.
  M_Shear shear;                 ///< Of one row on another.
  M_Vector3T<double> rotate;     ///< Radians.
};
static_assert(sizeof(M_Matrix4Decomp) == 96 && offsetof(M_Matrix4Decomp, scale) == 24);
static_assert(offsetof(M_Matrix4Decomp, shear) == 48 && offsetof(M_Matrix4Decomp, rotate) == 72);

/// *d := m / m[3][3] as L x R x T: L = {{sx, 0, 0}, {xy, sy, 0}, {xz, yz, sz}} of scale and shear
/// (where the scales are negated for a mirror, L has the shears with the other sign), R = Rz x Ry x
/// Rx, which M_RotateMatrix4XYZ() makes of the angles, and the translation T.
/// M_ERR_NOT_DECOMPOSABLE, with all of *d zero, when m[3][3] is 0 or the rest of the last column,
/// divided by it, is not. `failed` may be null: then a failure is reported. Otherwise it is set to
/// 1 by a failure and left alone by a success. With a zero row there is no failure, but the angles
/// mean little.
int32_t M_DecomposeMatrix4(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed);

/// As M_DecomposeMatrix4(), but with the angles of R = Rx x Ry x Rz. (Where y is a quarter turn and
/// row 2 nearly without y, but not quite, R may be half a turn off.)
int32_t M_DecomposeMatrix4ZYX(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed);

/// The angles that M_DecomposeMatrix4() gives, in radians; zeros after a failure, which is
/// reported.
int32_t M_GetOrderedXYZRotationFromMatrix(const M_Matrix4* m, double* rx, double* ry, double* rz);

/// Turns half turns about x or y, which are flips of a layer in the plane, into a change of sign of
/// the scale, and makes the z scale 1. Always 0.
int32_t M_Correct3DDecompFor2D(M_Matrix4Decomp* d);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup rotations Rotations
/// Angles in radians; a positive one turns x towards y, y towards z and z towards x.
/// \par Example
/// \include rotations.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// m := m x R, the rotation about the axis (ax, ay, az), which need not be of unit length. An axis
/// whose length counts as zero is reported, leaves m untouched and returns 3, which is none of the
/// error codes.
int32_t M_RotateMatrix4(M_Matrix4* m, double ax, double ay, double az, double radians);

/// m := m x the rotation about x, then about y and z as they have been turned by then.
/// M_RotateMatrix4()'s code if it fails; m is then untouched.
int32_t M_RotateMatrix4XYZ(M_Matrix4* m, double rx, double ry, double rz);

/// From the identity, as M_RotateMatrix4XYZ(). Else about the directions of m's own axes, as m has
/// them at each step (divided by w where that is not 0), through the origin; an axis that m takes
/// to zero is left out. A failure's code is returned; m then holds the rotations made so far.
int32_t M_RotateMatrix4XYZPlus(bool fromIdentity, M_Matrix4* m, double rx, double ry, double rz);

/// The angles about x, y and z, as M_DecomposeMatrix4() has them, of a rotation about an axis.
/// Fails as M_RotateMatrix4(), with zeros.
int32_t M_ConvertAxisAngleToOrderedXYZRotation(double ax, double ay, double az, double radians,
                                               double* rx, double* ry, double* rz);

/// The orientation that looks from eye to target: rows sideways (up x forward), up (upright on the
/// other two) and forward, and no translation. It takes directions as the eye has them to those of
/// the world. What makes a camera takes points of the world to where the eye has them, which is the
/// other way: subtract the eye (M_TranslateMatrix4()), then concatenate the transposed orientation.
/// `up` becomes the eye's +y, which is downwards on a screen whose y runs downwards: an upright
/// camera there has (0, 1, 0).
///
/// With up along the line of sight, or zero, the identity turned about x to look along y, up or
/// down, whatever the line of sight; with eye at target, the identity. Only lengths of exactly 0
/// are looked for: close to that, the directions sideways and up are what rounding leaves of them.
M_Matrix4 M_LookAtMatrix(const M_Vector3T<double>& eye, const M_Vector3T<double>& target,
                         const M_Vector3T<double>& up);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup quaternions Quaternions
/// Four doubles x, y, z, w. All functions return 0. Outputs may be inputs.
/// \par Example
/// \include quaternions.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// The rotation of a unit quaternion; of another one, scaled by its squared length.
int32_t M_QuatToMatrix4(const double* q, M_Matrix4* m);

/// The quaternion of a rotation; the last row and column are not looked at.
int32_t M_Matrix4ToQuat(const M_Matrix4* m, double* q);

/// From the unit quaternion q0 (t = 0) to q1 (t = 1) the shorter way round, at a constant speed;
/// along the chord where |q0 . q1| is within 1e-5 of 1 (or above), and q0 where they are equal.
int32_t M_Slerp(const double* q0, const double* q1, double* out, double t);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup planes_and_rays Planes and rays
/// \par Example
/// \include planes_and_rays.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// The plane a x + b y + c z + d = 0.
struct M_PlaneEq {
  double a;  ///< The normal's x.
  double b;  ///< The normal's y.
  double c;  ///< The normal's z.
  double d;  ///< The constant.
};
static_assert(sizeof(M_PlaneEq) == 32 && offsetof(M_PlaneEq, d) == 24);

/// From a point in a direction.
struct M_Ray {
  M_Vector4T<double> origin;     ///< A w is not looked at.
  M_Vector4T<double> direction;  ///< Of any length; a w is not looked at.
};
static_assert(sizeof(M_Ray) == 64 && offsetof(M_Ray, direction) == 32);

/// The plane of a polygon (Newell's method) through the mean of its points, which `centroid`
/// receives unless it is null. The normal points to where the polygon is seen counter-clockwise. It
/// has unit length, unless twice the area is at most 1e-12: then it is that long. Of no points the
/// mean and d are NaNs; a negative count gives zeros. Always 0.
int32_t M_GetPlaneEquation(const M_Vector3T<double>* points, int32_t count, M_PlaneEq* plane,
                           M_Vector3T<double>* centroid);

/// The plane through a point with a normal, which is kept as it is. Always 0.
int32_t M_GetPlaneEquation2(const M_Vector3T<double>* point, const M_Vector3T<double>* normal,
                            M_PlaneEq* plane);

/// Where the ray's line meets the plane; with `forwardOnly` (of which the low byte counts) only in
/// front of the origin. *hit is the point also where that is not the case, and the origin for a
/// parallel ray. `behind` and `ok` may be null; they receive whether the point lies behind the
/// origin and whether there is an intersection. Without `ok`, none is reported and returned as
/// M_ERR_NO_PLANE_INTERSECTION.
int32_t M_RayIntersectPlane(const M_PlaneEq* plane, int32_t forwardOnly, const M_Ray* ray,
                            M_Vector3T<double>* hit, unsigned char* behind, unsigned char* ok);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup lines Lines
/// \par Example
/// \include lines.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// *distance = that of the point from the line through a and b. `onSegment` may be null; it
/// receives 1 when the foot does not lie before a and the point is no farther from a than b is,
/// else 0. Where a and b are at most 1e-12 or more than 1e12 apart, the distance is that from a and
/// onSegment 0. Always 0.
int32_t M_PerpDistTo2DLine(const M_Vector2T<double>* point, const M_Vector2T<double>* a,
                           const M_Vector2T<double>* b, unsigned char* onSegment, double* distance);

/// Tells which ends lie before the near plane, z < 0.1. If one of them does, *crossing is where the
/// line meets the plane, else (0, 0, 0). Both flags may be the same. Always 0.
int32_t M_Clip3DLine(const M_Vector3T<double>* p0, const M_Vector3T<double>* p1,
                     unsigned char* p0Clipped, unsigned char* p1Clipped,
                     M_Vector3T<double>* crossing);

/// Clips the line to the rectangle. *visible = whether something is left. A line with both ends
/// inside, edges included, is; otherwise one whose extent only touches the rectangle's is not, and
/// neither is one along x or y; one that passes a corner is, as a point. The points may have been
/// moved also where nothing is left. Always 0.
int32_t M_ClipLine2Rect(const M_FloatRect* rect, M_Vector2T<double>* p0, M_Vector2T<double>* p1,
                        unsigned char* visible);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup directions Directions
/// Bearings are in degrees where y runs downwards: 90 right, 180 down, 270 left, 360 straight up.
/// \par Example
/// \include directions.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// What a matrix makes of the directions x and y.
struct M_DirectionalComponents {
  M_Vector2T<double> x;  ///< The image of (1, 0).
  M_Vector2T<double> y;  ///< The image of (0, 1).
};
static_assert(sizeof(M_DirectionalComponents) == 32);

/// What m makes of the directions x and y; translation does not matter.
M_DirectionalComponents M_ComputeDirectionalComponents(const M_Matrix3& m);

/// The bearing of a vector; 90 for the zero vector.
double M_VecToAngle(const M_Vector2T<double>& v);

/// *angle = the bearing of a point from the centre of a rectangle. Always 0.
int32_t M_Pt2Angle(const M_FloatRect* rect, const M_Vector2T<double>* point, double* angle);

/// Rotates a point about a centre, from x towards y. `angle` in degrees. Always 0.
int32_t M_TransformPtF(const M_Vector2T<float>* centre, double angle, M_Vector2T<float>* point);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup polygons_in_the_plane Polygons in the plane
/// The last point joins the first; they may be concave and run either way round.
/// \par Example
/// \include polygons_in_the_plane.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// As M_IsFloatPointInConcavePoly() for four points and no tolerance.
int32_t M_IsFloatPointInQuad(const M_Vector2T<double>* point, const M_Vector2T<double>* quad,
                             unsigned char* inside);

/// Positive where the points run counter-clockwise with y upwards; 0 for fewer than three.
double M_SignedPolygonArea2D(const M_Vector2T<double>* poly, int32_t count);

/// *isEdgeOn = whether the plane of the four transformed corners is seen from the side: the cosine
/// between its normal and the line of sight is strictly within the tolerance. The line of sight is
/// the z axis, or leads from the origin to the middle of the corners. 0 where there is no normal or
/// no line. Always returns 0.
int32_t M_IsQuadEdgeOn(const M_Matrix4* matrix, const M_Vector3T<double>* corners,
                       unsigned char useZAxis, unsigned char* isEdgeOn, double tolerance);

/// *result = the part of the subject inside the clipper, which must be convex and may run either
/// way round. Points within 1e-6 of a side, in the measure of its cross product, count as outside.
/// z and w of a new point lie between those of its neighbours. An empty clipper clips nothing;
/// fewer than three points of a subject are nothing.
///
/// Nothing has an inside where a side has no length: a clipper with a repeated point, or one that
/// closes with its first, gives an empty result. So does one that runs clockwise with y upwards and
/// is so small (some 1e-3 across) that the same measure of its first side and its centre is within
/// 1e-6: it is turned round although it ran the right way.
///
/// The result may be one of the others; it is what it was if an allocation fails, which throws.
void M_PolyPolyClip2D(const std::vector<M_Vector4T<double>>* clipper,
                      const std::vector<M_Vector4T<double>>* subject,
                      std::vector<M_Vector4T<double>>* result);

}  // extern "C"

/// *inside = whether the point lies in the polygon, for points of double and of float:
///
/// | point | *inside |
/// |---|---|
/// | inside | 1 |
/// | nearly on an edge that is not upright | 1 |
/// | on an upright edge, on the side of larger x | 1 |
/// | on an upright edge, on the side of smaller x | 0 |
///
/// An edge's end at the smaller x is not part of it: a corner from which both edges lead to larger
/// x is decided by the other edges, and 0 where it sticks out.
///
/// With a tolerance (its sign does not matter) also what lies that close to a corner, or to an edge
/// in the sense of M_PerpDistTo2DLine(). A polygon whose points are all the same is that point. A
/// count below 1 gives 0. Returns 0, or what the host answers to an exception when there is no
/// memory for more than 64 points, with *inside 0. Points of any other type are refused when this
/// is compiled.
template <class Point>
int32_t M_IsFloatPointInConcavePoly(const Point* point, const Point* poly, int32_t count,
                                    double tolerance, unsigned char* inside);
/// The same for pointers that convert to those above.
template <class Point, class Poly>
int32_t M_IsFloatPointInConcavePoly(Point point, Poly poly, int32_t count, double tolerance,
                                    unsigned char* inside);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup quads_on_the_screen Quads on the screen
/// What they call throws its error code as an `int`.
/// \par Example
/// \include quads_on_the_screen.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// A quad on the screen. Edge i leads from corner i to the next.
class M_TransformPoly2D {
 public:
  M_TransformPoly2D();           ///< Visible; the corners are left unset.
  virtual ~M_TransformPoly2D();  ///< Virtual, for what is derived from it.

  /// As M_IsFloatPointInConcavePoly(); false for a quad that is not visible.
  bool IsPointInside(const M_Vector2T<double>* point, double tolerance) const;

  /// M_GetMinimumEdgeDistance() of this quad, be it visible or not.
  double GetMinimumEdgeDistance(const M_Vector2T<double>* point) const;

  M_Vector2T<double> points[4];  ///< The corners, in order.
  bool visible;                  ///< Set by the client.
};

/// A quad in space on its way to the screen. Fill in `points`; then TransformPointsToEye(),
/// TransformPointsToScreen(), and InitPolyPoints() before the outline is used. A first or second
/// row of a matrix that is zero (a squared length within 1e-12 of it) changes nothing but the
/// clipped flags, which are cleared.
class M_TransformPoly3D {
 public:
  M_TransformPoly3D();           ///< Nothing clipped, no outline; the corners are left unset.
  virtual ~M_TransformPoly3D();  ///< Gives the outline back to the host.

  /// Takes the corners to where the eye sees them.
  void TransformPointsToEye(const M_Matrix4& toEye);

  /// Clips the edges to the near plane, z >= 0.1, and takes corners and crossings to the screen.
  void TransformPointsToScreen(const M_Matrix4& toScreen);

  /// Clips one edge, as it stands. The outline is left alone.
  void ClipEdgeToScreen(int edge);

  /// Drops the outline.
  void InvalidatePolyPoints();

  /// Makes the outline of what is visible, unless there is one.
  void InitPolyPoints() const;

  bool IsVisible() const;  ///< Not all corners are clipped.

  /// *out = a corner; false, with *out untouched, for one that is clipped.
  bool GetPoint(int corner, M_Vector2T<double>* out) const;

  /// *out = the part of an edge that is not clipped; false, with *out untouched, where none is.
  bool GetEdge(int edge, std::pair<M_Vector2T<double>, M_Vector2T<double>>* out) const;

  /// How many points the outline has, as it is.
  int NumPolyPoints() const;

  /// *out = a point of the outline as it is. The index is not checked.
  void GetPolyPoint(int index, M_Vector2T<double>* out) const;

  /// As M_IsFloatPointInConcavePoly() for the outline as it is; false where there is none, and
  /// while all four corners are clipped, whatever the outline.
  bool IsPointInside(const M_Vector2T<double>* point, double tolerance) const;

  /// M_GetMinimumEdgeDistance() of this quad: by its corners and flags, not by its outline.
  double GetMinimumEdgeDistance(const M_Vector2T<double>* point) const;

  M_Vector3T<double> points[4];      ///< In the world, then as the eye sees them, then on screen.
  M_Vector3T<double> clipPoints[4];  ///< Where edges cross the near plane.
  unsigned char clipped[4];          ///< Corners before the near plane.
  /// The outline of what is visible, or nothing.
  mutable std::vector<M_Vector2T<double>, U_Allocator<M_Vector2T<double>>> polyPoints;
  mutable bool polyPointsValid;  ///< polyPoints is the outline. It is empty where it is not.
};

/// The distance of a point from the nearest visible edge of a M_TransformPoly2D, all of whose edges
/// are, or a M_TransformPoly3D, or of what is derived from them; -1 where there is none. It is
/// that of M_PerpDistTo2DLine() where that says the point is beside the edge, else that from the
/// nearer end.
template <class Poly>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const Poly& poly);

extern "C" {
/// Through `first`, then `second`; the third columns are not used. Always true.
bool M_TransformPoint2DtoScreen(const M_Matrix3& first, const M_Matrix3& second,
                                M_Vector2T<double>* point);
}

/// Through toEye, projection and toScreen, divided by w after the first and the last. False, with
/// the point unchanged, when the eye sees it before the near plane. Throws M_ERR_W_IS_ZERO, after a
/// report, where a w counts as zero.
bool M_TransformPoint3DtoScreen(const M_Matrix4& toEye, const M_Matrix4& projection,
                                const M_Matrix3& toScreen, M_Vector3T<double>* point);

/// The same for a point with z = 0.
bool M_TransformPoint3DtoScreen(const M_Matrix4& toEye, const M_Matrix4& projection,
                                const M_Matrix3& toScreen, M_Vector2T<double>* point);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup hulls_and_convexity Hulls and convexity
/// By x and y. The ranges are given by iterators of a std::vector, or pointers, of M_Vector2T,
/// M_Vector3T or M_Vector4T of double, and for hulls of `qelcore::geom::PointT<float>`. Both ends
/// may be const or not; anything else is refused when it is compiled.
/// \par Example
/// \include hulls_and_convexity.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// A point on the lattice of hulls: from 0 to 2^29 in each direction, or up to half as much again
/// where the steps are the smallest numbers there are.
struct M_LongPoint {
  int32_t x;  ///< Steps from the least x.
  int32_t y;  ///< Steps from the least y.
};
static_assert(sizeof(M_LongPoint) == 8 && offsetof(M_LongPoint, y) == 4);

/// Whether the polygon turns the same way everywhere; true for fewer than three points, and for
/// points on a line. Turns within the rounding of doubles are not counted, and going round twice is
/// not noticed: a pentagram is convex.
template <class Iterator>
bool M_IsConvex(Iterator first, Iterator last);
/// The same for ends of which one is const.
template <class First, class Last>
bool M_IsConvex(First first, Last last);

/// out = the corners of the hull, from the lowest (then leftmost) counter-clockwise with y upwards.
/// The points are first moved to the nearest of 2^29 steps along each axis of their bounding box,
/// and the corners are where they were moved to; other components are 0. Up to three points are
/// copied as they are. Points on one line give the lowest, the farthest from it and the next
/// farthest. A NaN counts as the least coordinate of its axis; where an axis has no finite extent,
/// the corners' coordinates on it are no finite numbers. `out` may hold the points.
template <class Iterator>
void M_ComputeConvexHull(Iterator first, Iterator last,
                         std::vector<typename std::iterator_traits<Iterator>::value_type>& out);
/// The same for ends of which one is const.
template <class First, class Last, class Out>
void M_ComputeConvexHull(First first, Last last, Out& out);

/// \}

#pragma GCC visibility pop

#include "M_CMatrixImpl.h"

#endif  // M_MATRIX_H
