// What holds for every function: where its outputs may stand, what they depend on, and that it may
// be called from several threads at once.

#include <thread>

#include "Law.h"
#include "Machine.h"
#include "Mp_Decomp.h"
#include "Mp_Ratio.h"
#include "Mp_Utils.h"

namespace {

// Members, by a pointer or a reference to their object.
using M3 = M_Matrix3;
using M4 = M_Matrix4;
constexpr auto kNormalize = +[](V4* v) { v->Normalize(); };
constexpr auto kDivide3 = +[](const M3* m, V3* p) { m->TransformPointAndDivide(p); };
constexpr auto kDivideAll3 =
    +[](const M3* m, int32_t n, V3* p) { m->TransformPointsAndDivide(n, p); };
constexpr auto kDivideFast3 = +[](const M3* m, V3* p) { m->TransformPointAndDivideFast(p); };
constexpr auto kDivideAllFast3 =
    +[](const M3* m, int32_t n, V3* p) { m->TransformPointsAndDivideFast(n, p); };
constexpr auto kDivide4 = +[](const M4* m, V4* p) { m->TransformPointAndDivide(p); };
constexpr auto kDivideAll4 =
    +[](const M4* m, int32_t n, V4* p) { m->TransformPointsAndDivide(n, p); };
constexpr auto kDivideFast4 = +[](const M4* m, V4* p) { m->TransformPointAndDivideFast(p); };
constexpr auto kDivideAllFast4 =
    +[](const M4* m, int32_t n, V4* p) { m->TransformPointsAndDivideFast(n, p); };
constexpr auto kAdjoint = +[](M3* m) { m->Adjoint(); };
constexpr auto kTranspose3 = +[](M3* m) { m->Transpose(); };
constexpr auto kTranspose4 = +[](M4* m) { m->Transpose(); };
constexpr auto kProject = +[](M4* m, double d) { m->Project(d); };
constexpr auto kAdd3 = +[](M3* a, const M3& b) { *a += b; };
constexpr auto kAdd4 = +[](M4* a, const M4& b) { *a += b; };
constexpr auto kSubtract3 = +[](M3* a, const M3& b) { *a -= b; };
constexpr auto kSubtract4 = +[](M4* a, const M4& b) { *a -= b; };
constexpr auto kDropZ = +[](M3* m, const M4& from) { m->AssignFromByDroppingZ(from); };
constexpr bool (*kEqualWithin3)(const M3&, const M3&, double) = M_EqualMatrixWithinEpsilon;
constexpr bool (*kEqualWithin4)(const M4&, const M4&, double) = M_EqualMatrixWithinEpsilon;
constexpr bool (*kToScreen3)(const M4&, const M4&, const M3&, V3*) = M_TransformPoint3DtoScreen;
constexpr bool (*kToScreen2)(const M4&, const M4&, const M3&, V2*) = M_TransformPoint3DtoScreen;
constexpr auto kInPoly = M_IsFloatPointInConcavePoly<V2>;
constexpr auto kInPolyF = M_IsFloatPointInConcavePoly<F2>;
constexpr auto kQuad = +[](const V2* p, const V2* quad, unsigned char* inside) {
  return M_IsFloatPointInQuad(p, quad, inside);
};

template <auto kFunction>
Function F(const CallOptions& options = {}) {
  return Describe<kFunction>(kFunction, options);
}
template <auto kFunction>
Function InOut() {
  return F<kFunction>({.inOut = 1});
}
template <auto kFunction>
Function InOut2() {
  return F<kFunction>({.inOut = 2});
}
template <auto kFunction>
Function Batch() {
  return F<kFunction>({.inOut = 4, .count = 1, .many = 4});
}
// The status byte is permission and outcome.
template <auto kFunction>
Function Sum() {
  return F<kFunction>({.inOut = 8});
}

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

const Function kAll[] = {
    F<M_FixMul>(),
    F<M_FixDiv>(),
    F<M_Fix24Mul>(),
    F<M_Fix24Ratio>(),
    F<M_LeadingZeros>(),
    F<M_TrailingZeros>(),
    F<M_RoundUpToPowerOf2>(),
    F<M_RoundDownToPowerOf2>(),
    F<M_BitsUsed>(),
    F<M_IsTopTwoBitsSame>(),
    F<M_AddWouldOverflow>(),
    F<M_MulWouldOverflow>(),
    F<M_UMulWouldOverflow>(),
    F<M_SignedGCD>(),
    F<M_UnsignedGCD>(),
    F<M_SignedLCM>(),
    F<M_UnsignedLCM>(),
    F<M_RoundDouble>(),
    F<M_RoundDoubleSafe>(),
    F<M_RoundDouble64>(),
    F<M_fmod>(),
    F<M_ReduceRatio>({.nullable = 4}),
    Sum<M_AddRatio>(),
    Sum<M_SubRatio>(),
    Sum<M_MulRatio>(),
    Sum<M_DivRatio>(),
    F<M_RecipRatio>({.nullable = 4}),
    F<M_CompareRatio>(),
    F<M_MinRatio>(),
    F<M_MaxRatio>(),
    F<M_FpLong2Ratio>({.nullable = 2}),
    F<M_ConvRatio>({.nullable = 8, .isKept = true}),
    F<M_ShortConvRatio>(),
    F<M_ClipRatio>({.isKept = true}),
    F<M_ClipRatioToSpan>(),
    F<M_ClipSpanToSpan>(),
    F<Mp_Double2RatioSmart>(),
    F<M_SetPt>(),
    F<M_SetLPt>(),
    F<M_SetFixedPt>(),
    F<M_CopyPt>(),
    F<M_CopyLPt>(),
    F<M_CopyFixedPt>(),
    F<M_EqualPt>(),
    F<M_EqualLPt>(),
    F<M_EqualFixedPt>(),
    InOut2<M_AddPt>(),
    F<M_DeltaPoint>(),
    F<M_SetRect>(),
    F<M_SetLRect>(),
    F<M_SetFixedRect>(),
    F<M_SetWHRect>(),
    F<M_CopyRect>(),
    F<M_CopyLRect>(),
    F<M_CopyFixedRect>(),
    F<M_CopyWHRect>(),
    F<M_EqualRect>(),
    F<M_EqualLRect>(),
    F<M_EqualFixedRect>(),
    F<M_EqualWHRect>(),
    F<M_EmptyRect>(),
    F<M_EmptyLRect>(),
    F<M_EmptyFixedRect>(),
    InOut<M_InsetRect>(),
    InOut<M_InsetLRect>(),
    InOut<M_InsetFixedRect>(),
    InOut<M_OffsetRect>(),
    InOut<M_OffsetLRect>(),
    InOut<M_OffsetFixedRect>(),
    InOut2<M_CenterRect>(),
    InOut2<M_CenterLRect>(),
    InOut2<M_CenterFixedRect>(),
    F<M_PtInRect>(),
    F<M_LPtInRect>(),
    F<M_FixedPtInRect>(),
    F<M_Pt2Rect>(),
    F<M_LPt2Rect>(),
    F<M_FixedPt2Rect>(),
    F<M_PtToAngle>(),
    F<M_SectRect>({.nullable = 4}),
    F<M_SectLRect>({.nullable = 4}),
    F<M_SectFixedRect>({.nullable = 4}),
    F<M_SectFloatRect>({.nullable = 4}),
    F<M_RectCompare>(),
    F<M_LRectCompare>(),
    F<M_FixedRectCompare>(),
    F<M_FixedRect2Rect>(),
    F<M_FixedRect2LRect>(),
    F<M_FixedRect2RectIn>(),
    F<M_FixedRect2LRectIn>(),
    F<M_FixedRect2RectOut>(),
    F<M_FixedRect2LRectOut>(),
    F<M_Rect2FixedRect>(),
    F<M_LRect2FixedRect>(),
    F<M_LRect2Rect>({.isKept = true}),
    Batch<M_TransformFloatPoints>(),
    Batch<M_TransformPoints>(),
    Batch<M_TransformFixPoints>(),
    Batch<M_TransformVector3>(),
    Batch<M_TransformVector4NoDivide>(),
    Batch<M_TransformVector4>(),
    Batch<M_Transform3DFloatPoints>(),
    Batch<M_3DTransform2DPoints>(),
    F<M_TransformRect>({.inOut = 2, .nullable = 12, .many = 4}),
    F<M_TransformFloatRect>({.inOut = 2, .nullable = 12, .many = 4}),
    F<M_TransformFixRect>({.inOut = 2, .nullable = 12, .isKept = true, .many = 4}),
    F<M_TransformBounds>(),
    InOut<kNormalize>(),
    F<kDivide3>({.inOut = 2}),
    Batch<kDivideAll3>(),
    F<kDivideFast3>({.inOut = 2}),
    Batch<kDivideAllFast3>(),
    F<kDivide4>({.inOut = 2}),
    Batch<kDivideAll4>(),
    F<kDivideFast4>({.inOut = 2}),
    Batch<kDivideAllFast4>(),
    InOut<kAdjoint>(),
    InOut<kTranspose3>(),
    InOut<kTranspose4>(),
    InOut<kProject>(),
    InOut<kAdd3>(),
    InOut<kAdd4>(),
    InOut<kSubtract3>(),
    InOut<kSubtract4>(),
    F<kDropZ>(),
    F<kEqualWithin3>(),
    F<kEqualWithin4>(),
    F<M_EqualMatrix>(),
    F<M_SetIdentityMatrix>(),
    InOut<M_TranslateMatrix>(),
    InOut<M_RotateMatrix>(),
    InOut<M_ScaleMatrix>(),
    InOut2<M_ConcatMatrix>(),
    F<M_GetMatrixType>(),
    F<M_InverseMatrixQuiet>({.nullable = 4}),
    F<M_InverseMatrix>(),
    F<M_EqualMatrix4>(),
    F<M_ZeroMatrix4>(),
    F<M_IdentityMatrix4>(),
    F<M_SetMatrix4CoB>(),
    F<M_ConcatMatrix4>(),
    F<M_TransposeMatrix4>(),
    F<M_GetMatrix4Determinant>(),
    F<M_InverseMatrix4Quiet>({.nullable = 4}),
    F<M_InverseMatrix4>(),
    F<M_CalcNormalMatrix4Quiet>({.nullable = 4}),
    F<M_CalcNormalMatrix4>(),
    InOut<M_TranslateMatrix4>(),
    InOut<M_ScaleMatrix4>(),
    F<M_Matrix3ToMatrix4>(),
    F<M_Matrix3ToMatrix4Uniform>(),
    F<M_DecomposeMatrix4>({.isKept = true}),
    F<M_DecomposeMatrix4ZYX>({.isKept = true}),
    F<M_GetOrderedXYZRotationFromMatrix>(),
    InOut<M_Correct3DDecompFor2D>(),
    InOut<M_RotateMatrix4>(),
    InOut<M_RotateMatrix4XYZ>(),
    F<M_RotateMatrix4XYZPlus>({.inOut = 2}),
    F<M_ConvertAxisAngleToOrderedXYZRotation>(),
    F<M_LookAtMatrix>(),
    F<M_QuatToMatrix4>({.many = 1}),
    F<M_Matrix4ToQuat>({.many = 2}),
    F<M_Slerp>({.many = 7}),
    F<M_GetPlaneEquation>({.nullable = 8, .count = 1, .many = 1}),
    F<M_GetPlaneEquation2>(),
    F<M_RayIntersectPlane>({.nullable = 16}),
    F<M_PerpDistTo2DLine>({.nullable = 8}),
    F<M_Clip3DLine>(),
    F<M_ClipLine2Rect>({.inOut = 6}),
    F<M_ComputeDirectionalComponents>(),
    F<M_VecToAngle>(),
    F<M_Pt2Angle>(),
    F<M_TransformPtF>({.inOut = 4}),
    F<kQuad>({.many = 2}),
    F<M_SignedPolygonArea2D>({.count = 1, .many = 1}),
    F<M_IsQuadEdgeOn>({.many = 2}),
    F<kInPoly>({.count = 2, .many = 2}),
    F<kInPolyF>({.count = 2, .many = 2}),
    F<M_TransformPoint2DtoScreen>({.inOut = 4}),
    F<kToScreen3>({.inOut = 8}),
    F<kToScreen2>({.inOut = 8})};

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
