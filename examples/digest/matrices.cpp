// Matrices, their members, and batches of points.

#include "Area.h"

namespace digest {
namespace {

// Points of every number up to where the last block is left over in every way, and some longer.
template <class Matrix, class Point, class Work>
void Batches(Area& area, const std::string& name, const Work& work) {
  area.Begin(name);
  Operands& operands = area.operands();
  const auto run = [&](int32_t count) {
    operands.BeginCall();
    const auto m = operands.Make<Matrix>();
    std::vector<Point> points(static_cast<size_t>(count) + 1);
    for (Point& p : points) {
      if (count > 8 && operands.Below(4) == 0) operands.BeginCall();
      p = operands.Make<Point>();
    }
    area.Try([&] { work(m, count, points.data()); });
    for (const Point& p : points) area.Add(p);
  };
  for (int32_t count = 0; count <= 40; ++count) {
    for (int i = 0; i < 20; ++i) run(count);
  }
  for (const int32_t count : {255, 256, 257, 1001, 4099}) run(count);
}

template <auto kFunction, class Matrix, class Point>
void BatchesOf(Area& area, int32_t (*)(const Matrix*, int32_t, Point*)) {
  Batches<Matrix, Point>(area, NameOf<kFunction>(),
                         [&](const Matrix& m, int32_t count, Point* points) {
                           area.Add(kFunction(&m, count, points));
                         });
}
template <auto kFunction>
void Batches(Area& area) {
  BatchesOf<kFunction>(area, kFunction);
}

// A matrix that has an inverse, and one that projects nothing: what random elements are not.
template <class Matrix>
void CallOnUsual(Area& area, int32_t (*function)(const Matrix*, Matrix*)) {
  for (int i = 0; i < Area::kTimes; ++i) {
    Operands& operands = area.operands();
    Matrix m = {}, out = {};
    constexpr int kSize = sizeof(m.m) == sizeof(M_Matrix3) ? 3 : 4;
    // At times a row is missing: then there is none.
    const auto missing = static_cast<int>(operands.Below(2 * kSize));
    for (int row = 0; row < kSize; ++row) {
      if (row == missing) continue;
      m.m[row][row] = 1;
      for (int k = 0; k < 2; ++k) {
        m.m[row][operands.Below(kSize)] = static_cast<double>(operands.Below(64)) / 16 - 2;
      }
    }
    area.Try([&] { area.Add(function(&m, &out)); });
    area.Add(out);
  }
}

// What no angle is part of.
void DecomposeWithoutAngles(Area& area) {
  area.Begin("M_DecomposeMatrix4, but for the angles");
  for (int i = 0; i < Area::kTimes; ++i) {
    Operands& operands = area.operands();
    M_Matrix4 m = operands.Make<M_Matrix4>();
    for (auto& row : m.m) row[3] = 0;
    m.m[3][3] = operands.Below(2) ? 1 : operands.Make<double>();
    for (const auto decompose : {M_DecomposeMatrix4, M_DecomposeMatrix4ZYX}) {
      M_Matrix4Decomp parts = {};
      area.Try([&] { area.Add(decompose(&m, &parts, nullptr)); });
      area.Add(parts.translate);
      area.Add(parts.scale);
      area.Add(parts.shear);
    }
  }
}

}  // namespace

void RunMatrices(Area& area) {
  area.Call<M_EqualMatrix>();
  area.Call<M_SetIdentityMatrix>();
  area.Call<M_TranslateMatrix>();
  area.Call<M_ScaleMatrix>();
  area.Call<M_ConcatMatrix>();
  area.Call<M_GetMatrixType>();
  area.Call<M_InverseMatrixQuiet>(0b100);
  area.Call<M_InverseMatrix>();
  CallOnUsual(area, M_InverseMatrix);
  area.Call<M_EqualMatrix4>();
  area.Call<M_ZeroMatrix4>();
  area.Call<M_IdentityMatrix4>();
  area.Call<M_SetMatrix4CoB>();
  area.Call<M_ConcatMatrix4>();
  area.Call<M_TransposeMatrix4>();
  area.Call<M_GetMatrix4Determinant>();
  area.Call<M_InverseMatrix4Quiet>(0b100);
  area.Call<M_InverseMatrix4>();
  CallOnUsual(area, M_InverseMatrix4);
  area.Call<M_CalcNormalMatrix4Quiet>(0b100);
  area.Call<M_CalcNormalMatrix4>();
  CallOnUsual(area, M_CalcNormalMatrix4);
  area.Call<M_TranslateMatrix4>();
  area.Call<M_ScaleMatrix4>();
  area.Call<M_Matrix3ToMatrix4>();
  area.Call<M_Matrix3ToMatrix4Uniform>();
  area.Call<M_LookAtMatrix>();
  area.Call<M_QuatToMatrix4>();
  area.Call<M_Matrix4ToQuat>();
  area.Call<M_ComputeDirectionalComponents>();
  DecomposeWithoutAngles(area);
}

void RunMembers(Area& area) {
  area.Call(
      "M_Vector4T::Normalize", +[](M_Vector4T<double>* v) { v->Normalize(); });
  area.Call(
      "M_Matrix3::TransformPointAndDivide",
      +[](const M_Matrix3& m, M_Vector3T<double>* p) { m.TransformPointAndDivide(p); });
  area.Call(
      "M_Matrix3::TransformPointAndDivideFast",
      +[](const M_Matrix3& m, M_Vector3T<double>* p) { m.TransformPointAndDivideFast(p); });
  area.Call(
      "M_Matrix3::IsZeroWithinEpsilon",
      +[](const M_Matrix3& m, double eps) { return m.IsZeroWithinEpsilon(eps); });
  area.Call(
      "M_Matrix3::IsIdentityWithinEpsilon",
      +[](const M_Matrix3& m, double eps) { return m.IsIdentityWithinEpsilon(eps); });
  area.Call(
      "M_Matrix3::Transpose", +[](M_Matrix3* m) { m->Transpose(); });
  area.Call(
      "M_Matrix3::Determinant", +[](const M_Matrix3& m) { return m.Determinant(); });
  area.Call(
      "M_Matrix3::Adjoint", +[](M_Matrix3* m) { m->Adjoint(); });
  area.Call(
      "M_Matrix3::operator+=", +[](M_Matrix3* m, const M_Matrix3& other) { *m += other; });
  area.Call(
      "M_Matrix3::operator-=", +[](M_Matrix3* m, const M_Matrix3& other) { *m -= other; });
  area.Call(
      "M_Matrix3::AssignFromByDroppingZ",
      +[](M_Matrix3* m, const M_Matrix4& from) { m->AssignFromByDroppingZ(from); });
  area.Call(
      "M_Matrix3::AssignFromByDroppingIndices",
      +[](M_Matrix3* m, const M_Matrix4& from, uint32_t row, uint32_t column) {
        m->AssignFromByDroppingIndices(from, static_cast<int>(row % 6) - 1,
                                       static_cast<int>(column % 6) - 1);
      });
  area.Call(
      "M_Matrix4::TransformPointAndDivide",
      +[](const M_Matrix4& m, M_Vector4T<double>* p) { m.TransformPointAndDivide(p); });
  area.Call(
      "M_Matrix4::TransformPointAndDivideFast",
      +[](const M_Matrix4& m, M_Vector4T<double>* p) { m.TransformPointAndDivideFast(p); });
  area.Call(
      "M_Matrix4::IsZeroWithinEpsilon",
      +[](const M_Matrix4& m, double eps) { return m.IsZeroWithinEpsilon(eps); });
  area.Call(
      "M_Matrix4::IsIdentityWithinEpsilon",
      +[](const M_Matrix4& m, double eps) { return m.IsIdentityWithinEpsilon(eps); });
  area.Call(
      "M_Matrix4::IsFinite", +[](const M_Matrix4& m) { return m.IsFinite(); });
  area.Call(
      "M_Matrix4::Project", +[](M_Matrix4* m, double distance) { m->Project(distance); });
  area.Call(
      "M_Matrix4::Transpose", +[](M_Matrix4* m) { m->Transpose(); });
  area.Call(
      "M_Matrix4::operator+=", +[](M_Matrix4* m, const M_Matrix4& other) { *m += other; });
  area.Call(
      "M_Matrix4::operator-=", +[](M_Matrix4* m, const M_Matrix4& other) { *m -= other; });
  area.Call(
      "M_EqualMatrixWithinEpsilon(M_Matrix3)",
      +[](const M_Matrix3& a, const M_Matrix3& b, double eps) {
        return M_EqualMatrixWithinEpsilon(a, b, eps);
      });
  area.Call(
      "M_EqualMatrixWithinEpsilon(M_Matrix4)",
      +[](const M_Matrix4& a, const M_Matrix4& b, double eps) {
        return M_EqualMatrixWithinEpsilon(a, b, eps);
      });
}

void RunBatches(Area& area) {
  Batches<M_TransformFloatPoints>(area);
  Batches<M_TransformPoints>(area);
  Batches<M_TransformFixPoints>(area);
  Batches<M_TransformVector3>(area);
  Batches<M_TransformVector4NoDivide>(area);
  Batches<M_TransformVector4>(area);
  Batches<M_Transform3DFloatPoints>(area);
  Batches<M_3DTransform2DPoints>(area);
  using Vector3 = M_Vector3T<double>;
  using Vector4 = M_Vector4T<double>;
  Batches<M_Matrix3, Vector3>(area, "M_Matrix3::TransformPointsAndDivide",
                              [](const M_Matrix3& m, int32_t count, Vector3* points) {
                                m.TransformPointsAndDivide(count, points);
                              });
  Batches<M_Matrix3, Vector3>(area, "M_Matrix3::TransformPointsAndDivideFast",
                              [](const M_Matrix3& m, int32_t count, Vector3* points) {
                                m.TransformPointsAndDivideFast(count, points);
                              });
  Batches<M_Matrix4, Vector4>(area, "M_Matrix4::TransformPointsAndDivide",
                              [](const M_Matrix4& m, int32_t count, Vector4* points) {
                                m.TransformPointsAndDivide(count, points);
                              });
  Batches<M_Matrix4, Vector4>(area, "M_Matrix4::TransformPointsAndDivideFast",
                              [](const M_Matrix4& m, int32_t count, Vector4* points) {
                                m.TransformPointsAndDivideFast(count, points);
                              });
}

}  // namespace digest
