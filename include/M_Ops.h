/// \file
/// Operators, exact frames and ranges for what the other headers declare: for C++20, with
/// exceptions, and on top of them. A client need not use it, and links nothing else for it.
///
/// Where a function of the library does the same, an operator is a call of it: so its results are
/// the library's, to the bit, whatever a client is compiled with. What reports an error there does
/// so here, and then throws its code as an `int`. For the same reason there is no arithmetic of
/// vectors: it would be compiled with a client's flags.
//
// Contents
//   Ratios      + - * / == <=> std::hash M_RatioOf M_ParseRatio M_ToChars << std::formatter _ratio
//   Frames      M_FrameAt M_TimeOfFrame M_SnapToFrame
//   Rectangles  == & | M_IsEmpty M_Contains M_ToRect M_ToLRect M_ToFixedRect
//   Matrices    == * M_Inverse M_Transform

#ifndef M_OPS_H
#define M_OPS_H

#if __cplusplus < 202002L
#error "M_Ops.h is for C++20"
#endif

#include <algorithm>
#include <charconv>
#include <compare>
#include <concepts>
#include <cstdint>
#include <functional>
#include <limits>
#include <numeric>
#include <optional>
#include <ostream>
#include <span>
#include <string_view>
#include <type_traits>
#include <utility>
#include <version>
#ifdef __cpp_lib_format
#include <format>
#endif

#include "M_Matrix.h"
#include "M_Rect.h"
#include "M_Utils.h"

/// How what is no whole number becomes one.
enum class M_Rounding {
  Floor,    ///< Downwards.
  Nearest,  ///< To the nearest, halves upwards, as M_RoundDouble().
  Ceiling,  ///< Upwards.
};

// What the operators are made of, and nobody else's.
namespace M_OpsDetail {

constexpr uint64_t Magnitude(int64_t i) {
  return i < 0 ? 0 - static_cast<uint64_t>(i) : static_cast<uint64_t>(i);
}

// An exact result on its way back into 32 bits.
struct Exact {
  bool isNegative;
  uint64_t num, den;

  // In lowest terms, if it fits.
  constexpr std::optional<M_Ratio> ToRatio() const {
    const uint64_t gcd = std::gcd(num, den), n = num / gcd, d = den / gcd;
    constexpr uint64_t kMost = std::numeric_limits<int32_t>::max();
    if (n > kMost + isNegative || d > std::numeric_limits<uint32_t>::max()) return {};
    return M_Ratio{static_cast<int32_t>(isNegative ? 0 - n : n), static_cast<uint32_t>(d)};
  }
};

// a + b, or a - b.
template <bool kIsDifference>
constexpr Exact Sum(const M_Ratio& a, const M_Ratio& b) {
  const uint64_t x = Magnitude(a.num) * b.den, y = Magnitude(b.num) * a.den;
  const bool isXNegative = a.num < 0, isYNegative = (b.num < 0) != kIsDifference;
  const uint64_t den = uint64_t{a.den} * b.den;
  if (isXNegative == isYNegative) return {isXNegative, x + y, den};
  return {x < y ? isYNegative : isXNegative, std::max(x, y) - std::min(x, y), den};
}

constexpr Exact Product(const M_Ratio& a, const M_Ratio& b) {
  return {(a.num < 0) != (b.num < 0), Magnitude(a.num) * Magnitude(b.num), uint64_t{a.den} * b.den};
}

constexpr Exact Quotient(const M_Ratio& a, const M_Ratio& b) {
  return {(a.num < 0) != (b.num < 0), Magnitude(a.num) * b.den, Magnitude(b.num) * a.den};
}

using Operation = int32_t(const M_Ratio*, const M_Ratio*, M_Ratio*, unsigned char*);

// Reports and throws what an operation does when it overflows.
[[noreturn]] inline void FailAs(Operation* operation) {
  constexpr int32_t kLeast = std::numeric_limits<int32_t>::min(), kMost = -(kLeast + 1);
  const M_Ratio least = {kLeast, 1}, most = {kMost, 1}, small = {1, kMost};
  M_Ratio out;
  throw int{operation(&least,
                      operation == M_AddRatio   ? &least
                      : operation == M_DivRatio ? &small
                                                : &most,
                      &out, nullptr)};
}

// Reports and throws what an operation does for a zero denominator.
[[noreturn]] inline void FailZeroDenominator(Operation* operation) {
  const M_Ratio none = {1, 0}, one = {1, 1};
  M_Ratio out;
  throw int{(operation == M_DivRatio ? M_MulRatio : operation)(&none, &one, &out, nullptr)};
}

using Exactly = Exact(const M_Ratio&, const M_Ratio&);

constexpr M_Ratio CalculateExactly(Operation* operation, const M_Ratio& a, const M_Ratio& b,
                                   Exactly* exactly) {
  const Exact exact = exactly(a, b);
  if (exact.den == 0 || b.den == 0) FailZeroDenominator(operation);
  const std::optional<M_Ratio> ratio = exact.ToRatio();
  if (!ratio) FailAs(operation);
  return *ratio;
}

// An operation by the library, if it is to be asked and knows, else exactly.
constexpr M_Ratio Calculate(Operation* operation, bool isAsked, const M_Ratio& a, const M_Ratio& b,
                            Exactly* exactly) {
  if (!std::is_constant_evaluated() && isAsked) {
    M_Ratio out;
    unsigned char status = 0;
    const int32_t code = operation(&a, &b, &out, &status);
    if ((code | status) == 0) return out;
    if (code != 0) throw int{code};
  }
  return CalculateExactly(operation, a, b, exactly);
}

inline void ThrowOnError(int32_t code) {
  if (code != 0) throw int{code};
}

}  // namespace M_OpsDetail

