#include "M_Ops.h"

#include <sstream>

#include "Law.h"

namespace {

__extension__ typedef __int128 Wide;

static_assert("-30000/1001"_ratio == M_Ratio{-30000, 1001} &&
              "+23.976"_ratio == M_Ratio{2997, 125});
static_assert(M_Ratio{1, 3} + M_Ratio{1, 6} == M_Ratio{1, 2} && -M_Ratio{3, 4} < M_RatioOf(-0u));
static_assert(M_SnapToFrame({1, 2}, {3, 1}) == M_Ratio{1, 3} && M_Ratio{1, 0} != M_Ratio{1, 0});
static_assert((M_Rect{0, 0, 4, 4} & M_Rect{2, 2, 9, 9}) == M_Rect{2, 2, 4, 4});
static_assert((M_Rect{0, 0, 4, 4} | M_Rect{9, 9, 9, 9}) == M_Rect{0, 0, 4, 4});

// num / den in lowest terms, or what is thrown and reported: the first of these that is true.
std::string Text(Wide num, Wide den, bool isZero, const std::string& what) {
  if (isZero) return "4358 | " + what.substr(0, 9) + "zero denominator" + what.substr(17);
  if (den < 0) num = -num, den = -den;
  Wide a = num < 0 ? -num : num, b = den;
  while (b != 0) a = std::exchange(b, a % b);
  if (num / a != static_cast<int32_t>(num / a) || den / a > UINT32_MAX) return "4354 | " + what;
  return rc::toString(M_Ratio{static_cast<int32_t>(num / a), static_cast<uint32_t>(den / a)});
}

std::string Text(const auto& calculate) {
  M_Ratio out = {};
  const std::string thrown = Thrown([&] { out = calculate(); });
  return thrown == "0" ? Text(out.num, out.den, false, "") : thrown;
}

TEST(Ops, RatiosAreExactOrOverflow) {
  Holds([](M_Ratio a, M_Ratio b, Digit kind, Int whole) {
    if (kind == 9) a.den = 0;
    if (kind == 8) b.den = 0;
    if (kind == 7) b.den |= 0x80000000;
    if (kind == 6) a = {a.num % 2, 1};
    if (kind == 5) b.num = INT32_MIN;
    const Wide an = a.num, ad = a.den, bn = b.num, bd = b.den;
    const bool isZero = ad == 0 || bd == 0;
    const std::string sum = "110010 8 overflow in ratio ",
                      product = "110011 8 overflow in ratio multiply.";
    Equal(Text([&] { return a + b; }), Text(an * bd + bn * ad, ad * bd, isZero, sum + "addition."));
    Equal(Text([&] { return a - b; }),
          Text(an * bd - bn * ad, ad * bd, isZero, sum + "subtraction."));
    Equal(Text([&] { return a * b; }), Text(an * bn, ad * bd, isZero, product));
    Equal(Text([&] { return a / b; }), Text(an * bd, ad * bn, isZero || bn == 0, product));
    Equal(Text([&] { return M_TimeOfFrame(whole, b); }),
          Text(whole * bd, bn, bd == 0 || bn == 0, product));
    if (isZero) {
      Check(!(a == b) && !(a < b) && !(a >= b));
      return Equal(Thrown([&] { M_FrameAt(a, b); }), Text(0, 0, true, product));
    }
    const Wide order = an * bd - bn * ad;
    Check((a < b) == (order < 0) && (a == b) == (order == 0) && (a > b) == (order > 0));
    const Wide floor = (an * bn - (an * bn % (ad * bd) + ad * bd) % (ad * bd)) / (ad * bd);
    const Wide twice = 2 * (an * bn - floor * ad * bd);
    Equal(M_FrameAt(a, b), static_cast<int64_t>(floor));
    Equal(M_FrameAt(a, b, M_Rounding::Ceiling), static_cast<int64_t>(floor + (twice > 0)));
    Equal(M_FrameAt(a, b, M_Rounding::Nearest), static_cast<int64_t>(floor + (twice >= ad * bd)));
  });
}

TEST(Ops, TextsAndHashes) {
  Holds([](const M_Ratio& r, Digit a, Digit b, Digit c) {
    std::ostringstream text;
    text << r;
    const auto parsed = M_ParseRatio(text.str());
    Check(parsed && parsed->num == r.num && parsed->den == r.den);
    const uint32_t den = static_cast<uint32_t>(b + 10), times = static_cast<uint32_t>(c + 10);
    const M_Ratio small = {a, den}, same = {a * static_cast<int32_t>(times), den * times};
    Equal(std::hash<M_Ratio>()(small), std::hash<M_Ratio>()(same));
    const std::string decimal = std::to_string(r.num) + '.' + std::to_string(times);
    const Wide scale = times < 10 ? 10 : 100,
               digits = Wide{std::abs(int64_t{r.num})} * scale + times;
    const auto value = M_ParseRatio(decimal);
    Equal(value ? rc::toString(*value) : "4354 | ",
          Text(r.num < 0 ? -digits : digits, scale, false, ""));
  });
  for (const char* bad : {"", "-", "/", "1/", "/1", "1/0", "1/2/3", "1.", ".5", "1.2/3", " 1", "1 ",
                          "0x1", "--1", "2147483648", "1/4294967296", "-2147483649/1",
                          "00000000000000000001", "0.0000000000000000001"}) {
    EXPECT_FALSE(M_ParseRatio(bad)) << bad;
  }
  char text[22];
  const M_Ratio longest = {INT32_MIN, UINT32_MAX};
  EXPECT_EQ(M_ToChars(text, text + 22, longest).ptr, text + 22);
  for (int size = 0; size < 22; ++size)
    EXPECT_EQ(M_ToChars(text, text + size, longest).ec, std::errc::value_too_large);
}

// What they call is tried elsewhere: here, that it is called with its operands in order.
TEST(Ops, MatricesAndRectangles) {
  Holds([](const M_Matrix3& a, const M_Matrix3& b, V2 p, const M_LRect& r, const M_LRect& s,
           const M_FixedRect& f) {
    M_Matrix3 product = a;
    M_ConcatMatrix(&b, &product);
    bool isEqual;
    M_EqualMatrix(&a, &b, &isEqual);
    Check(BitsOf(a * b) == BitsOf(product) && (a == b) == isEqual);
    V2 points[] = {p, p}, expected = p;
    M_TransformFloatPoints(&a, 1, &expected);
    M_Transform(points, a);
    Equal(BitsOf(std::array{points[1], p * a}), BitsOf(std::array{expected, expected}));
    M_LRect shared, both, bounds[3];
    Equal(M_SectLRect(&r, &s, &shared), !M_IsEmpty(r & s));
    M_UnionLRect(&r, &s, &both);
    Check(BitsOf(r & s) == BitsOf(shared) && BitsOf(r | s) == BitsOf(both));
    Equal(r == s, M_EqualLRect(&r, &s) != 0);
    M_FixedRect2LRect(&f, bounds), M_FixedRect2LRectIn(&f, bounds + 1);
    M_FixedRect2LRectOut(&f, bounds + 2);
    for (const auto rounding : {M_RectRounding::Nearest, M_RectRounding::In, M_RectRounding::Out}) {
      const auto i = static_cast<int>(rounding);
      Check(M_ToLRect(f, rounding) == bounds[i] && M_ToLRect(M_ToRect(f, rounding)) == bounds[i]);
    }
  });
  const M_LRect wide = {0, 0, 40000, 1};
  EXPECT_EQ(Thrown([&] { M_ToRect(wide); }), "10");
  // Of nine numbers that follow each other, in rows, the last pivot is as good as 0.
  const M_Matrix3 flat = {{{1, 2, 3}, {4, 5, 6}, {7, 8, 9}}},
                  turn = {{{0, 1, 0}, {1, 0, 0}, {5, 6, 1}}};
  EXPECT_TRUE(!M_Inverse(flat) && turn * *M_Inverse(turn) * turn == turn);
  const M_Matrix4 zero = {}, half = {{{0, 2, 0, 0}, {2, 0, 0, 0}, {0, 0, 2, 0}, {1, 2, 3, 1}}};
  EXPECT_TRUE(!M_Inverse(zero) && half * *M_Inverse(half) * half == half);
}

}  // namespace
