// Imath, glm and Eigen at work. Peers that are not installed are left out.

#include "Peers.h"

#include <cstdint>
#include <cstring>

#ifdef BENCH_HAS_IMATH
#include <ImathBox.h>
#include <ImathMatrix.h>
#include <ImathMatrixAlgo.h>
#include <ImathQuat.h>
#include <ImathVec.h>
#endif
#ifdef BENCH_HAS_GLM
#define GLM_ENABLE_EXPERIMENTAL
#include <glm/glm.hpp>
#include <glm/gtc/matrix_transform.hpp>
#include <glm/gtc/quaternion.hpp>
#include <glm/gtx/matrix_decompose.hpp>
#endif
#ifdef BENCH_HAS_EIGEN
#include <Eigen/Geometry>
#endif

namespace {

using bench::Peers;

// Rounds, for values in the 16-bit range.
int16_t Round(double d) { return static_cast<int16_t>(static_cast<int32_t>(d + 32768.5) - 32768); }

int32_t RoundLong(double d) {
  return static_cast<int32_t>(static_cast<int64_t>(d + 2147483648.5) - 2147483648);
}

// In place, a point at a time, in groups.
template <class Point, class Work>
bool ForEach(int groups, int count, void* points, Work work) {
  Point* p = static_cast<Point*>(points);
  for (int g = 0; g < groups; ++g) {
    for (int i = 0; i < count; ++i, ++p) {
      if (!work(*p)) return false;
    }
  }
  return true;
}

// Short and 16.16 points by a function that transforms a pair of doubles.
template <class Transform>
bool TransformShort(int groups, int count, void* points, Transform transform) {
  return ForEach<M_Point>(groups, count, points, [&](M_Point& p) {
    const auto [x, y] = transform(p.h, p.v);
    if (!(x > -32768 && x < 32767 && y > -32768 && y < 32767)) return false;
    p = {Round(y), Round(x)};
    return true;
  });
}

template <class Transform>
bool TransformFixed(int groups, int count, void* points, Transform transform) {
  return ForEach<M_FixedPoint>(groups, count, points, [&](M_FixedPoint& p) {
    const auto [x, y] = transform(p.h, p.v);
    if (!(x > -2147483648.0 && x < 2147483647.0 && y > -2147483648.0 && y < 2147483647.0))
      return false;
    p = {RoundLong(x), RoundLong(y)};
    return true;
  });
}

struct Pair {
  double x, y;
};

struct Parts {
  double values[12];
};

// A matrix that something is appended to, and that no compiler knows.
template <class Matrix>
const Matrix kTurned = [] {
  const double volatile elements[16] = {0.6, 0.8, 0, 0, -0.8, 0.6, 0, 0, 0, 0, 1, 0, 1, 2, 3, 1};
  double copy[16];
  for (int i = 0; i < 16; ++i) copy[i] = elements[i];
  Matrix m;
  std::memcpy(&m, copy, sizeof m);
  return m;
}();

// One operation on arrays of M's records, through a peer's types of the same bytes.
template <class A, class Out, class Work>
void ForAll(int count, const void* a, const void* b, void* out, Work work) {
  const A* const as = static_cast<const A*>(a);
  const A* const bs = static_cast<const A*>(b);
  Out* const outs = static_cast<Out*>(out);
  for (int i = 0; i < count; ++i) outs[i] = work(as[i], bs[i]);
}

#ifdef BENCH_HAS_IMATH
void AddImath(Peers& peers) {
  using namespace Imath;
  const auto add = [&](const char* what, auto run) {
    peers.transforms.push_back({what, "Imath", run});
  };
  add("2D points", [](const void* matrix, int groups, int count, void* points) {
    const M33d m = *static_cast<const M33d*>(matrix);
    return ForEach<V2d>(groups, count, points, [&](V2d& p) {
      m.multVecMatrix(p, p);
      return true;
    });
  });
  add("vectors of 3", [](const void* matrix, int groups, int count, void* points) {
    const M33d m = *static_cast<const M33d*>(matrix);
    return ForEach<V3d>(groups, count, points, [&](V3d& p) {
      p = p * m;
      return true;
    });
  });
  add("3D points", [](const void* matrix, int groups, int count, void* points) {
    const M44d m = *static_cast<const M44d*>(matrix);
    return ForEach<V3d>(groups, count, points, [&](V3d& p) {
      m.multVecMatrix(p, p);
      return true;
    });
  });
  add("4-vectors", [](const void* matrix, int groups, int count, void* points) {
    const M44d m = *static_cast<const M44d*>(matrix);
    return ForEach<V4d>(groups, count, points, [&](V4d& p) {
      p = p * m;
      return true;
    });
  });
  add("4-vectors, divided", [](const void* matrix, int groups, int count, void* points) {
    const M44d m = *static_cast<const M44d*>(matrix);
    return ForEach<V4d>(groups, count, points, [&](V4d& p) {
      p = p * m;
      p /= p.w;
      return true;
    });
  });
  add("short points", [](const void* matrix, int groups, int count, void* points) {
    const M33d m = *static_cast<const M33d*>(matrix);
    return TransformShort(groups, count, points, [&](double x, double y) {
      const V2d p = V2d(x, y) * m;
      return Pair{p.x, p.y};
    });
  });
  add("16.16 points", [](const void* matrix, int groups, int count, void* points) {
    const M33d m = *static_cast<const M33d*>(matrix);
    return TransformFixed(groups, count, points, [&](double x, double y) {
      const V2d p = V2d(x / 65536.0, y / 65536.0) * m;
      return Pair{p.x * 65536.0, p.y * 65536.0};
    });
  });
  const auto operation = [&](const char* what, auto run) {
    peers.operations.push_back({what, "Imath", run});
  };
  operation("4x4 concat", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, M44d>(count, a, b, out, [](const M44d& p, const M44d& q) { return p * q; });
  });
  operation("4x4 inverse", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, M44d>(count, a, b, out, [](const M44d& p, const M44d&) { return p.inverse(); });
  });
  operation("4x4 determinant", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, double>(count, a, b, out,
                         [](const M44d& p, const M44d&) { return p.determinant(); });
  });
  operation("4x4 transpose", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, M44d>(count, a, b, out, [](const M44d& p, const M44d&) { return p.transposed(); });
  });
  operation("3x3 concat", [](int count, const void* a, const void* b, void* out) {
    ForAll<M33d, M33d>(count, a, b, out, [](const M33d& p, const M33d& q) { return q * p; });
  });
  operation("3x3 inverse", [](int count, const void* a, const void* b, void* out) {
    ForAll<M33d, M33d>(count, a, b, out, [](const M33d& p, const M33d&) { return p.inverse(); });
  });
  operation("3x3 inverse", [](int count, const void* a, const void* b, void* out) {
    ForAll<M33d, M33d>(count, a, b, out, [](const M33d& p, const M33d&) { return p.gjInverse(); });
  });
  peers.operations.back().peer = "Imath Gauss-Jordan";
  operation("axis-angle", [](int count, const void* a, const void* b, void* out) {
    ForAll<V4d, M44d>(count, a, b, out, [](const V4d& p, const V4d&) {
      M44d m;
      m.setAxisAngle(V3d(p.x, p.y, p.z), p.w);
      return kTurned<M44d> * m;
    });
  });
  operation("decomposition", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, Parts>(count, a, b, out, [](const M44d& m, const M44d&) {
      V3d s, h, r, t;
      extractSHRT(m, s, h, r, t, false);
      return Parts{t.x, t.y, t.z, s.x, s.y, s.z, h.x, h.y, h.z, r.x, r.y, r.z};
    });
  });
  operation("quaternion to matrix", [](int count, const void* a, const void* b, void* out) {
    ForAll<V4d, M44d>(count, a, b, out, [](const V4d& q, const V4d&) {
      return Quatd(q.w, q.x, q.y, q.z).toMatrix44();
    });
  });
  operation("matrix to quaternion", [](int count, const void* a, const void* b, void* out) {
    ForAll<M44d, V4d>(count, a, b, out, [](const M44d& m, const M44d&) {
      const Quatd q = extractQuat(m);
      return V4d(q.v.x, q.v.y, q.v.z, q.r);
    });
  });
  operation("slerp", [](int count, const void* a, const void* b, void* out) {
    ForAll<V4d, V4d>(count, a, b, out, [](const V4d& p, const V4d& q) {
      const Quatd r = slerpShortestArc(Quatd(p.w, p.x, p.y, p.z), Quatd(q.w, q.x, q.y, q.z), 0.3);
      return V4d(r.v.x, r.v.y, r.v.z, r.r);
    });
  });
  operation("long union", [](int count, const void* a, const void* b, void* out) {
    ForAll<Box2i, Box2i>(count, a, b, out, [](Box2i p, const Box2i& q) {
      p.extendBy(q);
      return p;
    });
  });
}
#endif