// ---------------------------------------------------------------------------------------------
/// \defgroup ratio_operators Operators of ratios
/// By value: exact wherever the result fits in lowest terms, also where the library's prediction is
/// too careful; an overflow, which is reported and thrown, only where it does not. What comes from
/// the library is as it gives it, all else in lowest terms, as is what the compiler computes.
/// \par Example
/// \include ratio_operators.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// The sum; see M_AddRatio().
constexpr M_Ratio operator+(const M_Ratio& a, const M_Ratio& b) {
  return M_OpsDetail::Calculate(M_AddRatio, true, a, b, M_OpsDetail::Sum<false>);
}

/// The difference; see M_SubRatio(), of which it has no quirk.
constexpr M_Ratio operator-(const M_Ratio& a, const M_Ratio& b) {
  // The library takes -2^31 for its own negative.
  const bool isAsked = b.num != std::numeric_limits<int32_t>::min();
  return M_OpsDetail::Calculate(M_SubRatio, isAsked, a, b, M_OpsDetail::Sum<true>);
}

/// The product; see M_MulRatio().
constexpr M_Ratio operator*(const M_Ratio& a, const M_Ratio& b) {
  return M_OpsDetail::Calculate(M_MulRatio, true, a, b, M_OpsDetail::Product);
}

/// The quotient; see M_DivRatio(), of which it has no quirk: a negative or a large divisor is as
/// good as any, and one without a den none. Zero divisors are reported as zero denominators.
constexpr M_Ratio operator/(const M_Ratio& a, const M_Ratio& b) {
  // The library takes the sign of a divisor's num for a bit of a den, and halves large ones.
  const bool isAsked = b.num > 0 && b.den - 1 < 0x7FFFFFFF;
  return M_OpsDetail::Calculate(M_DivRatio, isAsked, a, b, M_OpsDetail::Quotient);
}

/// The negative. That of -2^31 over an odd den is an overflow, as of a difference.
constexpr M_Ratio operator-(const M_Ratio& r) {
  if (r.num != std::numeric_limits<int32_t>::min()) return {-r.num, r.den};
  return M_Ratio{0, 1} - r;
}

