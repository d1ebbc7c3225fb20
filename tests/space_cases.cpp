// Points, rectangles, matrices and transforms.

#include "SpaceText.h"

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

template <class Point, class Rect, auto kSet, auto kCopy, auto kEqual, auto kSpan>
std::string Points(Arguments& in) {
  const auto given = Read<Point>(in);
  const auto b = Read<Point>(in);
  Point set, a;
  Rect r;
  const int32_t code = kSet(&set, given.h, given.v) | kCopy(&set, &a) | kSpan(&a, &b, &r);
  EXPECT_EQ(std::memcmp(&a, &given, sizeof a), 0);
  return Text(kEqual(&a, &b), r).append(Outcome(code));
}

std::string AddAndSubtract(Arguments& in) {
  const auto a = Read<M_Point>(in);
  auto b = Read<M_Point>(in);
  const int64_t delta = M_DeltaPoint(a, b);
  const int32_t code = M_AddPt(a, &b);
  return Text(b, delta).append(Outcome(code));
}

template <class Point, class Rect, auto kInside>
std::string Inside(Arguments& in) {
  const auto pt = Read<Point>(in);
  const auto r = Read<Rect>(in);
  return Text(kInside(&pt, &r));
}

std::string Angle(Arguments& in) {
  const auto r = Read<M_Rect>(in);
  int16_t angle = 999;
  const int32_t code = M_PtToAngle(&r, Read<M_Point>(in), &angle);
  return Text(angle).append(Outcome(code));
}

template <class Rect, auto kMove>
std::string Move(Arguments& in) {
  auto r = Read<Rect>(in);
  const auto by = Read<std::conditional_t<sizeof(Rect) == 8, M_Point, M_LPoint>>(in);
  const int32_t code = kMove(&r, by.h, by.v);
  return Text(r).append(Outcome(code));
}

template <class Rect, auto kCenter>
std::string Center(Arguments& in) {
  const auto container = Read<Rect>(in);
  auto r = Read<Rect>(in), own = r;
  const int32_t code = kCenter(&container, &r) | kCenter(&own, &own);
  return Text(r).append(Outcome(code));
}

// Of two rectangles: whether they are equal, whether each is empty, their relations, their
// intersection, their union and, where it is another one, their union into b.
template <class Rect, auto kSet, auto kCopy, auto kEqual, auto kEmpty, auto kSect, auto kUnion,
          auto kCompare>
