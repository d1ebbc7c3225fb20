// Batches against single points, to the bit, and inverses.

#include "Input.h"

namespace {

template <auto kTransform, class Matrix, class Point>
void CheckBatch(Input& input, const Matrix& m) {
  std::vector<Point> batch(input.Below(40)), single;
  for (Point& p : batch) p = input.Any<Point>();
  single = batch;
  const auto count = static_cast<int32_t>(batch.size());
  const int32_t code = kTransform(&m, count, batch.data());
  // The first that fails ends it.
  for (size_t i = 0; i < single.size(); ++i) {
    if (kTransform(&m, 1, &single[i]) == 0) continue;
    Require(code != 0);
    break;
  }
  const size_t bytes = batch.size() * sizeof(Point);
  Require(bytes == 0 || std::memcmp(batch.data(), single.data(), bytes) == 0);
}

}  // namespace

void Run(Input& input) {
  const bool isUsual = input.Below(2) != 0;
  const auto m3 = isUsual ? input.Usual<M_Matrix3>() : input.Any<M_Matrix3>();
  const auto m4 = isUsual ? input.Usual<M_Matrix4>() : input.Any<M_Matrix4>();
  CheckBatch<M_TransformFloatPoints, M_Matrix3, Vector2>(input, m3);
  CheckBatch<M_TransformPoints, M_Matrix3, M_Point>(input, m3);
  CheckBatch<M_TransformFixPoints, M_Matrix3, M_FixedPoint>(input, m3);
  CheckBatch<M_TransformVector3, M_Matrix3, Vector3>(input, m3);
  CheckBatch<M_TransformVector4, M_Matrix4, Vector4>(input, m4);
  CheckBatch<M_TransformVector4NoDivide, M_Matrix4, Vector4>(input, m4);
  CheckBatch<M_Transform3DFloatPoints, M_Matrix4, Vector3>(input, m4);
  CheckBatch<M_3DTransform2DPoints, M_Matrix4, M_Point>(input, m4);

  M_Matrix4 inverse = {}, inPlace = m4, unit;
  const int32_t code = M_InverseMatrix4(&m4, &inverse);
  Require(M_InverseMatrix4(&inPlace, &inPlace) == code);
  Require(std::memcmp(&inPlace, &inverse, sizeof inverse) == 0);
  // Elements of sixteenths have determinants that are 0 or not.
  if (isUsual && code == 0) {
    double largest = 0;
    for (const auto& row : inverse.m) {
      for (const double e : row) largest = std::max(largest, std::abs(e));
    }
    M_ConcatMatrix4(&m4, &inverse, &unit);
    Require(largest > 1e3 || unit.IsIdentityWithinEpsilon(1e-3));
  }
  M_Matrix4Decomp parts;
  unsigned char hasFailed = 0;
  M_DecomposeMatrix4(&m4, &parts, &hasFailed);
}