/// As a + b. After a failure a is what it was, here and below.
constexpr M_Ratio& operator+=(M_Ratio& a, const M_Ratio& b) { return a = a + b; }
/// As a - b.
constexpr M_Ratio& operator-=(M_Ratio& a, const M_Ratio& b) { return a = a - b; }
/// As a * b.
constexpr M_Ratio& operator*=(M_Ratio& a, const M_Ratio& b) { return a = a * b; }
/// As a / b.
constexpr M_Ratio& operator/=(M_Ratio& a, const M_Ratio& b) { return a = a / b; }

/// By exact value, unlike M_CompareRatio(). A ratio with a den of 0 is no number: it equals
/// nothing, not even itself, and has no order.
constexpr std::partial_ordering operator<=>(const M_Ratio& a, const M_Ratio& b) {
  if (a.den == 0 || b.den == 0) return std::partial_ordering::unordered;
  return int64_t{a.num} * b.den <=> int64_t{b.num} * a.den;
}
/// Whether both are the same number.
constexpr bool operator==(const M_Ratio& a, const M_Ratio& b) {
  return (a <=> b) == std::partial_ordering::equivalent;
}

/// \cond
// Equal ratios have the same.
template <>
struct std::hash<M_Ratio> {
  size_t operator()(const M_Ratio& r) const noexcept {
    const auto gcd =
        std::max<uint64_t>(std::gcd(M_OpsDetail::Magnitude(r.num), uint64_t{r.den}), 1);
    const auto num = static_cast<uint64_t>(r.num / static_cast<int64_t>(gcd));
    return std::hash<uint64_t>()((num << 32 | num >> 32) ^ r.den / gcd);
  }
};
/// \endcond

/// A whole number. One that does not fit is an overflow, as of a product.
constexpr M_Ratio M_RatioOf(std::integral auto whole) {
  if (!std::in_range<int32_t>(whole)) M_OpsDetail::FailAs(M_MulRatio);
  return {static_cast<int32_t>(whole), 1};
}

/// The ratio that a text is from beginning to end: "30000/1001", as it stands; "25"; or "23.976",
/// exactly and in lowest terms. A sign may come first. Nothing for any other text, a den of 0, more
/// than 19 digits, and what does not fit.
constexpr std::optional<M_Ratio> M_ParseRatio(std::string_view text) {
  const bool isNegative = !text.empty() && text[0] == '-';
  if (isNegative || (!text.empty() && text[0] == '+')) text.remove_prefix(1);
  // 19 digits fit, whatever they are.
  uint64_t parts[2] = {0, 0}, scale = 1;
  size_t digits[2] = {0, 0};
  char separator = 0;
  for (const char c : text) {
    if ((c == '/' || c == '.') && separator == 0) {
      separator = c;
      continue;
    }
    const int part = separator == '/';
    if (c < '0' || c > '9' || ++digits[separator != 0] > 19 ||
        (separator == '.' && digits[0] + digits[1] > 19)) {
      return {};
    }
    parts[part] = parts[part] * 10 + static_cast<uint64_t>(c - '0');
    if (separator == '.') scale *= 10;
  }
  if (digits[0] == 0 || (separator != 0 && digits[1] == 0)) return {};
  if (separator != '/') return M_OpsDetail::Exact{isNegative, parts[0], scale}.ToRatio();
  constexpr uint64_t kMost = std::numeric_limits<int32_t>::max();
  if (parts[0] > kMost + isNegative || parts[1] == 0 ||
      parts[1] > std::numeric_limits<uint32_t>::max()) {
    return {};
  }
  return M_Ratio{static_cast<int32_t>(isNegative ? 0 - parts[0] : parts[0]),
                 static_cast<uint32_t>(parts[1])};
}

/// "30000/1001"_ratio, as M_ParseRatio(); where that gives nothing it does not compile.
consteval M_Ratio operator""_ratio(const char* text, size_t size) {
  return M_ParseRatio(std::string_view(text, size)).value();
}