std::string Rects(Arguments& in) {
  const auto given = Read<Rect>(in), b = Read<Rect>(in);
  Rect set, a;
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

std::string FloatRects(Arguments& in) {
  const auto a = Read<M_FloatRect>(in), b = Read<M_FloatRect>(in);
  const std::string text = InAnyPlace<M_FloatRect>(a, b, M_SectFloatRect);
  EXPECT_EQ(M_SectFloatRect(&a, &b, nullptr), text.ends_with(" 1"));
  return text;
}

std::string FromFixed(Arguments& in) {
  const auto fixed = Read<M_FixedRect>(in);
  const auto convert = [&](auto toLong, auto toShort) {
    M_LRect longs;
    M_Rect shorts;
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

template <class From, class To, auto kConvert>
std::string Convert(Arguments& in) {
  const auto from = Read<From>(in);
  To to;
  std::memset(&to, 0x11, sizeof to);
  const int32_t code = kConvert(&from, &to);
  return Text(to).append(Outcome(code));
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

// A matrix to which something is appended, by up to four numbers.
template <class Matrix, auto kAppend>
std::string Append(Arguments& in) {
  auto m = ReadMatrix<Matrix>(in);
  int32_t code = 99;
  const double a = in.Double(), b = in.Double();
  if constexpr (requires { kAppend(&m, a, b); }) {
    code = kAppend(&m, a, b);
  } else if constexpr (requires { kAppend(&m, a, b, a); }) {
    code = kAppend(&m, a, b, in.Double());
  } else {
    const double c = in.Double();
    code = kAppend(&m, a, b, c, in.Double());
  }
  return Text(m).append(Outcome(code));
}

std::string Concat3(Arguments& in) {
  const auto a = ReadMatrix<M_Matrix3>(in);
  auto b = ReadMatrix<M_Matrix3>(in), square = a, product = a;
  const int32_t code =
      M_ConcatMatrix(&a, &b) | M_ConcatMatrix(&square, &square) | M_ConcatMatrix(&a, &product);
  EXPECT_EQ(ToText(square), ToText(product));
  return Text(b).append(Outcome(code));
}

std::string Concat4(Arguments& in) {
  const auto a = ReadMatrix<M_Matrix4>(in);
  return InAnyPlace<M_Matrix4>(a, ReadMatrix<M_Matrix4>(in), M_ConcatMatrix4);
}

std::string Type(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix3>(in);
  uint32_t type = 99;
  const int32_t code = M_GetMatrixType(&m, &type);
  return Text(type).append(Outcome(code));
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

std::string Quad(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix4>(in);
  double determinant = 99;
  M_Matrix4 transposed = m;
  transposed.Transpose();
  const std::string text =
      InAnyPlace<M_Matrix4>(m, m, [](const M_Matrix4* a, const M_Matrix4*, M_Matrix4* out) {
        return M_TransposeMatrix4(a, out);
      });
  EXPECT_EQ(text, Text(transposed));
  const int32_t code = M_GetMatrix4Determinant(&m, &determinant);
  return text + Text(NumberText(determinant)).append(Outcome(code));
}

std::string Widen(Arguments& in) {
  const auto m3 = ReadMatrix<M_Matrix3>(in);
  M_Matrix4 plain, uniform;
  const int32_t code = M_Matrix3ToMatrix4(&m3, &plain) | M_Matrix3ToMatrix4Uniform(&m3, &uniform);
  const double z = std::exchange(uniform.m[2][2], 1.0);
  EXPECT_EQ(ToText(uniform), ToText(plain));
  return Text(plain, NumberText(z)).append(Outcome(code));
}

std::string ChangeOfBasis(Arguments& in) {
  const auto u = Read<M_Vector3T<double>>(in), v = Read<M_Vector3T<double>>(in);
  const auto w = Read<M_Vector3T<double>>(in);
  M_Matrix4 m;
  const int32_t code = M_SetMatrix4CoB(&u, &v, &w, &m);
  return Text(m).append(Outcome(code));
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

std::string Thrown(const std::function<void()>& call) {
  try {
    call();
  } catch (int code) {
    return Outcome(code);
  }
  return Outcome(0);
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

std::string TransformBounds(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix3>(in);
  return Text(M_TransformBounds(m, Read<M_LRect>(in)));
}

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;

const Operation kOperations[] = {
    {"Points", Points<M_Point, M_Rect, M_SetPt, M_CopyPt, M_EqualPt, M_Pt2Rect>},
    {"LPoints", Both<Points<M_LPoint, M_LRect, M_SetLPt, M_CopyLPt, M_EqualLPt, M_LPt2Rect>,
                     Points<M_FixedPoint, M_FixedRect, M_SetFixedPt, M_CopyFixedPt, M_EqualFixedPt,
                            M_FixedPt2Rect>>},
    {"AddPtAndDeltaPoint", AddAndSubtract},
    {"PtInRect", Inside<M_Point, M_Rect, M_PtInRect>},
    {"LPtInRect", Both<Inside<M_LPoint, M_LRect, M_LPtInRect>,
                       Inside<M_FixedPoint, M_FixedRect, M_FixedPtInRect>>},
    {"PtToAngle", Angle},
    {"InsetRect", Move<M_Rect, M_InsetRect>},
    {"InsetLRect", Both<Move<M_LRect, M_InsetLRect>, Move<M_FixedRect, M_InsetFixedRect>>},
    {"OffsetRect", Move<M_Rect, M_OffsetRect>},
    {"OffsetLRect", Both<Move<M_LRect, M_OffsetLRect>, Move<M_FixedRect, M_OffsetFixedRect>>},
    {"CenterRect", Center<M_Rect, M_CenterRect>},
    {"CenterLRect", Both<Center<M_LRect, M_CenterLRect>, Center<M_FixedRect, M_CenterFixedRect>>},
    {"Rects", Rects<M_Rect, M_SetRect, M_CopyRect, M_EqualRect, M_EmptyRect, M_SectRect,
                    M_UnionRect, M_RectCompare>},
    {"LRects",
     Both<Rects<M_LRect, M_SetLRect, M_CopyLRect, M_EqualLRect, M_EmptyLRect, M_SectLRect,
                M_UnionLRect, M_LRectCompare>,
          Rects<M_FixedRect, M_SetFixedRect, M_CopyFixedRect, M_EqualFixedRect, M_EmptyFixedRect,
                M_SectFixedRect, M_UnionFixedRect, M_FixedRectCompare>>},
    {"FloatRects", FloatRects},
    {"FromFixed", FromFixed},
    {"Rect2FixedRect", Convert<M_Rect, M_FixedRect, M_Rect2FixedRect>},
    {"LRect2FixedRect", Convert<M_LRect, M_FixedRect, M_LRect2FixedRect>},
    {"LRect2Rect", Convert<M_LRect, M_Rect, M_LRect2Rect>},
    {"EqualMatrix", Equal<M_Matrix3, M_EqualMatrix>},
    {"EqualMatrix4", Equal<M_Matrix4, M_EqualMatrix4>},
    {"TranslateMatrix", Append<M_Matrix3, M_TranslateMatrix>},
    {"RotateMatrix", Append<M_Matrix3, M_RotateMatrix>},
    {"ScaleMatrix", Append<M_Matrix3, M_ScaleMatrix>},
    {"TranslateMatrix4", Append<M_Matrix4, M_TranslateMatrix4>},
    {"ScaleMatrix4", Append<M_Matrix4, M_ScaleMatrix4>},
    {"ConcatMatrix", Concat3},
    {"ConcatMatrix4", Concat4},
    {"GetMatrixType", Type},
    {"InverseMatrix", Inverse<M_Matrix3, M_InverseMatrix, M_InverseMatrixQuiet>},
    {"InverseMatrix4", Inverse<M_Matrix4, M_InverseMatrix4, M_InverseMatrix4Quiet>},
    {"CalcNormalMatrix4", Inverse<M_Matrix4, M_CalcNormalMatrix4, M_CalcNormalMatrix4Quiet, true>},
    {"TransposeAndDeterminant4", Quad},
    {"Matrix3ToMatrix4", Widen},
    {"SetMatrix4CoB", ChangeOfBasis},
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
    {"TransformBounds", TransformBounds},
};

}  // namespace