#ifdef BENCH_HAS_GLM
// glm's columns lie one behind the other, as M's rows do: its M v is M's v M.
void AddGlm(Peers& peers) {
  using namespace glm;
  const auto add = [&](const char* what, auto run) {
    peers.transforms.push_back({what, "glm", run});
  };
  // Three columns of two: affine.
  struct Affine {
    explicit Affine(const void* matrix) {
      const auto& a = static_cast<const M_Matrix3*>(matrix)->m;
      m = dmat3x2(a[0][0], a[0][1], a[1][0], a[1][1], a[2][0], a[2][1]);
    }
    dmat3x2 m;
  };
  add("2D points", [](const void* matrix, int groups, int count, void* points) {
    const Affine affine(matrix);
    return ForEach<dvec2>(groups, count, points, [&](dvec2& p) {
      p = affine.m * dvec3(p, 1);
      return true;
    });
  });
  add("vectors of 3", [](const void* matrix, int groups, int count, void* points) {
    const dmat3 m = *static_cast<const dmat3*>(matrix);
    return ForEach<dvec3>(groups, count, points, [&](dvec3& p) {
      p = m * p;
      return true;
    });
  });
  add("3D points", [](const void* matrix, int groups, int count, void* points) {
    const dmat4 m = *static_cast<const dmat4*>(matrix);
    return ForEach<dvec3>(groups, count, points, [&](dvec3& p) {
      const dvec4 q = m * dvec4(p, 1);
      p = dvec3(q) / q.w;
      return true;
    });
  });
  add("4-vectors", [](const void* matrix, int groups, int count, void* points) {
    const dmat4 m = *static_cast<const dmat4*>(matrix);
    return ForEach<dvec4>(groups, count, points, [&](dvec4& p) {
      p = m * p;
      return true;
    });
  });
  add("4-vectors, divided", [](const void* matrix, int groups, int count, void* points) {
    const dmat4 m = *static_cast<const dmat4*>(matrix);
    return ForEach<dvec4>(groups, count, points, [&](dvec4& p) {
      p = m * p;
      p /= p.w;
      return true;
    });
  });
  add("short points", [](const void* matrix, int groups, int count, void* points) {
    const Affine affine(matrix);
    return TransformShort(groups, count, points, [&](double x, double y) {
      const dvec2 p = affine.m * dvec3(x, y, 1);
      return Pair{p.x, p.y};
    });
  });
  add("16.16 points", [](const void* matrix, int groups, int count, void* points) {
    Affine affine(matrix);
    affine.m[2] *= 65536.0;
    return TransformFixed(groups, count, points, [&](double x, double y) {
      const dvec2 p = affine.m * dvec3(x, y, 1);
      return Pair{p.x, p.y};
    });
  });
  const auto operation = [&](const char* what, auto run) {
    peers.operations.push_back({what, "glm", run});
  };
  operation("4x4 concat", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, dmat4>(count, a, b, out, [](const dmat4& p, const dmat4& q) { return q * p; });
  });
  operation("4x4 inverse", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, dmat4>(count, a, b, out, [](const dmat4& p, const dmat4&) { return inverse(p); });
  });
  operation("4x4 determinant", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, double>(count, a, b, out,
                          [](const dmat4& p, const dmat4&) { return determinant(p); });
  });
  operation("4x4 transpose", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, dmat4>(count, a, b, out,
                         [](const dmat4& p, const dmat4&) { return transpose(p); });
  });
  operation("3x3 concat", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat3, dmat3>(count, a, b, out, [](const dmat3& p, const dmat3& q) { return p * q; });
  });
  operation("3x3 inverse", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat3, dmat3>(count, a, b, out, [](const dmat3& p, const dmat3&) { return inverse(p); });
  });
  operation("axis-angle", [](int count, const void* a, const void* b, void* out) {
    ForAll<dvec4, dmat4>(count, a, b, out, [](const dvec4& p, const dvec4&) {
      return rotate(kTurned<dmat4>, p.w, dvec3(p));
    });
  });
  operation("decomposition", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, Parts>(count, a, b, out, [](const dmat4& m, const dmat4&) {
      dvec3 s, t, h;
      dquat q;
      dvec4 perspective;
      decompose(m, s, q, t, h, perspective);
      const dvec3 r = eulerAngles(q);
      return Parts{{t.x, t.y, t.z, s.x, s.y, s.z, h.x, h.y, h.z, r.x, r.y, r.z}};
    });
  });
  operation("quaternion to matrix", [](int count, const void* a, const void* b, void* out) {
    ForAll<dvec4, dmat4>(count, a, b, out, [](const dvec4& q, const dvec4&) {
      return mat4_cast(dquat(q.w, q.x, q.y, q.z));
    });
  });
  operation("matrix to quaternion", [](int count, const void* a, const void* b, void* out) {
    ForAll<dmat4, dvec4>(count, a, b, out, [](const dmat4& m, const dmat4&) {
      const dquat q = quat_cast(m);
      return dvec4(q.x, q.y, q.z, q.w);
    });
  });
  operation("slerp", [](int count, const void* a, const void* b, void* out) {
    ForAll<dvec4, dvec4>(count, a, b, out, [](const dvec4& p, const dvec4& q) {
      const dquat r = slerp(dquat(p.w, p.x, p.y, p.z), dquat(q.w, q.x, q.y, q.z), 0.3);
      return dvec4(r.x, r.y, r.z, r.w);
    });
  });
}
#endif