/// Writes "30000/1001", or "25" where den is 1; M_ParseRatio() reads it back. As std::to_chars().
/// 22 chars are enough.
inline std::to_chars_result M_ToChars(char* first, char* last, const M_Ratio& r) {
  std::to_chars_result end = std::to_chars(first, last, r.num);
  if (end.ec != std::errc() || r.den == 1) return end;
  if (end.ptr == last) return {last, std::errc::value_too_large};
  *end.ptr = '/';
  return std::to_chars(end.ptr + 1, last, r.den);
}

namespace M_OpsDetail {

struct Text {
  char chars[22];
  size_t size;

  explicit Text(const M_Ratio& r)
      : size(static_cast<size_t>(M_ToChars(chars, std::end(chars), r).ptr - chars)) {}
  std::string_view View() const { return {chars, size}; }
};

}  // namespace M_OpsDetail

/// As M_ToChars() writes it.
inline std::ostream& operator<<(std::ostream& os, const M_Ratio& r) {
  return os << M_OpsDetail::Text(r).View();
}

#ifdef __cpp_lib_format
/// As M_ToChars() writes it, with what may be asked of a text.
template <>
struct std::formatter<M_Ratio> : std::formatter<std::string_view> {
  auto format(const M_Ratio& r, std::format_context& context) const {
    return std::formatter<std::string_view>::format(M_OpsDetail::Text(r).View(), context);
  }
};
#endif
/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup frames From times to frames
/// Times are in seconds, rates in frames a second. Frame 0 begins at time 0. A zero denominator is
/// reported as of a product, and its code thrown.
/// \par Example
/// \include frames.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// The frame at a time, exactly: downwards, the frame that is shown then. Always fits.
constexpr int64_t M_FrameAt(const M_Ratio& time, const M_Ratio& rate,
                            M_Rounding rounding = M_Rounding::Floor) {
  const M_OpsDetail::Exact frames = M_OpsDetail::Product(time, rate);
  if (frames.den == 0) M_OpsDetail::FailZeroDenominator(M_MulRatio);
  auto frame = static_cast<int64_t>(frames.num / frames.den);
  uint64_t rest = frames.num % frames.den;
  if (frames.isNegative) {
    frame = -frame - (rest != 0);
    rest = rest == 0 ? 0 : frames.den - rest;
  }
  const bool isUp = rounding == M_Rounding::Ceiling   ? rest != 0
                    : rounding == M_Rounding::Nearest ? rest >= frames.den - rest
                                                      : false;
  return frame + isUp;
}

/// When a frame begins, in lowest terms. What does not fit is an overflow, and a rate of 0 a zero
/// denominator, as of a quotient.
constexpr M_Ratio M_TimeOfFrame(int64_t frame, const M_Ratio& rate) {
  using M_OpsDetail::Magnitude;
  if (rate.num == 0 || rate.den == 0) M_OpsDetail::FailZeroDenominator(M_DivRatio);
  const uint64_t shared = std::gcd(Magnitude(frame), Magnitude(rate.num));
  const uint64_t count = Magnitude(frame) / shared, den = Magnitude(rate.num) / shared;
  // A count that is longer cannot become a num.
  if (count > std::numeric_limits<uint32_t>::max()) M_OpsDetail::FailAs(M_DivRatio);
  const M_OpsDetail::Exact exact = {(frame < 0) != (rate.num < 0), count * rate.den, den};
  const std::optional<M_Ratio> time = exact.ToRatio();
  if (!time) M_OpsDetail::FailAs(M_DivRatio);
  return *time;
}

/// The beginning of the frame at a time.
constexpr M_Ratio M_SnapToFrame(const M_Ratio& time, const M_Ratio& rate,
                                M_Rounding rounding = M_Rounding::Floor) {
  return M_TimeOfFrame(M_FrameAt(time, rate, rounding), rate);
}
/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup rectangle_operators Operators of points and rectangles
/// \par Example
/// \include rectangle_operators.cpp
/// \{
// ---------------------------------------------------------------------------------------------

