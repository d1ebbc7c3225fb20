// 4x4 matrices split into translation, scale, shear and rotation.

#include <algorithm>
#include <cmath>

#include "M_Matrix.h"
#include "Mp_Decomp.h"
#include "Mp_Err.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"

namespace {

using Vector = M_Vector3T<double>;

constexpr double kPi = 3.141592653589793;
constexpr double kDegreesPerRadian = 57.29577951308232;

// Where the middle angle is this close to a quarter turn, the other two turn about the same axis.
bool IsGimbalLock(double cosine) { return -1e-5 < cosine && cosine < 1e-5; }

double ArcSine(double sine) { return std::asin(std::clamp(sine, -1.0, 1.0)); }

// Makes a row a unit vector, unless it is zero, and returns its length.
double TakeLength(Vector* row) {
  const double length = Mp::Length(*row);
  if (length > 0) *row = Mp::Scaled(*row, 1.0 / length);
  return length;
}

// Takes away what a row has in the direction of another one, and returns how much that was.
double TakeProjection(Vector* row, const Vector& direction) {
  const double projection = Mp::Dot(direction, *row);
  *row = Mp::Difference(*row, Mp::Scaled(direction, projection));
  return projection;
}

// The angles of the rotation x, then y, then z.
Vector AnglesXYZ(const Vector rows[3]) {
  const double y = ArcSine(rows[2].x);
  const double cosine = std::cos(y);
  if (IsGimbalLock(cosine)) return {0, y, std::atan2(rows[0].y, rows[1].y)};
  const double k = 1.0 / cosine;
  return {std::atan2(-rows[2].y * k, rows[2].z * k), y, std::atan2(-rows[1].x * k, rows[0].x * k)};
}

// The angles of the rotation z, then y, then x.
Vector AnglesZYX(const Vector rows[3]) {
  const double a = ArcSine(rows[0].z);
  const double cosine = std::cos(a);
  if (IsGimbalLock(cosine)) {
    if (-1e-5 < rows[2].y && rows[2].y < 1e-5) {
      return {0, -a, Mp::IsNearlyEqual(rows[1].y, -1) ? kPi : 0};
    }
    return {-std::atan2(rows[2].y, rows[1].y), -a, 0};
  }
  const double k = 1.0 / cosine;
  return {std::atan2(rows[1].z * k, rows[2].z * k), -a, std::atan2(rows[0].y * k, rows[0].x * k)};
}

bool IsHalfTurn(double degrees) { return Mp::IsNearZero(std::abs(degrees) - 180); }

}  // namespace

extern "C" {

int32_t Mp_DecomposeMatrix4(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed,
                            bool zyx) {
  const auto& a = m->m;
  const double w = a[3][3];
  *d = {};
  // Exactly: any perspective at all is too much.
  if (w == 0 || a[0][3] / w != 0 || a[1][3] / w != 0 || a[2][3] / w != 0) {
    if (!failed) return Mp_ReportErr(Mp_PLACE_MATRIX4, M_ERR_NOT_DECOMPOSABLE, 0);
    *failed = 1;
    return M_ERR_NOT_DECOMPOSABLE;
  }
  Vector rows[3];
  for (int i = 0; i < 3; ++i) rows[i] = {a[i][0] / w, a[i][1] / w, a[i][2] / w};
  d->translate = {a[3][0] / w, a[3][1] / w, a[3][2] / w};

  // Each row is made upright on those before it. A zero row stays as it is.
  d->scale.x = TakeLength(&rows[0]);
  d->shear.xy = TakeProjection(&rows[1], rows[0]);
  d->scale.y = TakeLength(&rows[1]);
  d->shear.xz = TakeProjection(&rows[2], rows[0]);
  d->shear.yz = TakeProjection(&rows[2], rows[1]);
  d->scale.z = TakeLength(&rows[2]);

  // A mirror is no rotation: the scales take it over.
  if (Mp::Dot(rows[2], Mp::Cross(rows[0], rows[1])) < 0) {
    d->scale = Mp::Negated(d->scale);
    for (Vector& row : rows) row = Mp::Negated(row);
  }
  d->rotate = zyx ? AnglesZYX(rows) : AnglesXYZ(rows);
  return 0;
}

int32_t M_DecomposeMatrix4(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed) {
  return Mp_DecomposeMatrix4(m, d, failed, false);
}

int32_t M_DecomposeMatrix4ZYX(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed) {
  return Mp_DecomposeMatrix4(m, d, failed, true);
}

int32_t M_GetOrderedXYZRotationFromMatrix(const M_Matrix4* m, double* rx, double* ry, double* rz) {
  M_Matrix4Decomp decomp;
  const int32_t code = Mp_DecomposeMatrix4(m, &decomp, nullptr, false);
  *rx = decomp.rotate.x;
  *ry = decomp.rotate.y;
  *rz = decomp.rotate.z;
  return code;
}

int32_t M_Correct3DDecompFor2D(M_Matrix4Decomp* d) {
  const bool isFlippedAboutX = IsHalfTurn(d->rotate.x * kDegreesPerRadian);
  const bool isFlippedAboutY = IsHalfTurn(d->rotate.y * kDegreesPerRadian);
  if (isFlippedAboutX) {
    d->scale.y = -d->scale.y;
    d->rotate = {0, -d->rotate.y, -d->rotate.z};
  }
  if (isFlippedAboutY) {
    d->scale.x = -d->scale.x;
    d->rotate = {-d->rotate.x, 0, -d->rotate.z};
  }
  d->scale.z = 1;
  return 0;
}

}  // extern "C"
