// What holds for every function: where its outputs may stand, what they depend on, and that it may
// be called from several threads at once.

#include <thread>

#include "Law.h"
#include "Machine.h"
#include "Mp_Decomp.h"
#include "Mp_Ratio.h"
#include "Mp_Utils.h"

namespace {

using M3 = M_Matrix3;
using M4 = M_Matrix4;
constexpr auto kAdd3 = +[](M3* a, const M3& b) { *a += b; };
constexpr auto kAdd4 = +[](M4* a, const M4& b) { *a += b; };
constexpr auto kSubtract3 = +[](M3* a, const M3& b) { *a -= b; };
constexpr auto kSubtract4 = +[](M4* a, const M4& b) { *a -= b; };
constexpr bool (*kEqualWithin3)(const M3&, const M3&, double) = M_EqualMatrixWithinEpsilon;
constexpr bool (*kEqualWithin4)(const M4&, const M4&, double) = M_EqualMatrixWithinEpsilon;
constexpr bool (*kToScreen3)(const M4&, const M4&, const M3&, V3*) = M_TransformPoint3DtoScreen;
constexpr bool (*kToScreen2)(const M4&, const M4&, const M3&, V2*) = M_TransformPoint3DtoScreen;
constexpr auto kInPoly = M_IsFloatPointInConcavePoly<V2>;
constexpr auto kInPolyF = M_IsFloatPointInConcavePoly<F2>;
constexpr auto kQuad = +[](const V2* p, const V2* quad, unsigned char* inside) {
  return M_IsFloatPointInQuad(p, quad, inside);
};

template <auto... kFunctions>
void Add(std::vector<Function>* all, const CallOptions& options = {}) {
  (all->push_back(Describe<kFunctions>(kFunctions, options)), ...);
}

std::vector<Function> All() {
  std::vector<Function> all;
  Add<M_FixMul, M_FixDiv, M_Fix24Mul, M_Fix24Ratio, M_LeadingZeros, M_TrailingZeros,
      M_RoundUpToPowerOf2, M_RoundDownToPowerOf2, M_BitsUsed, M_IsTopTwoBitsSame,
      M_AddWouldOverflow, M_MulWouldOverflow, M_UMulWouldOverflow, M_SignedGCD, M_UnsignedGCD,
      M_SignedLCM, M_UnsignedLCM, M_RoundDouble, M_RoundDoubleSafe, M_RoundDouble64, M_fmod,
      M_CompareRatio, M_MinRatio, M_MaxRatio, M_ShortConvRatio, M_ClipRatioToSpan, M_ClipSpanToSpan,
      Mp_Double2RatioSmart, M_SetPt, M_SetLPt, M_SetFixedPt, M_CopyPt, M_CopyLPt, M_CopyFixedPt,
      M_EqualPt, M_EqualLPt, M_EqualFixedPt, M_DeltaPoint, M_SetRect, M_SetLRect, M_SetFixedRect,
      M_SetWHRect, M_CopyRect, M_CopyLRect, M_CopyFixedRect, M_CopyWHRect, M_EqualRect,
      M_EqualLRect, M_EqualFixedRect, M_EqualWHRect, M_EmptyRect, M_EmptyLRect, M_EmptyFixedRect,
      M_PtInRect, M_LPtInRect, M_FixedPtInRect, M_Pt2Rect, M_LPt2Rect, M_FixedPt2Rect, M_PtToAngle,
      M_RectCompare, M_LRectCompare, M_FixedRectCompare, M_FixedRect2Rect, M_FixedRect2LRect,
      M_FixedRect2RectIn, M_FixedRect2LRectIn, M_FixedRect2RectOut, M_FixedRect2LRectOut,
      M_Rect2FixedRect, M_LRect2FixedRect, M_TransformBounds, &V4::Normalize, &M3::Adjoint,
      &M3::Transpose, &M4::Transpose, &M4::Project, kEqualWithin3, kEqualWithin4, M_EqualMatrix,
      M_SetIdentityMatrix, M_GetMatrixType, M_InverseMatrix, M_EqualMatrix4, M_ZeroMatrix4,
      M_IdentityMatrix4, M_SetMatrix4CoB, M_ConcatMatrix4, M_TransposeMatrix4,
      M_GetMatrix4Determinant, M_InverseMatrix4, M_CalcNormalMatrix4, M_Matrix3ToMatrix4,
      M_Matrix3ToMatrix4Uniform, M_GetOrderedXYZRotationFromMatrix,
      M_ConvertAxisAngleToOrderedXYZRotation, M_LookAtMatrix, M_GetPlaneEquation2, M_Clip3DLine,
      M_ComputeDirectionalComponents, M_VecToAngle, M_Pt2Angle, &M3::AssignFromByDroppingZ>(&all);
  Add<M_ReduceRatio, M_RecipRatio, M_SectRect, M_SectLRect, M_SectFixedRect, M_SectFloatRect,
      M_InverseMatrixQuiet, M_InverseMatrix4Quiet, M_CalcNormalMatrix4Quiet>(&all, {.nullable = 4});
  Add<M_AddRatio, M_SubRatio, M_MulRatio, M_DivRatio, kToScreen3, kToScreen2>(&all, {.inOut = 8});
  Add<M_FpLong2Ratio>(&all, {.nullable = 2});
  Add<M_ConvRatio>(&all, {.nullable = 8, .isKept = true});
  Add<M_ClipRatio, M_LRect2Rect, M_DecomposeMatrix4, M_DecomposeMatrix4ZYX>(&all, {.isKept = true});
  Add<M_AddPt, M_CenterRect, M_CenterLRect, M_CenterFixedRect, &M3::TransformPointAndDivide,
      &M3::TransformPointAndDivideFast, &M4::TransformPointAndDivide,
      &M4::TransformPointAndDivideFast, M_ConcatMatrix, M_RotateMatrix4XYZPlus>(&all, {.inOut = 2});
  Add<M_InsetRect, M_InsetLRect, M_InsetFixedRect, M_OffsetRect, M_OffsetLRect, M_OffsetFixedRect,
      kAdd3, kAdd4, kSubtract3, kSubtract4, M_TranslateMatrix, M_RotateMatrix, M_ScaleMatrix,
      M_TranslateMatrix4, M_ScaleMatrix4, M_Correct3DDecompFor2D, M_RotateMatrix4,
      M_RotateMatrix4XYZ>(&all, {.inOut = 1});
  Add<M_TransformFloatPoints, M_TransformPoints, M_TransformFixPoints, M_TransformVector3,
      M_TransformVector4NoDivide, M_TransformVector4, M_Transform3DFloatPoints,
      M_3DTransform2DPoints, &M3::TransformPointsAndDivide, &M3::TransformPointsAndDivideFast,
      &M4::TransformPointsAndDivide, &M4::TransformPointsAndDivideFast>(
      &all, {.inOut = 4, .count = 1, .many = 4});
  Add<M_TransformRect, M_TransformFloatRect>(&all, {.inOut = 2, .nullable = 12, .many = 4});
  Add<M_TransformFixRect>(&all, {.inOut = 2, .nullable = 12, .isKept = true, .many = 4});
  Add<M_QuatToMatrix4>(&all, {.many = 1});
  Add<M_Matrix4ToQuat, kQuad, M_IsQuadEdgeOn>(&all, {.many = 2});
  Add<M_Slerp>(&all, {.many = 7});
  Add<M_GetPlaneEquation>(&all, {.nullable = 8, .count = 1, .many = 1});
  Add<M_RayIntersectPlane>(&all, {.nullable = 16});
  Add<M_PerpDistTo2DLine>(&all, {.nullable = 8});
  Add<M_ClipLine2Rect>(&all, {.inOut = 6});
  Add<M_TransformPtF, M_TransformPoint2DtoScreen>(&all, {.inOut = 4});
  Add<M_SignedPolygonArea2D>(&all, {.count = 1, .many = 1});
  Add<kInPoly, kInPolyF>(&all, {.count = 2, .many = 2});
  return all;
}

const std::vector<Function> kAll = All();

void Expect(bool holds, const Function& f, const Function::Values& given, const std::string& what) {
  if (!holds) RC_FAIL(f.Text(given) + ": " + what);
}

// Whether an output may be a part of an input: of its type, or a number in a record of them.
bool IsPart(const Type* out, const Type* in) {
  return out == in || (out == &kType<double> && in->isOfDoubles) ||
         (out == &kType<M_Point> && in == &kType<M_Rect>);
}

// Calls with parameter `moved` at a place of parameter `in`, which must give what it does apart.
void TestPlace(const Function& f, const Function::Values& given, size_t moved, size_t in,
               size_t at) {
  Function::Values values = given, apart = given;
  Function::Places places = Function::OwnPlaces(values);
  const Parameter& p = f.parameters[moved];
  places[moved] = values[in].bytes + at;
  // What stands there is what is read, or kept after a failure.
  std::memcpy(apart[moved].bytes, places[moved], p.type->size * p.targets);
  if (f.Outcome(places) != f.Outcome(apart)) {
    RC_FAIL(f.Text(apart) + ": parameter " + std::to_string(moved) + " in " + std::to_string(in));
  }
}

// Each output in the place of each input of its type, of each number of that type in one, and
// behind its first number; inputs that are parts of an output; and an input that is changed.
void TestPlaces(const Function& f) {
  const Function::Values given = f.Draw();
  for (size_t o = 0; o < f.parameters.size(); ++o) {
    for (size_t i = 0; f.parameters[o].isOutput && i < f.parameters.size(); ++i) {
      const Parameter &out = f.parameters[o], &in = f.parameters[i];
      const size_t outSize = out.type->size * out.targets, inSize = in.type->size * in.targets;
      if (i == o || !in.isPointer || (in.isOutput && !in.isInOut)) continue;
      if (out.isInOut) {
        if (out.type == in.type && !in.isOutput && in.targets == out.targets)
          TestPlace(f, given, i, o, 0);
      } else if (IsPart(out.type, in.type)) {
        for (size_t at = 0; at < inSize; at += out.type->size) {
          if (at + outSize <= inSize || out.type == in.type) TestPlace(f, given, o, i, at);
        }
      } else if (IsPart(in.type, out.type) && !in.isOutput) {
        for (size_t at = 0; at + inSize <= outSize; at += in.type->size) {
          Function::Values values = given;
          std::memcpy(values[o].bytes + at, given[i].bytes, inSize);
          TestPlace(f, values, i, o, at);
        }
      }
    }
  }
}

// Inputs stay; what an output held does not matter; and it may be null where that is allowed.
void TestOutputs(const Function& f) {
  const Function::Values given = f.Draw();
  Function::Values values = given, others = given;
  const std::string expected = f.Outcome(Function::OwnPlaces(values));
  for (size_t k = 0; k < f.parameters.size(); ++k) {
    const Parameter& p = f.parameters[k];
    if (p.isOutput && !p.isInOut) std::memset(others[k].bytes, 0x5A, sizeof(Room));
    const size_t end = p.type->size * p.targets;
    Expect(std::memcmp(values[k].bytes + end, given[k].bytes + end, sizeof(Room) - end) == 0, f,
           given, "something is written behind an output");
    if (!p.isOutput) {
      Expect(std::memcmp(&values[k], &given[k], p.type->size) == 0, f, given,
             "an input is changed");
    }
  }
  Expect(f.options.isKept || f.Outcome(others) == expected, f, given, "what outputs held matters");
  for (size_t k = 0; k < f.parameters.size(); ++k) {
    if ((f.options.nullable >> k & 1) == 0) continue;
    Function::Values with = given, alone = given, without = given;
    Function::Places places = Function::OwnPlaces(without), onlyThis = Function::OwnPlaces(alone);
    places[k] = nullptr;
    for (size_t other = 0; other < f.parameters.size(); ++other) {
      if (other != k && f.options.nullable >> other & 1) onlyThis[other] = nullptr;
    }
    Expect(f.Outcome(places) == f.Outcome(Function::OwnPlaces(with), k), f, given,
           "without output " + std::to_string(k));
    f.Outcome(onlyThis);
    const auto bits = f.parameters[k].type->bits;
    Expect(bits(with[k].bytes) == bits(alone[k].bytes), f, given,
           "output " + std::to_string(k) + " alone");
  }
}

TEST(Calls, OutputsMayStandInInputs) {
  for (const Function& f : kAll) Holds([&] { TestPlaces(f); }, 0.05);
}

TEST(Calls, OutputsAreWrittenWhateverTheyHeld) {
  for (const Function& f : kAll) Holds([&] { TestOutputs(f); }, 0.05);
}

// Several threads with other operands each, against what these gave in one.
TEST(Calls, MayBeMadeInSeveralThreads) {
  for (const Function& f : kAll) {
    std::vector<std::pair<Function::Values, std::string>> calls;
    const auto draw = [&] {
      const Function::Values values = f.Draw();
      calls.emplace_back(values, f.Outcome(values));
    };
    Holds(draw, 0.008);
    std::vector<std::thread> threads;
    std::atomic<int> failures = 0;
    for (size_t t = 0; t < 4; ++t) {
      threads.emplace_back([&, t] {
        for (size_t i = 0; i < 80 * calls.size(); ++i) {
          const auto& [values, expected] = calls[(i * (t + 1) + t) % calls.size()];
          failures += f.Outcome(values) != expected;
        }
      });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(failures, 0) << f.Text(calls[0].first);
  }
}

}  // namespace