namespace M_OpsDetail {

// What a rectangle's corners are, and the functions of its width.
template <class Rect>
struct Width;
template <>
struct Width<M_Rect> {
  using Point = M_Point;
  static constexpr auto kSect = M_SectRect, kUnion = M_UnionRect;
};
template <>
struct Width<M_LRect> {
  using Point = M_LPoint;
  static constexpr auto kSect = M_SectLRect, kUnion = M_UnionLRect;
};
template <>
struct Width<M_FixedRect> {
  using Point = M_FixedPoint;
  static constexpr auto kSect = M_SectFixedRect, kUnion = M_UnionFixedRect;
};
template <class T>
concept AnyRect = requires {
  typename Width<T>::Point;
};
template <class T>
concept AnyPoint =
    std::same_as<T, M_Point> || std::same_as<T, M_LPoint> || std::same_as<T, M_FixedPoint>;

}  // namespace M_OpsDetail

/// As M_EqualPt() and its like.
template <M_OpsDetail::AnyPoint Point>
constexpr bool operator==(const Point& a, const Point& b) {
  return a.h == b.h && a.v == b.v;
}

/// As M_EmptyRect() and its like.
template <M_OpsDetail::AnyRect Rect>
constexpr bool M_IsEmpty(const Rect& r) {
  return r.right <= r.left || r.bottom <= r.top;
}

/// As M_EqualRect() and its like: empty rectangles are equal wherever they are.
template <M_OpsDetail::AnyRect Rect>
constexpr bool operator==(const Rect& a, const Rect& b) {
  return (M_IsEmpty(a) && M_IsEmpty(b)) ||
         (a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom);
}

/// As M_PtInRect() and its like: left and top edges belong to a rectangle, right and bottom ones do
/// not.
template <M_OpsDetail::AnyRect Rect>
constexpr bool M_Contains(const Rect& r, const typename M_OpsDetail::Width<Rect>::Point& p) {
  return r.left <= p.h && p.h < r.right && r.top <= p.v && p.v < r.bottom;
}

/// What two rectangles share; all 0 if nothing. See M_SectRect() and its like.
template <M_OpsDetail::AnyRect Rect>
constexpr Rect operator&(const Rect& a, const Rect& b) {
  Rect out = {};
  if (!std::is_constant_evaluated()) {
    M_OpsDetail::Width<Rect>::kSect(&a, &b, &out);
    return out;
  }
  out.left = std::max(a.left, b.left), out.right = std::min(a.right, b.right);
  out.top = std::max(a.top, b.top), out.bottom = std::min(a.bottom, b.bottom);
  return M_IsEmpty(out) ? Rect{} : out;
}
/// See M_SectFloatRect().
inline M_FloatRect operator&(const M_FloatRect& a, const M_FloatRect& b) {
  M_FloatRect out;
  M_SectFloatRect(&a, &b, &out);
  return out;
}

/// The smallest rectangle around both; an empty one adds nothing. See M_UnionRect() and its like.
template <M_OpsDetail::AnyRect Rect>
constexpr Rect operator|(const Rect& a, const Rect& b) {
  Rect out = {};
  if (!std::is_constant_evaluated()) {
    M_OpsDetail::Width<Rect>::kUnion(&a, &b, &out);
    return out;
  }
  if (M_IsEmpty(a) || M_IsEmpty(b)) return M_IsEmpty(b) ? a : b;
  out.left = std::min(a.left, b.left), out.right = std::max(a.right, b.right);
  out.top = std::min(a.top, b.top), out.bottom = std::max(a.bottom, b.bottom);
  return out;
}

/// Which whole edges stand for 16.16 ones.
enum class M_RectRounding {
  Nearest,  ///< The nearest, halves up.
  In,       ///< Those of the largest rectangle inside.
  Out,      ///< Those of the smallest one around.
};

