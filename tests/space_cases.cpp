// Points, rectangles, matrices and transforms.

#include "Call.h"

namespace {

using Case = std::string (*)(Arguments&);

// The long and the fixed form of an operation, which must agree.
template <Case kLong, Case kFixed>
std::string Both(Arguments& in) {
  Arguments again = in;
  const std::string text = kLong(in);
  EXPECT_EQ(kFixed(again), text);
  return text;
}

// ---------------------------------------------------------------------------------------------
// Points and rectangles
// ---------------------------------------------------------------------------------------------

// Of two rectangles: whether they are equal, whether each is empty, their relations, their
// intersection, their union and, where it is another one, their union into b.
template <class Rect, auto kSet, auto kCopy, auto kEqual, auto kEmpty, auto kSect, auto kUnion,
          auto kCompare>
std::string Rects(Arguments& in) {
  const auto given = Read<Rect>(in), b = Read<Rect>(in);
  Rect set = {}, a = {};
  EXPECT_EQ(kSet(&set, given.left, given.top, given.right, given.bottom) | kCopy(&set, &a), 0);
  EXPECT_EQ(std::memcmp(&a, &given, sizeof a), 0);
  std::string relations;
  for (uint32_t relation = 0; relation < 10; ++relation) {
    if (kCompare(relation, &a, &b)) relations += std::to_string(relation);
  }
  EXPECT_EQ(kCompare(UINT32_MAX, &a, &b), 0);
  const auto sect = InAnyPlace<Rect>(a, b, kSect);
  EXPECT_EQ(kSect(&a, &b, nullptr), sect.ends_with(" 1"));
  const auto unions = InEachPlace<Rect>(a, b, kUnion);
  EXPECT_EQ(unions[1], unions[0]) << "with the union in a";
  return Text(kEqual(&a, &b), kEmpty(&a), kEmpty(&b), relations.empty() ? "-" : relations)
      .append(sect)
      .append(unions[0])
      .append(unions[2] == unions[0] ? "" : unions[2]);
}

std::string FromFixed(Arguments& in) {
  const auto fixed = Read<M_FixedRect>(in);
  const auto convert = [&](auto toLong, auto toShort) {
    M_LRect longs = {};
    M_Rect shorts = {};
    EXPECT_EQ(toLong(&fixed, &longs) | toShort(&fixed, &shorts), 0);
    const auto low = [](int32_t edge) { return static_cast<int16_t>(edge); };
    EXPECT_EQ(ToText(shorts),
              ToText(M_Rect{low(longs.top), low(longs.left), low(longs.bottom), low(longs.right)}));
    return Text(longs);
  };
  return convert(M_FixedRect2LRect, M_FixedRect2Rect) +
         convert(M_FixedRect2LRectIn, M_FixedRect2RectIn) +
         convert(M_FixedRect2LRectOut, M_FixedRect2RectOut);
}

// ---------------------------------------------------------------------------------------------
// Matrices
// ---------------------------------------------------------------------------------------------

template <class Matrix, auto kEqual>
std::string Equal(Arguments& in) {
  const auto a = ReadMatrix<Matrix>(in), b = ReadMatrix<Matrix>(in);
  bool isEqual = false;
  const int32_t code = kEqual(&a, &b, &isEqual);
  return Text(isEqual, M_EqualMatrixWithinEpsilon(a, b, in.Double())).append(Outcome(code));
}

// The reporting form, which must do as the Quiet one does and report what that wants reported.
// After a failure the Quiet form may leave the transposed of what the other leaves.
template <class Matrix, auto kInverse, auto kQuiet, bool kIsTransposedOnFailure = false>
std::string Inverse(Arguments& in) {
  const auto m = ReadMatrix<Matrix>(in);
  const std::string text = InAnyPlace<Matrix>(
      m, m, [](const Matrix* a, const Matrix*, Matrix* out) { return kInverse(a, out); });
  for (const bool isAsked : {false, true}) {
    Matrix out = m;
    bool isReportable = isAsked && text.find(" unable") == std::string::npos;
    const int32_t code = kQuiet(&out, &out, isAsked ? &isReportable : nullptr);
    EXPECT_EQ(Outcome(code), code == 0 ? "" : " 1107");
    EXPECT_EQ(isReportable, isAsked && code != 0);
    if (kIsTransposedOnFailure && code != 0) out.Transpose();
    EXPECT_EQ(text.find(ToText(out)), 1u) << ToText(out);
  }
  return text;
}

template <class Matrix>
std::string Within(Arguments& in) {
  const auto m = ReadMatrix<Matrix>(in);
  const double eps = in.Double();
  return Text(m.IsZeroWithinEpsilon(eps), m.IsIdentityWithinEpsilon(eps));
}

template <class Matrix>
std::string AddAndTakeAway(Arguments& in) {
  const auto a = ReadMatrix<Matrix>(in), b = ReadMatrix<Matrix>(in);
  Matrix sum = a, difference = a;
  EXPECT_EQ(&(sum += b), &sum);
  EXPECT_EQ(&(difference -= b), &difference);
  return Text(sum, difference);
}

std::string Members3(Arguments& in) {
  auto m = ReadMatrix<M_Matrix3>(in), adjugate = m;
  const double determinant = m.Determinant();
  m.Transpose();
  adjugate.Adjoint();
  return Text(m, NumberText(determinant), adjugate);
}

std::string Drop(Arguments& in) {
  const auto m4 = ReadMatrix<M_Matrix4>(in);
  const int row = in.Int();
  M_Matrix3 m = {}, withoutZ = {};
  m.AssignFromByDroppingIndices(m4, row, in.Int());
  withoutZ.AssignFromByDroppingZ(m4);
  return Text(m, ToText(m) == ToText(withoutZ) ? "Z" : "-");
}

std::string Project(Arguments& in) {
  auto m = ReadMatrix<M_Matrix4>(in);
  m.Project(in.Double());
  return Text(m);
}

std::string Normalize(Arguments& in) {
  auto v = Read<M_Vector4T<double>>(in);
  const std::string outcome = Thrown([&] { v.Normalize(); });
  return Text(v).append(outcome);
}

// One point by the singular members, several by the plural ones; the Fast ones do the same as far
// as the others come.
template <class Matrix, class Point>
std::string Divide(Arguments& in) {
  const auto m = ReadMatrix<Matrix>(in);
  auto points = ReadAll<Point>(in), fast = points;
  const int count = static_cast<int>(points.size());
  const std::string outcome = Thrown([&] {
    count == 1 ? m.TransformPointAndDivide(points.data())
               : m.TransformPointsAndDivide(count, points.data());
  });
  count == 1 ? m.TransformPointAndDivideFast(fast.data())
             : m.TransformPointsAndDivideFast(count, fast.data());
  if (outcome.empty()) {
    EXPECT_EQ(TextOfAll(fast), TextOfAll(points));
  }
  EXPECT_EQ(Thrown([&] { m.TransformPointsAndDivide(0, nullptr); }), "");
  EXPECT_EQ(Thrown([&] { m.TransformPointsAndDivide(-1, nullptr); }), "");
  m.TransformPointsAndDivideFast(-1, nullptr);
  return TextOfAll(points).append(outcome);
}

// ---------------------------------------------------------------------------------------------
// Transforms
// ---------------------------------------------------------------------------------------------

template <class Matrix, class Point, auto kTransform>
std::string Transform(Arguments& in) {
  const auto m = ReadMatrix<Matrix>(in);
  auto points = ReadAll<Point>(in);
  EXPECT_EQ(kTransform(&m, 0, points.data()) | kTransform(&m, -1, points.data()), 0);
  const int32_t code = kTransform(&m, static_cast<int32_t>(points.size()), points.data());
  return TextOfAll(points).append(Outcome(code));
}

template <class Rect, class Corner, auto kTransform>
std::string TransformRect(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix3>(in);
  auto r = Read<Rect>(in), plain = r;
  std::array<Corner, 4> corners = {};
  unsigned char isBoundingBox = 9;
  int32_t code = kTransform(&m, &r, corners.data(), &isBoundingBox);
  const std::string outcome = Outcome(code);
  code = kTransform(&m, &plain, nullptr, nullptr);
  EXPECT_EQ(Text(plain).append(Outcome(code)), Text(r).append(outcome));
  return Text(r).append(TextOfAll(corners)).append(Text(isBoundingBox)).append(outcome);
}

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;

constexpr CallOptions kFirstInOut = {.inOut = 1};
constexpr CallOptions kSecondInOut = {.inOut = 2};

const Operation kOperations[] = {
    {"SetPt", Call<M_SetPt>},
    {"SetLPt", Both<Call<M_SetLPt>, Call<M_SetFixedPt>>},
    {"CopyPt", Call<M_CopyPt>},
    {"CopyLPt", Both<Call<M_CopyLPt>, Call<M_CopyFixedPt>>},
    {"EqualPt", Call<M_EqualPt>},
    {"EqualLPt", Both<Call<M_EqualLPt>, Call<M_EqualFixedPt>>},
    {"Pt2Rect", Call<M_Pt2Rect>},
    {"LPt2Rect", Both<Call<M_LPt2Rect>, Call<M_FixedPt2Rect>>},
    {"AddPt", Call<M_AddPt, kSecondInOut>},
    {"DeltaPoint", Call<M_DeltaPoint>},
    {"PtInRect", Call<M_PtInRect>},
    {"LPtInRect", Both<Call<M_LPtInRect>, Call<M_FixedPtInRect>>},
    {"PtToAngle", Call<M_PtToAngle>},
    {"InsetRect", Call<M_InsetRect, kFirstInOut>},
    {"InsetLRect", Both<Call<M_InsetLRect, kFirstInOut>, Call<M_InsetFixedRect, kFirstInOut>>},
    {"OffsetRect", Call<M_OffsetRect, kFirstInOut>},
    {"OffsetLRect", Both<Call<M_OffsetLRect, kFirstInOut>, Call<M_OffsetFixedRect, kFirstInOut>>},
    {"CenterRect", Call<M_CenterRect, kSecondInOut>},
    {"CenterLRect", Both<Call<M_CenterLRect, kSecondInOut>, Call<M_CenterFixedRect, kSecondInOut>>},
    {"Rects", Rects<M_Rect, M_SetRect, M_CopyRect, M_EqualRect, M_EmptyRect, M_SectRect,
                    M_UnionRect, M_RectCompare>},
    {"LRects",
     Both<Rects<M_LRect, M_SetLRect, M_CopyLRect, M_EqualLRect, M_EmptyLRect, M_SectLRect,
                M_UnionLRect, M_LRectCompare>,
          Rects<M_FixedRect, M_SetFixedRect, M_CopyFixedRect, M_EqualFixedRect, M_EmptyFixedRect,
                M_SectFixedRect, M_UnionFixedRect, M_FixedRectCompare>>},
    {"SectFloatRect", Call<M_SectFloatRect, CallOptions{.nullable = 4}>},
    {"FromFixed", FromFixed},
    {"Rect2FixedRect", Call<M_Rect2FixedRect>},
    {"LRect2FixedRect", Call<M_LRect2FixedRect>},
    {"LRect2Rect", Call<M_LRect2Rect>},
    {"SetWHRect", Call<M_SetWHRect>},
    {"CopyWHRect", Call<M_CopyWHRect>},
    {"EqualWHRect", Call<M_EqualWHRect>},
    {"SetIdentityMatrix", Call<M_SetIdentityMatrix>},
    {"ZeroMatrix4", Call<M_ZeroMatrix4>},
    {"IdentityMatrix4", Call<M_IdentityMatrix4>},
    {"EqualMatrix", Equal<M_Matrix3, M_EqualMatrix>},
    {"EqualMatrix4", Equal<M_Matrix4, M_EqualMatrix4>},
    {"TranslateMatrix", Call<M_TranslateMatrix, kFirstInOut>},
    {"RotateMatrix", Call<M_RotateMatrix, kFirstInOut>},
    {"ScaleMatrix", Call<M_ScaleMatrix, kFirstInOut>},
    {"TranslateMatrix4", Call<M_TranslateMatrix4, kFirstInOut>},
    {"ScaleMatrix4", Call<M_ScaleMatrix4, kFirstInOut>},
    {"ConcatMatrix", Call<M_ConcatMatrix, kSecondInOut>},
    {"ConcatMatrix4", Call<M_ConcatMatrix4>},
    {"GetMatrixType", Call<M_GetMatrixType>},
    {"TransposeMatrix4", Call<M_TransposeMatrix4>},
    {"GetMatrix4Determinant", Call<M_GetMatrix4Determinant>},
    {"Matrix3ToMatrix4", Call<M_Matrix3ToMatrix4>},
    {"Matrix3ToMatrix4Uniform", Call<M_Matrix3ToMatrix4Uniform>},
    {"SetMatrix4CoB", Call<M_SetMatrix4CoB>},
    {"InverseMatrix", Inverse<M_Matrix3, M_InverseMatrix, M_InverseMatrixQuiet>},
    {"InverseMatrix4", Inverse<M_Matrix4, M_InverseMatrix4, M_InverseMatrix4Quiet>},
    {"CalcNormalMatrix4", Inverse<M_Matrix4, M_CalcNormalMatrix4, M_CalcNormalMatrix4Quiet, true>},
    {"IsWithinEpsilon", Within<M_Matrix3>},
    {"IsWithinEpsilon4", Within<M_Matrix4>},
    {"IsFinite", [](Arguments& in) { return Text(ReadMatrix<M_Matrix4>(in).IsFinite()); }},
    {"AddAndTakeAway", AddAndTakeAway<M_Matrix3>},
    {"AddAndTakeAway4", AddAndTakeAway<M_Matrix4>},
    {"TransposeDeterminantAdjoint", Members3},
    {"DropIndices", Drop},
    {"Project", Project},
    {"Normalize", Normalize},
    {"TransformAndDivide", Divide<M_Matrix3, V3>},
    {"TransformAndDivide4", Divide<M_Matrix4, V4>},
    {"TransformFloatPoints", Transform<M_Matrix3, V2, M_TransformFloatPoints>},
    {"TransformPoints", Transform<M_Matrix3, M_Point, M_TransformPoints>},
    {"TransformFixPoints", Transform<M_Matrix3, M_FixedPoint, M_TransformFixPoints>},
    {"TransformVector3", Transform<M_Matrix3, V3, M_TransformVector3>},
    {"TransformVector4NoDivide", Transform<M_Matrix4, V4, M_TransformVector4NoDivide>},
    {"TransformVector4", Transform<M_Matrix4, V4, M_TransformVector4>},
    {"Transform3DFloatPoints", Transform<M_Matrix4, V3, M_Transform3DFloatPoints>},
    {"3DTransform2DPoints", Transform<M_Matrix4, M_Point, M_3DTransform2DPoints>},
    {"TransformRect", TransformRect<M_Rect, V2, M_TransformRect>},
    {"TransformFloatRect", TransformRect<M_FloatRect, V2, M_TransformFloatRect>},
    {"TransformFixRect", TransformRect<M_FixedRect, M_FixedPoint, M_TransformFixRect>},
    {"TransformBounds", Call<M_TransformBounds>},
};

}  // namespace
