// Ratios, 16.16 and the integer utilities beside Boost.Rational, libavutil and the plain C++ for
// the same. Peers that are not installed are left out.

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <numeric>
#include <utility>
#include <vector>

#include "Comparison.h"
#include "M_Ops.h"
#include "Random.h"

#ifdef BENCH_HAS_BOOST
#include <boost/rational.hpp>
#endif
#ifdef BENCH_HAS_AVUTIL
extern "C" {
#include <libavutil/rational.h>
}
#endif

namespace {

using bench::Line;
using bench::Random;
using bench::Require;

template <class T>
using Pairs = std::vector<std::pair<T, T>>;

constexpr size_t kOperands = 4096;

// A second of frames, in the units of a time base: 5 * 1001/30000, 17/600, ...
M_Ratio FrameTime() {
  static constexpr M_Ratio kUnits[] = {{1, 24},       {1, 25},       {1, 30},  {1, 60},
                                       {1001, 24000}, {1001, 30000}, {1, 600}, {1, 1000}};
  const M_Ratio unit = kUnits[Random() % std::size(kUnits)];
  return {static_cast<int32_t>(Random() % 30 + 1) * unit.num, unit.den};
}

M_Ratio FrameRate() {
  static constexpr M_Ratio kRates[] = {{24, 1},       {25, 1},       {30, 1},       {60, 1},
                                       {24000, 1001}, {30000, 1001}, {60000, 1001}, {48, 1}};
  return kRates[Random() % std::size(kRates)];
}

M_Ratio Reduced(M_Ratio r) {
  M_ReduceRatio(&r, &r, nullptr);
  return r;
}

template <class T, class Make>
std::vector<T> Generate(Make make) {
  std::vector<T> all(kOperands);
  for (T& one : all) one = make();
  return all;
}

#ifdef BENCH_HAS_BOOST
using Boost = boost::rational<int32_t>;

Boost ToBoost(M_Ratio r) { return {r.num, static_cast<int32_t>(r.den)}; }

Pairs<Boost> ToBoost(const Pairs<M_Ratio>& pairs) {
  Pairs<Boost> all;
  for (const auto& [a, b] : pairs) all.emplace_back(ToBoost(a), ToBoost(b));
  return all;
}

bool IsSame(M_Ratio r, Boost b) { return ToBoost(r) == b; }
#endif

#ifdef BENCH_HAS_AVUTIL
AVRational ToAv(M_Ratio r) { return {r.num, static_cast<int>(r.den)}; }

Pairs<AVRational> ToAv(const Pairs<M_Ratio>& pairs) {
  Pairs<AVRational> all;
  for (const auto& [a, b] : pairs) all.emplace_back(ToAv(a), ToAv(b));
  return all;
}

bool IsSame(M_Ratio r, AVRational q) { return av_cmp_q(ToAv(r), q) == 0; }
#endif

// One operation on pairs of ratios: ours as it stands, ours reduced to lowest terms as the peers
// always do, and the peers.
template <class Ours, class Theirs, class TheirsAv>
void RatioLines(const std::string& name, const Pairs<M_Ratio>& pairs, Ours ours,
                [[maybe_unused]] Theirs boost, [[maybe_unused]] TheirsAv avutil) {
  const auto reduced = [ours](const auto& pair) { return Reduced(ours(pair)); };
  Line(name, "M", pairs, ours);
  Line(name + ", reduced", "M", pairs, reduced);
#ifdef BENCH_HAS_BOOST
  static std::vector<Pairs<Boost>> boostPairs;
  boostPairs.reserve(8);
  const auto& theirs = boostPairs.emplace_back(ToBoost(pairs));
  for (size_t i = 0; i < pairs.size(); ++i) {
    Require(IsSame(ours(pairs[i]), boost(theirs[i])), name.c_str());
  }
  Line(name, "Boost", theirs, boost);
  Line(name + ", reduced", "Boost", theirs, boost);
#endif
#ifdef BENCH_HAS_AVUTIL
  static std::vector<Pairs<AVRational>> avPairs;
  avPairs.reserve(8);
  const auto& theirsAv = avPairs.emplace_back(ToAv(pairs));
  for (size_t i = 0; i < pairs.size(); ++i) {
    Require(IsSame(ours(pairs[i]), avutil(theirsAv[i])), name.c_str());
  }
  Line(name, "libavutil", theirsAv, avutil);
  Line(name + ", reduced", "libavutil", theirsAv, avutil);
#endif
}

void RatioArithmetic() {
  static const auto times =
      Generate<std::pair<M_Ratio, M_Ratio>>([] { return std::pair(FrameTime(), FrameTime()); });
  static const auto timesAndRates =
      Generate<std::pair<M_Ratio, M_Ratio>>([] { return std::pair(FrameTime(), FrameRate()); });
  RatioLines(
      "add", times,
      [](const auto& p) {
        M_Ratio sum;
        M_AddRatio(&p.first, &p.second, &sum, nullptr);
        return sum;
      },
      [](const auto& p) { return p.first + p.second; },
#ifdef BENCH_HAS_AVUTIL
      [](const auto& p) { return av_add_q(p.first, p.second); }
#else
      nullptr
#endif
  );
  RatioLines(
      "multiply", timesAndRates,
      [](const auto& p) {
        M_Ratio product;
        M_MulRatio(&p.first, &p.second, &product, nullptr);
        return product;
      },
      [](const auto& p) { return p.first * p.second; },
#ifdef BENCH_HAS_AVUTIL
      [](const auto& p) { return av_mul_q(p.first, p.second); }
#else
      nullptr
#endif
  );

  // Sound and transport clocks, beyond what 15 bits hold, and operands of all 31 bits.
  static const auto clocks = Generate<std::pair<M_Ratio, M_Ratio>>([] {
    static constexpr uint32_t kClocks[] = {44100, 48000, 88200, 90000, 96000, 192000};
    const auto time = [] {
      return M_Ratio{static_cast<int32_t>(Random() >> 13) + 1, kClocks[Random() % 6]};
    };
    return std::pair(time(), time());
  });
  static const auto wide = Generate<std::pair<M_Ratio, M_Ratio>>([] {
    const auto any = [] { return M_Ratio{static_cast<int32_t>(Random() >> 1), Random() / 2 + 1}; };
    return std::pair(any(), any());
  });
  const auto add = [](const auto& p) {
    M_Ratio sum;
    M_AddRatio(&p.first, &p.second, &sum, nullptr);
    return sum;
  };
  const auto compare = [](const auto& p) {
    int32_t order;
    M_CompareRatio(&p.first, &p.second, &order);
    return order;
  };
  Line("add, clocks", "M", clocks, add);
  // Beside the call that they are.
  Line("a + b", "M", times, [](const auto& p) { return p.first + p.second; });
  Line("a + b", "M_AddRatio", times, add);
  Line("frame at", "M", clocks, [](const auto& p) { return M_FrameAt(p.first, p.second); });
  Line("compare", "M", times, compare);
  Line("compare, clocks", "M", clocks, compare);
  Line("compare, wide", "M", wide, compare);
  Line("minimum", "M", times, [](const auto& p) {
    M_Ratio smaller;
    M_MinRatio(&p.first, &p.second, &smaller);
    return smaller;
  });
#ifdef BENCH_HAS_BOOST
  static const auto boostTimes = ToBoost(times), boostClocks = ToBoost(clocks),
                    boostWide = ToBoost(wide);
  const auto isLess = [](const auto& p) { return p.first < p.second; };
  Line("add, clocks", "Boost", boostClocks, [](const auto& p) { return p.first + p.second; });
  Line("compare", "Boost", boostTimes, isLess);
  Line("compare, clocks", "Boost", boostClocks, isLess);
  Line("compare, wide", "Boost", boostWide, isLess);
  Line("minimum", "Boost", boostTimes,
       [](const auto& p) { return p.first < p.second ? p.first : p.second; });
#endif
#ifdef BENCH_HAS_AVUTIL
  static const auto avTimes = ToAv(times), avClocks = ToAv(clocks), avWide = ToAv(wide);
  const auto order = [](const auto& p) { return av_cmp_q(p.first, p.second); };
  Line("add, clocks", "libavutil", avClocks,
       [](const auto& p) { return av_add_q(p.first, p.second); });
  Line("compare", "libavutil", avTimes, order);
  Line("compare, clocks", "libavutil", avClocks, order);
  Line("compare, wide", "libavutil", avWide, order);
  Line("minimum", "libavutil", avTimes,
       [](const auto& p) { return av_cmp_q(p.first, p.second) < 0 ? p.first : p.second; });
#endif

  // Sound clocks counted in 1024ths of a sample: the common denominator fits only once both are
  // reduced.
  static const auto large = Generate<std::pair<M_Ratio, M_Ratio>>([] {
    const auto samples = [] { return static_cast<int32_t>(Random() % 20000 + 1) * 1024; };
    return std::pair(M_Ratio{samples(), 96000 * 1024}, M_Ratio{samples(), 44100 * 1024});
  });
  Line("add, reducing", "M", large, add);
  Line("multiply, reducing", "M", large, [](const auto& p) {
    M_Ratio product;
    unsigned char status = 0;
    M_MulRatio(&p.first, &p.second, &product, &status);
    return product;
  });
#ifdef BENCH_HAS_BOOST
  static const auto boostLarge = ToBoost(large);
  Line("add, reducing", "Boost", boostLarge, [](const auto& p) { return p.first + p.second; });
  Line("multiply, reducing", "Boost", boostLarge, [](const auto& p) { return p.first * p.second; });
#endif
#ifdef BENCH_HAS_AVUTIL
  static const auto avLarge = ToAv(large);
  Line("add, reducing", "libavutil", avLarge,
       [](const auto& p) { return av_add_q(p.first, p.second); });
  Line("multiply, reducing", "libavutil", avLarge,
       [](const auto& p) { return av_mul_q(p.first, p.second); });
#endif

  static const auto unreduced = Generate<M_Ratio>([] {
    const M_Ratio time = FrameTime();
    const auto factor = Random() % 1000 + 1;
    return M_Ratio{time.num * static_cast<int32_t>(factor), time.den * factor};
  });
  Line("reduce", "M", unreduced, [](const M_Ratio& r) { return Reduced(r); });
#ifdef BENCH_HAS_BOOST
  Line("reduce", "Boost", unreduced, [](const M_Ratio& r) { return ToBoost(r); });
#endif
#ifdef BENCH_HAS_AVUTIL
  Line("reduce", "libavutil", unreduced, [](const M_Ratio& r) {
    AVRational reduced;
    av_reduce(&reduced.num, &reduced.den, r.num, r.den, INT32_MAX);
    return reduced;
  });
#endif
}

void Approximation() {
  static const auto rates = Generate<double>([] {
    const M_Ratio rate = FrameRate();
    return rate.num / static_cast<double>(rate.den);
  });
  static const auto uniform = Generate<double>([] { return Random() / 65536.0 / 65536.0 * 100; });
  for (const auto* operands : {&rates, &uniform}) {
    const std::string name = operands == &rates ? "from double, rates" : "from double, uniform";
    Line(name, "M", *operands, [](double x) {
      M_Ratio r;
      M_FpLong2Ratio(&r, nullptr, x);
      return r;
    });
#ifdef BENCH_HAS_AVUTIL
    Line(name, "libavutil", *operands, [](double x) { return av_d2q(x, 1 << 30); });
#endif
  }
}

// Fixed point in the form that is written where a 64-bit intermediate is allowed; it rounds
// otherwise than M_FixMul and M_FixDiv, so this compares times only.
void FixedPoint() {
  static const auto values = Generate<std::pair<M_Fixed, M_Fixed>>([] {
    // Of either sign, a quarter of them whole.
    const auto value = [] {
      const auto magnitude = static_cast<M_Fixed>(Random() % 0x1000000 + 0x100);
      const M_Fixed any = Random() % 4 == 0 ? magnitude & ~0xFFFF : magnitude;
      return Random() % 2 == 0 ? any | 0x10000 : -(any | 0x10000);
    };
    return std::pair(value(), value());
  });
  Line("16.16 multiply", "M", values, [](const auto& p) { return M_FixMul(p.first, p.second); });
  Line("16.16 multiply", "64-bit", values,
       [](const auto& p) { return static_cast<M_Fixed>(int64_t{p.first} * p.second >> 16); });
  Line("16.16 divide", "M", values, [](const auto& p) { return M_FixDiv(p.first, p.second); });
  Line("16.16 divide", "64-bit", values,
       [](const auto& p) { return static_cast<M_Fixed>((int64_t{p.first} << 16) / p.second); });
}

void IntegerUtilities() {
  static const auto words =
      Generate<std::pair<uint32_t, uint32_t>>([] { return std::pair(Random(), Random()); });
  static const auto denominators = Generate<std::pair<uint32_t, uint32_t>>(
      [] { return std::pair(FrameTime().den, FrameTime().den); });
  static const auto doubles =
      Generate<double>([] { return static_cast<int32_t>(Random()) / 65536.0; });

  Line("leading zeros", "M", words, [](const auto& p) { return M_LeadingZeros(p.first); });
  Line("leading zeros", "std", words, [](const auto& p) { return std::countl_zero(p.first); });
  Line("multiply would overflow", "M", words,
       [](const auto& p) { return M_UMulWouldOverflow(p.first, p.second); });
  for (const auto* operands : {&words, &denominators}) {
    const std::string name = operands == &words ? "gcd, random" : "gcd, denominators";
    Line(name, "M", *operands, [](const auto& p) {
      uint32_t gcd;
      M_UnsignedGCD(p.first, p.second, &gcd);
      return gcd;
    });
    Line(name, "std", *operands, [](const auto& p) { return std::gcd(p.first, p.second); });
#ifdef BENCH_HAS_BOOST
    Line(name, "Boost", *operands,
         [](const auto& p) { return boost::integer::gcd(p.first, p.second); });
#endif
  }
  Line("round double", "M", doubles, [](double d) { return M_RoundDouble(d); });
  Line("round double", "std", doubles, [](double d) { return std::lround(d); });
}

}  // namespace

int main(int argc, char** argv) {
  RatioArithmetic();
  Approximation();
  FixedPoint();
  IntegerUtilities();
  return bench::RunAndCompare(argc, argv);
}