/// See M_LRect2Rect(): throws M_RECT_OUT_OF_RANGE, without a report.
inline M_Rect M_ToRect(const M_LRect& r) {
  M_Rect out;
  M_OpsDetail::ThrowOnError(M_LRect2Rect(&r, &out));
  return out;
}
/// See M_FixedRect2Rect(), M_FixedRect2RectIn() and M_FixedRect2RectOut().
inline M_Rect M_ToRect(const M_FixedRect& r, M_RectRounding rounding = M_RectRounding::Nearest) {
  M_Rect out;
  const auto convert = rounding == M_RectRounding::In    ? M_FixedRect2RectIn
                       : rounding == M_RectRounding::Out ? M_FixedRect2RectOut
                                                         : M_FixedRect2Rect;
  convert(&r, &out);
  return out;
}
/// The same edges.
constexpr M_LRect M_ToLRect(const M_Rect& r) { return {r.left, r.top, r.right, r.bottom}; }
/// See M_FixedRect2LRect(), M_FixedRect2LRectIn() and M_FixedRect2LRectOut().
inline M_LRect M_ToLRect(const M_FixedRect& r, M_RectRounding rounding = M_RectRounding::Nearest) {
  M_LRect out;
  const auto convert = rounding == M_RectRounding::In    ? M_FixedRect2LRectIn
                       : rounding == M_RectRounding::Out ? M_FixedRect2LRectOut
                                                         : M_FixedRect2LRect;
  convert(&r, &out);
  return out;
}
/// See M_Rect2FixedRect().
inline M_FixedRect M_ToFixedRect(const M_Rect& r) {
  M_FixedRect out;
  M_Rect2FixedRect(&r, &out);
  return out;
}
/// See M_LRect2FixedRect().
inline M_FixedRect M_ToFixedRect(const M_LRect& r) {
  M_FixedRect out;
  M_LRect2FixedRect(&r, &out);
  return out;
}
/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup matrix_operators Operators of matrices
/// Points are rows: `p * a * b` is where b takes what a has made of p, and `p * (a * b)` the same
/// but for what is rounded.
/// \par Example
/// \include matrix_operators.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// See M_EqualMatrix().
inline bool operator==(const M_Matrix3& a, const M_Matrix3& b) {
  bool isEqual;
  M_EqualMatrix(&a, &b, &isEqual);
  return isEqual;
}
/// See M_EqualMatrix4().
inline bool operator==(const M_Matrix4& a, const M_Matrix4& b) {
  bool isEqual;
  M_EqualMatrix4(&a, &b, &isEqual);
  return isEqual;
}

/// What does as a does, and then as b does; see M_ConcatMatrix().
inline M_Matrix3 operator*(const M_Matrix3& a, const M_Matrix3& b) {
  M_Matrix3 product = a;
  M_ConcatMatrix(&b, &product);
  return product;
}
/// What does as a does, and then as b does; see M_ConcatMatrix4().
inline M_Matrix4 operator*(const M_Matrix4& a, const M_Matrix4& b) {
  M_Matrix4 product;
  M_ConcatMatrix4(&a, &b, &product);
  return product;
}

/// The inverse, or nothing if there is none. Unlike M_InverseMatrixQuiet() this also sees that
/// where only the last pivot is too small.
inline std::optional<M_Matrix3> M_Inverse(const M_Matrix3& m) {
  M_Matrix3 inverse, identity;
  if (M_InverseMatrixQuiet(&m, &inverse, nullptr) != 0) return {};
  M_SetIdentityMatrix(&identity);
  // What was left half-way makes a row of zeros, which is far from any rounding.
  if (!M_EqualMatrixWithinEpsilon(m * inverse, identity, 0.5)) return {};
  return inverse;
}
/// The inverse, or nothing if there is none; see M_InverseMatrix4Quiet().
inline std::optional<M_Matrix4> M_Inverse(const M_Matrix4& m) {
  M_Matrix4 inverse;
  if (M_InverseMatrix4Quiet(&m, &inverse, nullptr) != 0) return {};
  return inverse;
}