#ifdef BENCH_HAS_EIGEN
// Eigen's columns lie one behind the other, as M's rows do: its M v is M's v M.
void AddEigen(Peers& peers) {
  using namespace Eigen;
  const auto add = [&](const char* what, auto run) {
    peers.transforms.push_back({what, "Eigen", run});
  };
  using Compact = Transform<double, 2, AffineCompact>;
  static const auto affine = [](const void* matrix) {
    const auto& a = static_cast<const M_Matrix3*>(matrix)->m;
    Compact m;
    m.matrix() << a[0][0], a[1][0], a[2][0], a[0][1], a[1][1], a[2][1];
    return m;
  };
  add("2D points", [](const void* matrix, int groups, int count, void* points) {
    const Compact m = affine(matrix);
    return ForEach<Vector2d>(groups, count, points, [&](Vector2d& p) {
      p = m * p;
      return true;
    });
  });
  add("vectors of 3", [](const void* matrix, int groups, int count, void* points) {
    const Matrix3d m = *static_cast<const Matrix3d*>(matrix);
    return ForEach<Vector3d>(groups, count, points, [&](Vector3d& p) {
      p = m * p;
      return true;
    });
  });
  add("3D points", [](const void* matrix, int groups, int count, void* points) {
    const Matrix4d m = *static_cast<const Matrix4d*>(matrix);
    return ForEach<Vector3d>(groups, count, points, [&](Vector3d& p) {
      p = (m * p.homogeneous()).hnormalized();
      return true;
    });
  });
  add("4-vectors", [](const void* matrix, int groups, int count, void* points) {
    const Matrix4d m = *static_cast<const Matrix4d*>(matrix);
    double* p = static_cast<double*>(points);
    for (int i = 0; i < groups * count; ++i, p += 4) {
      Map<Vector4d> v(p);
      v = m * v;
    }
    return true;
  });
  add("4-vectors, divided", [](const void* matrix, int groups, int count, void* points) {
    const Matrix4d m = *static_cast<const Matrix4d*>(matrix);
    double* p = static_cast<double*>(points);
    for (int i = 0; i < groups * count; ++i, p += 4) {
      Map<Vector4d> v(p);
      v = m * v;
      v /= v[3];
    }
    return true;
  });
  add("short points", [](const void* matrix, int groups, int count, void* points) {
    const Compact m = affine(matrix);
    return TransformShort(groups, count, points, [&](double x, double y) {
      const Vector2d p = m * Vector2d(x, y);
      return Pair{p.x(), p.y()};
    });
  });
  add("16.16 points", [](const void* matrix, int groups, int count, void* points) {
    Compact m = affine(matrix);
    m.translation() *= 65536.0;
    return TransformFixed(groups, count, points, [&](double x, double y) {
      const Vector2d p = m * Vector2d(x, y);
      return Pair{p.x(), p.y()};
    });
  });
  const auto operation = [&](const char* what, auto run) {
    peers.operations.push_back({what, "Eigen", run});
  };
  // M's records are aligned as doubles, which Eigen's own matrices are not content with.
  using Four = Map<const Matrix4d>;
  using Three = Map<const Matrix3d>;
  static const auto four = [](const void* p, int i) {
    return Four(static_cast<const double*>(p) + 16 * i);
  };
  static const auto three = [](const void* p, int i) {
    return Three(static_cast<const double*>(p) + 9 * i);
  };
  static const auto fourOut = [](void* p, int i) {
    return Map<Matrix4d>(static_cast<double*>(p) + 16 * i);
  };
  static const auto threeOut = [](void* p, int i) {
    return Map<Matrix3d>(static_cast<double*>(p) + 9 * i);
  };
  operation("4x4 concat", [](int count, const void* a, const void* b, void* out) {
    for (int i = 0; i < count; ++i) fourOut(out, i).noalias() = four(b, i) * four(a, i);
  });
  operation("4x4 inverse", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) fourOut(out, i) = four(a, i).inverse();
  });
  operation("4x4 determinant", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) static_cast<double*>(out)[i] = four(a, i).determinant();
  });
  operation("4x4 transpose", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) fourOut(out, i) = four(a, i).transpose();
  });
  operation("3x3 concat", [](int count, const void* a, const void* b, void* out) {
    for (int i = 0; i < count; ++i) threeOut(out, i).noalias() = three(a, i) * three(b, i);
  });
  operation("3x3 inverse", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) threeOut(out, i) = three(a, i).inverse();
  });
  using Quaternions = Map<const Quaterniond>;
  static const auto quaternion = [](const void* p, int i) {
    return Quaternions(static_cast<const double*>(p) + 4 * i);
  };
  operation("axis-angle", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) {
      const double* const p = static_cast<const double*>(a) + 4 * i;
      Matrix4d rotation = Matrix4d::Identity();
      rotation.topLeftCorner<3, 3>() =
          AngleAxisd(p[3], Vector3d(p[0], p[1], p[2]).normalized()).toRotationMatrix();
      fourOut(out, i).noalias() = rotation * kTurned<Matrix4d>;
    }
  });
  operation("quaternion to matrix", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) {
      Matrix4d m = Matrix4d::Identity();
      m.topLeftCorner<3, 3>() = quaternion(a, i).toRotationMatrix();
      fourOut(out, i) = m;
    }
  });
  operation("matrix to quaternion", [](int count, const void* a, const void*, void* out) {
    for (int i = 0; i < count; ++i) {
      Map<Quaterniond>(static_cast<double*>(out) + 4 * i) =
          Quaterniond(Matrix3d(four(a, i).topLeftCorner<3, 3>()));
    }
  });
  operation("slerp", [](int count, const void* a, const void* b, void* out) {
    for (int i = 0; i < count; ++i) {
      Map<Quaterniond>(static_cast<double*>(out) + 4 * i) =
          quaternion(a, i).slerp(0.3, quaternion(b, i));
    }
  });
  // Of an empty intersection Eigen keeps the edges; M gives zeros.
  operation("long intersection", [](int count, const void* a, const void* b, void* out) {
    using Box = AlignedBox2i;
    ForAll<Box, Box>(count, a, b, out, [](const Box& p, const Box& q) {
      const Box both = p.intersection(q);
      return both.isEmpty() ? Box(Vector2i::Zero(), Vector2i::Zero()) : both;
    });
  });
  operation("float intersection", [](int count, const void* a, const void* b, void* out) {
    const auto box = [](const void* p, int i) {
      const auto& r = static_cast<const M_FloatRect*>(p)[i];
      return AlignedBox2d(Vector2d(r.left, r.top), Vector2d(r.right, r.bottom));
    };
    for (int i = 0; i < count; ++i) {
      const AlignedBox2d both = box(a, i).intersection(box(b, i));
      auto& r = static_cast<M_FloatRect*>(out)[i];
      r = both.isEmpty()
              ? M_FloatRect{}
              : M_FloatRect{both.min().x(), both.min().y(), both.max().x(), both.max().y()};
    }
  });
  operation("long union", [](int count, const void* a, const void* b, void* out) {
    using Box = AlignedBox2i;
    ForAll<Box, Box>(count, a, b, out, [](const Box& p, const Box& q) { return p.merged(q); });
  });
}
#endif

}  // namespace

extern "C" __attribute__((visibility("default"))) const bench::Peers* BenchPeers() {
  static const Peers all = [] {
    Peers peers;
#ifdef BENCH_HAS_IMATH
    AddImath(peers);
#endif
#ifdef BENCH_HAS_GLM
    AddGlm(peers);
#endif
#ifdef BENCH_HAS_EIGEN
    AddEigen(peers);
#endif
    return peers;
  }();
  return &all;
}
