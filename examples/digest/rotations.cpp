// What passes through the platform's sin, cos, asin, acos and atan2.

#include "Area.h"

namespace digest {
namespace {

// Decompositions of what has rows to decompose: random elements would do, but mostly without
// mirrors, lock and failures.
template <auto kFunction>
void Decompose(Area& area) {
  area.Call<kFunction>(0b100);
  for (int i = 0; i < Area::kTimes; ++i) {
    Operands& operands = area.operands();
    M_Matrix4 m = {};
    for (int row = 0; row < 3; ++row) {
      m.m[row][operands.Below(3)] = static_cast<double>(operands.Below(5)) - 2;
      m.m[row][row] += 1;
      m.m[3][row] = operands.Make<double>();
    }
    m.m[3][3] = 1;
    M_Matrix4Decomp parts = {};
    unsigned char hasFailed = 0;
    area.Try([&] { area.Add(kFunction(&m, &parts, operands.Below(2) ? &hasFailed : nullptr)); });
    area.Add(parts);
    area.Add(hasFailed);
    area.Add(M_Correct3DDecompFor2D(&parts));
    area.Add(parts);
    double angles[3] = {};
    area.Try([&] {
      area.Add(M_GetOrderedXYZRotationFromMatrix(&m, &angles[0], &angles[1], &angles[2]));
    });
    area.Add(angles);
  }
}

}  // namespace

void RunRotations(Area& area) {
  area.Call<M_RotateMatrix>();
  Decompose<M_DecomposeMatrix4>(area);
  Decompose<M_DecomposeMatrix4ZYX>(area);
  area.Call<M_Correct3DDecompFor2D>();
  area.Call<M_GetOrderedXYZRotationFromMatrix>();
  area.Call<M_RotateMatrix4>();
  area.Call<M_RotateMatrix4XYZ>();
  area.Call<M_RotateMatrix4XYZPlus>();
  area.Call<M_ConvertAxisAngleToOrderedXYZRotation>();
  area.Call<M_Slerp>();
}

void RunBearings(Area& area) {
  area.Call<M_PtToAngle>();
  area.Call<M_VecToAngle>();
  area.Call<M_Pt2Angle>();
  area.Call<M_TransformPtF>();
}

}  // namespace digest