namespace M_OpsDetail {

// Any number of points, in parts that the library counts.
template <class Matrix, class Point>
void TransformAll(int32_t (*transform)(const Matrix*, int32_t, Point*), const Matrix& m,
                  std::span<Point> points) {
  constexpr size_t kMost = size_t{1} << 30;
  while (!points.empty()) {
    const size_t count = std::min(points.size(), kMost);
    ThrowOnError(transform(&m, static_cast<int32_t>(count), points.data()));
    points = points.subspan(count);
  }
}

}  // namespace M_OpsDetail

/// Many points or vectors, in place; see M_TransformFloatPoints().
inline void M_Transform(std::span<M_Vector2T<double>> points, const M_Matrix3& m) {
  M_OpsDetail::TransformAll(M_TransformFloatPoints, m, points);
}
/// See M_TransformVector3().
inline void M_Transform(std::span<M_Vector3T<double>> vectors, const M_Matrix3& m) {
  M_OpsDetail::TransformAll(M_TransformVector3, m, vectors);
}
/// See M_TransformPoints(). On an overflow, which is reported and thrown, those before it are done.
inline void M_Transform(std::span<M_Point> points, const M_Matrix3& m) {
  M_OpsDetail::TransformAll(M_TransformPoints, m, points);
}
/// See M_TransformFixPoints(). On an overflow, which is reported and thrown, those before it are
/// done.
inline void M_Transform(std::span<M_FixedPoint> points, const M_Matrix3& m) {
  M_OpsDetail::TransformAll(M_TransformFixPoints, m, points);
}
/// Points of space, divided by their w; see M_Transform3DFloatPoints().
inline void M_Transform(std::span<M_Vector3T<double>> points, const M_Matrix4& m) {
  M_OpsDetail::TransformAll(M_Transform3DFloatPoints, m, points);
}
/// Not divided; see M_TransformVector4NoDivide().
inline void M_Transform(std::span<M_Vector4T<double>> vectors, const M_Matrix4& m) {
  M_OpsDetail::TransformAll(M_TransformVector4NoDivide, m, vectors);
}
/// Points as short ones, truncated and held to the bounds; see M_3DTransform2DPoints().
inline void M_Transform(std::span<M_Point> points, const M_Matrix4& m) {
  M_OpsDetail::TransformAll(M_3DTransform2DPoints, m, points);
}

/// A point or vector through a matrix, as M_Transform() does it.
template <class Point, class Matrix>
requires requires(std::span<Point> points, const Matrix& m) { M_Transform(points, m); }
Point operator*(Point p, const Matrix& m) {
  M_Transform(std::span<Point>(&p, 1), m);
  return p;
}

/// The bounds of a rectangle's corners; see M_TransformRect().
inline M_Rect operator*(M_Rect r, const M_Matrix3& m) {
  M_OpsDetail::ThrowOnError(M_TransformRect(&m, &r, nullptr, nullptr));
  return r;
}
/// See M_TransformFloatRect().
inline M_FloatRect operator*(M_FloatRect r, const M_Matrix3& m) {
  M_OpsDetail::ThrowOnError(M_TransformFloatRect(&m, &r, nullptr, nullptr));
  return r;
}
/// See M_TransformFixRect(); an overflow is reported and thrown.
inline M_FixedRect operator*(M_FixedRect r, const M_Matrix3& m) {
  M_OpsDetail::ThrowOnError(M_TransformFixRect(&m, &r, nullptr, nullptr));
  return r;
}
/// The whole pixels around it; see M_TransformBounds().
inline M_LRect operator*(const M_LRect& r, const M_Matrix3& m) { return M_TransformBounds(m, r); }
/// \}

#endif  // M_OPS_H
