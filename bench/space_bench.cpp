// Points, rectangles and matrices beside Imath, glm and Eigen, and batches beside a copy of the
// same bytes and one look at each of them in place. Subjects in brackets are yardsticks, or peers
// built for this machine.

#include <dlfcn.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "Comparison.h"
#include "M_Matrix.h"
#include "Peers.h"
#include "Random.h"

namespace {

using bench::Batch;
using bench::Random;
using bench::Require;
using bench::Uniform;

// Points go round and round in place, so the matrices are of finite order: nothing grows, nothing
// vanishes.
const M_Matrix3 kTurn = [] {
  M_Matrix3 m;
  M_SetIdentityMatrix(&m);
  M_RotateMatrix(&m, 360.0 / 7, 12.5, -4);
  return m;
}();

const M_Matrix3 kQuarterTurn = {{{0, 1, 0}, {-1, 0, 0}, {3, -7, 1}}};

const M_Matrix4 kTurn4 = [] {
  M_Matrix4 m;
  M_Matrix3ToMatrix4(&kTurn, &m);
  return m;
}();

// What rotations are appended to.
const M_Matrix4 kTurned = {{{0.6, 0.8, 0, 0}, {-0.8, 0.6, 0, 0}, {0, 0, 1, 0}, {1, 2, 3, 1}}};

// A turn as a camera sees it: into perspective, turned, and back.
const M_Matrix4 kPerspective = [] {
  M_Matrix4 camera, inverse, m;
  M_IdentityMatrix4(&camera);
  camera.m[2][3] = 0.001;
  camera.m[0][3] = 0.0005;
  M_InverseMatrix4(&camera, &inverse);
  M_ConcatMatrix4(&inverse, &kTurn4, &m);
  M_ConcatMatrix4(&m, &camera, &m);
  return m;
}();

alignas(64) M_Matrix3 matrix3;
alignas(64) M_Matrix4 matrix4;

std::vector<const bench::Peers*> LoadPeers(const char* program) {
  std::vector<const bench::Peers*> all;
  const std::string path = program;
  const std::string folder = path.substr(0, path.rfind('/') + 1) + BENCH_MODULES;
  for (const char* name : {"peers_O2", "peers_native"}) {
    void* const module = dlopen((folder + name + ".so").c_str(), RTLD_NOW | RTLD_LOCAL);
    Require(module, dlerror());
    all.push_back(reinterpret_cast<const bench::Peers* (*)()>(dlsym(module, "BenchPeers"))());
  }
  return all;
}

std::string Subject(const std::string& peer, size_t build) {
  return build == 0 ? peer : "(" + peer + " -O3 -march=native)";
}

// The bytes once over in place, as a compiler vectorises it.
void Touch(std::vector<uint64_t>& words, size_t count) {
  for (size_t i = 0; i < count; ++i) words[i] ^= 0x5555;
}

// One batch transform at every length. `run` has the shape of M's functions.
template <class Matrix, class Point, class Make>
void Transforms(const std::string& what, const std::vector<const bench::Peers*>& peers,
                Matrix* place, const Matrix& matrix, int32_t (*run)(const Matrix*, int32_t, Point*),
                Make make) {
  for (const int count : {4, 64, 4096, 1000000}) {
    const std::string line = what + " x " + std::to_string(count);
    const int groups = count == 4 ? 16 : 1;
    const auto total = static_cast<size_t>(groups * count);
    const auto points = std::make_shared<std::vector<Point>>(total);
    for (Point& p : *points) p = make();
    Batch(line, "M", groups * count, [=] {
      *place = matrix;
      for (int g = 0; g < groups; ++g) {
        Require(run(place, count, points->data() + g * count) == 0, line.c_str());
      }
    });
    for (size_t build = 0; build < peers.size(); ++build) {
      for (const auto& peer : peers[build]->transforms) {
        if (peer.what != what) continue;
        const auto theirs = std::make_shared<std::vector<Point>>(*points);
        Batch(line, Subject(peer.peer, build), groups * count, [=] {
          *place = matrix;
          Require(peer.run(place, groups, count, theirs->data()), line.c_str());
        });
      }
    }
    const auto words = std::make_shared<std::vector<uint64_t>>(total * sizeof(Point) / 8);
    const auto copy = std::make_shared<std::vector<uint64_t>>(*words);
    Batch(line, "(copy)", groups * count,
          [=] { std::memcpy(copy->data(), words->data(), words->size() * 8); });
    Batch(line, "(touch)", groups * count, [=] { Touch(*words, words->size()); });
  }
}

constexpr int kOperands = 256;

// An operation on single operands, over an array that fits the nearest cache.
template <class Operand, class Out, class Work>
void Operations(const std::string& what, const std::vector<const bench::Peers*>& peers,
                const std::vector<Operand>& a, const std::vector<Operand>& b, Work work) {
  const auto as = std::make_shared<std::vector<Operand>>(a);
  const auto bs = std::make_shared<std::vector<Operand>>(b);
  const auto out = std::make_shared<std::vector<Out>>(a.size());
  const int count = static_cast<int>(a.size());
  Batch(what, "M", count, [=] {
    for (size_t i = 0; i < as->size(); ++i) work((*as)[i], (*bs)[i], (*out)[i]);
  });
  for (size_t build = 0; build < peers.size(); ++build) {
    for (const auto& peer : peers[build]->operations) {
      if (peer.what != what) continue;
      Batch(what, Subject(peer.peer, build), count,
            [=] { peer.run(count, as->data(), bs->data(), out->data()); });
    }
  }
}

template <class Matrix>
std::vector<Matrix> RandomMatrices() {
  std::vector<Matrix> all(kOperands);
  for (Matrix& m : all) {
    for (auto& row : m.m) {
      for (double& element : row) element = Uniform(-1, 1);
    }
  }
  return all;
}

template <class Rect, class Edge>
std::vector<Rect> RandomRects(Edge size) {
  std::vector<Rect> all(4096);  // More than what a processor learns by heart.
  for (Rect& r : all) {
    const auto edge = [&] { return static_cast<Edge>(Uniform(0, static_cast<double>(size))); };
    r.left = edge(), r.top = edge();
    r.right = r.left + edge(), r.bottom = r.top + edge();
  }
  return all;
}

void RegisterAll(const std::vector<const bench::Peers*>& peers) {
  const auto c = [] { return Uniform(-100, 100); };
  Transforms("2D points", peers, &matrix3, kTurn, M_TransformFloatPoints, [&] {
    return M_Vector2T<double>{c(), c()};
  });
  Transforms("vectors of 3", peers, &matrix3, kTurn, M_TransformVector3, [&] {
    return M_Vector3T<double>{c(), c(), c()};
  });
  Transforms("4-vectors", peers, &matrix4, kTurn4, M_TransformVector4NoDivide, [&] {
    return M_Vector4T<double>{c(), c(), c(), 1};
  });
  Transforms("4-vectors, divided", peers, &matrix4, kPerspective, M_TransformVector4, [&] {
    return M_Vector4T<double>{c(), c(), c(), 1};
  });
  Transforms("3D points", peers, &matrix4, kPerspective, M_Transform3DFloatPoints, [&] {
    return M_Vector3T<double>{c(), c(), c()};
  });
  const auto h = [] { return static_cast<int16_t>(Random() % 2000 - 1000); };
  Transforms("short points", peers, &matrix3, kQuarterTurn, M_TransformPoints, [&] {
    return M_Point{h(), h()};
  });
  Transforms("16.16 points", peers, &matrix3, kQuarterTurn, M_TransformFixPoints, [&] {
    return M_FixedPoint{h() * 70000, h() * 70000};
  });

  const auto a4 = RandomMatrices<M_Matrix4>(), b4 = RandomMatrices<M_Matrix4>();
  const auto a3 = RandomMatrices<M_Matrix3>(), b3 = RandomMatrices<M_Matrix3>();
  Operations<M_Matrix4, M_Matrix4>("4x4 concat", peers, a4, b4, [](auto& a, auto& b, auto& out) {
    M_ConcatMatrix4(&a, &b, &out);
  });
  Operations<M_Matrix4, M_Matrix4>("4x4 inverse", peers, a4, b4,
                                   [](auto& a, auto&, auto& out) { M_InverseMatrix4(&a, &out); });
  Operations<M_Matrix4, double>("4x4 determinant", peers, a4, b4, [](auto& a, auto&, auto& out) {
    M_GetMatrix4Determinant(&a, &out);
  });
  Operations<M_Matrix4, M_Matrix4>("4x4 transpose", peers, a4, b4,
                                   [](auto& a, auto&, auto& out) { M_TransposeMatrix4(&a, &out); });
  Operations<M_Matrix3, M_Matrix3>("3x3 concat", peers, a3, b3, [](auto& a, auto& b, auto& out) {
    out = b;
    M_ConcatMatrix(&a, &out);
  });
  Operations<M_Matrix3, M_Matrix3>("3x3 inverse", peers, a3, b3,
                                   [](auto& a, auto&, auto& out) { M_InverseMatrix(&a, &out); });

  // Axes and angles, unit quaternions, and matrices that scale, shear, rotate and translate.
  std::vector<M_Vector4T<double>> axes(kOperands), quaternions(kOperands), others4(kOperands);
  std::vector<M_Matrix4> affine(kOperands), rotations(kOperands);
  for (size_t i = 0; i < kOperands; ++i) {
    const auto any = [] { return Uniform(-1, 1); };
    axes[i] = {any(), any(), any(), Uniform(-3, 3)};
    for (auto* q : {&quaternions[i], &others4[i]}) {
      *q = {any(), any(), any(), any()};
      const double r = 1 / std::sqrt(q->x * q->x + q->y * q->y + q->z * q->z + q->w * q->w);
      *q = {q->x * r, q->y * r, q->z * r, q->w * r};
    }
    M_QuatToMatrix4(&quaternions[i].x, &rotations[i]);
    affine[i] = a4[i];
    for (auto& row : affine[i].m) row[3] = 0;
    affine[i].m[3][3] = 1;
  }
  Operations<M_Vector4T<double>, M_Matrix4>("axis-angle", peers, axes, axes,
                                            [](auto& a, auto&, auto& out) {
                                              out = kTurned;
                                              M_RotateMatrix4(&out, a.x, a.y, a.z, a.w);
                                            });
  Operations<M_Matrix4, M_Matrix4Decomp>(
      "decomposition", peers, affine, affine,
      [](auto& a, auto&, auto& out) { M_DecomposeMatrix4(&a, &out, nullptr); });
  Operations<M_Vector4T<double>, M_Matrix4>(
      "quaternion to matrix", peers, quaternions, quaternions,
      [](auto& a, auto&, auto& out) { M_QuatToMatrix4(&a.x, &out); });
  Operations<M_Matrix4, M_Vector4T<double>>(
      "matrix to quaternion", peers, rotations, rotations,
      [](auto& a, auto&, auto& out) { M_Matrix4ToQuat(&a, &out.x); });
  Operations<M_Vector4T<double>, M_Vector4T<double>>(
      "slerp", peers, quaternions, others4,
      [](auto& a, auto& b, auto& out) { M_Slerp(&a.x, &b.x, &out.x, 0.3); });

  const auto rects = RandomRects<M_LRect>(1000), others = RandomRects<M_LRect>(1000);
  Operations<M_LRect, M_LRect>("long intersection", peers, rects, others,
                               [](auto& a, auto& b, auto& out) { M_SectLRect(&a, &b, &out); });
  Operations<M_LRect, M_LRect>("long union", peers, rects, others,
                               [](auto& a, auto& b, auto& out) { M_UnionLRect(&a, &b, &out); });
  Operations<M_FloatRect, M_FloatRect>(
      "float intersection", peers, RandomRects<M_FloatRect>(1000.0),
      RandomRects<M_FloatRect>(1000.0),
      [](auto& a, auto& b, auto& out) { M_SectFloatRect(&a, &b, &out); });
}

}  // namespace

int main(int argc, char** argv) {
  RegisterAll(LoadPeers(argv[0]));
  return bench::RunAndCompare(argc, argv);
}
