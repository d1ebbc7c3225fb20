// Rotations, look-at, quaternions and their interpolation.

#include <cmath>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Err.h"
#include "Mp_Matrix.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"
#include "U.h"

namespace {

constexpr double kQuarterTurn = 1.5707963267948966;

// Kept on purpose: not one of the library's error codes.
constexpr int32_t kZeroAxis = 3;

// Makes it a unit vector, unless its length, which is returned, is 0.
double Normalize(M_Vector3T<double>* v) {
  const double length = Mp::Length(*v);
  if (length != 0) *v = Mp::Scaled(*v, 1.0 / length);
  return length;
}

struct Quaternion {
  double x, y, z, w;

  explicit Quaternion(const double* q) : x(q[0]), y(q[1]), z(q[2]), w(q[3]) {}
};

}  // namespace

extern "C" {

int32_t M_RotateMatrix4(M_Matrix4* m, double ax, double ay, double az, double radians) {
  const double length = std::sqrt(az * az + ay * ay + ax * ax);
  if (Mp::IsNearZero(length)) {
    Up_ReportErrString(Mp_ID_ROTATE_MATRIX4, Mp_SEVERITY_ERROR,
                       Mp::Text(Mp_STR_NO_ROTATION_MATRIX));
    return kZeroAxis;
  }
  const double r = 1.0 / length;
  const double x = ax * r;
  const double y = ay * r;
  const double z = az * r;
  const double c = std::cos(radians);
  const double s = std::sin(radians);
  const double t = 1 - c;
  const M_Matrix4 rotation = {{{c + t * x * x, t * x * y + s * z, t * x * z - s * y, 0},
                               {t * x * y - s * z, c + t * y * y, t * y * z + s * x, 0},
                               {t * x * z + s * y, t * y * z - s * x, c + t * z * z, 0},
                               {0, 0, 0, 1}}};
  *m = Mp::Product(*m, rotation);
  return 0;
}

int32_t M_RotateMatrix4XYZPlus(bool fromIdentity, M_Matrix4* m, double rx, double ry, double rz) {
  M_Matrix4 rotated = fromIdentity ? Mp::kIdentity4 : *m;
  const double angles[3] = {rx, ry, rz};
  M_Vector4T<double> axes[3] = {{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}};
  int32_t code = 0;
  for (int i = 0; i < 3 && code == 0; ++i) {
    // The axis as the rotations so far have turned it.
    M_Vector4T<double>& axis = axes[i];
    M_TransformVector4(&rotated, 1, &axis);
    if (Mp::IsNearZero(axis.x) && Mp::IsNearZero(axis.y) && Mp::IsNearZero(axis.z)) continue;
    code = M_RotateMatrix4(&rotated, axis.x, axis.y, axis.z, angles[i]);
  }
  if (!fromIdentity) {
    // Also after a failure: the rotations made so far stay.
    *m = rotated;
  } else if (code == 0) {
    *m = Mp::Product(*m, rotated);
  }
  return code;
}

int32_t M_RotateMatrix4XYZ(M_Matrix4* m, double rx, double ry, double rz) {
  return M_RotateMatrix4XYZPlus(true, m, rx, ry, rz);
}

int32_t M_ConvertAxisAngleToOrderedXYZRotation(double ax, double ay, double az, double radians,
                                               double* rx, double* ry, double* rz) {
  *rx = *ry = *rz = 0;
  M_Matrix4 rotation = Mp::kIdentity4;
  if (const int32_t code = M_RotateMatrix4(&rotation, ax, ay, az, radians)) return code;
  return M_GetOrderedXYZRotationFromMatrix(&rotation, rx, ry, rz);
}

M_Matrix4 M_LookAtMatrix(const M_Vector3T<double>& eye, const M_Vector3T<double>& target,
                         const M_Vector3T<double>& up) {
  static constexpr M_Vector3T<double> S_axis = {1, 0, 0};
  M_Vector3T<double> f = Mp::Difference(target, eye);
  const double distance = Mp::Length(f);
  // Divided, where s and u are multiplied by the reciprocal: the last bits may differ.
  if (distance != 0) f = Mp::Divided(f, distance);
  M_Vector3T<double> s = Mp::Cross(up, f);
  M_Vector3T<double> u = Mp::Cross(f, s);
  const double lengthOfS = Normalize(&s);
  const double lengthOfU = Normalize(&u);
  if (lengthOfS == 0 && lengthOfU == 0) {
    // Straight up or down, or nowhere at all.
    M_Matrix4 m = Mp::kIdentity4;
    if (distance == 0) return m;
    const double angle = f.y >= 0 ? -kQuarterTurn : kQuarterTurn;
    if (const int32_t code = M_RotateMatrix4(&m, S_axis.x, S_axis.y, S_axis.z, angle)) {
      throw int{code};
    }
    return m;
  }
  return {{{s.x, s.y, s.z, 0}, {u.x, u.y, u.z, 0}, {f.x, f.y, f.z, 0}, {0, 0, 0, 1}}};
}

int32_t M_QuatToMatrix4(const double* q, M_Matrix4* m) {
  const Quaternion p(q);
  const double xx = p.x * p.x;
  const double yy = p.y * p.y;
  const double zz = p.z * p.z;
  const double ww = p.w * p.w;
  const double xy = p.x * p.y;
  const double xz = p.x * p.z;
  const double yz = p.y * p.z;
  const double xw = p.x * p.w;
  const double yw = p.y * p.w;
  const double zw = p.z * p.w;
  *m = {{{xx - yy - zz + ww, 2 * (xy + zw), 2 * (xz - yw), 0},
         {2 * (xy - zw), yy - xx - zz + ww, 2 * (yz + xw), 0},
         {2 * (xz + yw), 2 * (yz - xw), -xx - yy + zz + ww, 0},
         {0, 0, 0, 1}}};
  return 0;
}

int32_t M_Matrix4ToQuat(const M_Matrix4* m, double* q) {
  const auto& a = m->m;
  const double trace = a[0][0] + a[1][1] + a[2][2];
  if (trace > 0) {
    const double r = std::sqrt(trace + 1);
    const double k = 0.5 / r;
    const double x = (a[1][2] - a[2][1]) * k;
    const double y = (a[2][0] - a[0][2]) * k;
    const double z = (a[0][1] - a[1][0]) * k;
    q[0] = x;
    q[1] = y;
    q[2] = z;
    q[3] = r / 2;
    return 0;
  }
  // From the largest of x, y and z, which is far from 0.
  int i = a[1][1] > a[0][0] ? 1 : 0;
  if (a[2][2] > a[i][i]) i = 2;
  const int j = (i + 1) % 3;
  const int k = (j + 1) % 3;
  const double r = std::sqrt(a[i][i] - (a[j][j] + a[k][k]) + 1);
  const double h = 0.5 / r;
  const double w = (a[j][k] - a[k][j]) * h;
  const double qj = (a[i][j] + a[j][i]) * h;
  const double qk = (a[i][k] + a[k][i]) * h;
  q[i] = r / 2;
  q[j] = qj;
  q[k] = qk;
  q[3] = w;
  return 0;
}

int32_t M_Slerp(const double* q0, const double* q1, double* out, double t) {
  const Quaternion p(q0);
  const Quaternion q(q1);
  if (Mp::IsNearlyEqual(p.x, q.x) && Mp::IsNearlyEqual(p.y, q.y) && Mp::IsNearlyEqual(p.z, q.z) &&
      Mp::IsNearlyEqual(p.w, q.w)) {
    out[0] = p.x;
    out[1] = p.y;
    out[2] = p.z;
    out[3] = p.w;
    return 0;
  }
  const double dot = p.x * q.x + p.y * q.y + p.z * q.z + p.w * q.w;
  const double cosine = std::abs(dot);
  double a;
  double b;
  if (1 - cosine > 1e-5) {
    const double angle = std::acos(cosine);
    const double k = 1.0 / std::sin(angle);
    a = std::sin((1 - t) * angle) * k;
    b = std::sin(t * angle) * k;
  } else {
    // Nearly parallel: along the chord.
    a = 1 - t;
    b = t;
  }
  // The shorter way round.
  if (dot < 0) b = -b;
  out[0] = a * p.x + b * q.x;
  out[1] = a * p.y + b * q.y;
  out[2] = a * p.z + b * q.z;
  out[3] = a * p.w + b * q.w;
  return 0;
}

}  // extern "C"
