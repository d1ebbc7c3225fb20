#include "Operands.h"

namespace operands {

template <class T>
Gen<T> Of() {
  if constexpr (requires(T t) { t.m; }) {
    return Matrices<T>();
  } else if constexpr (std::is_floating_point_v<T>) {
    return gen::cast<T>(Doubles());
  } else if constexpr (std::is_same_v<T, uint32_t>) {
    return Words();
  } else if constexpr (std::is_same_v<T, bool> || std::is_same_v<T, unsigned char>) {
    return gen::cast<T>(gen::inRange(0, 4));
  } else if constexpr (std::is_integral_v<T>) {
    return gen::weightedOneOf<T>(
        {{2, gen::cast<T>(gen::inRange(-9, 10))}, {3, gen::cast<T>(Ints())}});
  } else if constexpr (std::is_same_v<T, Digit>) {
    return Make<T>(gen::cast<int16_t>(gen::inRange(-9, 10)));
  } else if constexpr (std::is_same_v<T, Real>) {
    return Make<T>(Reals());
  } else if constexpr (std::is_same_v<T, M_Ratio>) {
    const auto den = gen::map(Words(), [](uint32_t w) { return w ? w : 1; });
    return gen::oneOf(Make<T>(Of<int32_t>(), den), Make<T>(Ints(), gen::inRange<uint32_t>(1, 10)));
  } else if constexpr (requires(T t) { t.value; }) {
    return Make<T>(Of<decltype(T::value)>());
  } else {
    return gen::map(gen::container<NumbersOf<T>>(Of<NumberOf<T>>()),
                    [](const NumbersOf<T>& numbers) { return std::bit_cast<T>(numbers); });
  }
}

template Gen<M_Matrix3> Of();
template Gen<M_Matrix4> Of();
template Gen<double> Of();
template Gen<float> Of();
template Gen<uint32_t> Of();
template Gen<bool> Of();
template Gen<unsigned char> Of();
template Gen<int16_t> Of();
template Gen<int32_t> Of();
template Gen<Word> Of();
template Gen<Int> Of();
template Gen<Short> Of();
template Gen<Digit> Of();
template Gen<Any> Of();
template Gen<Real> Of();
template Gen<M_Ratio> Of();
template Gen<M_WHRect> Of();
template Gen<M_Rect> Of();
template Gen<M_LRect> Of();
template Gen<M_FixedRect> Of();
template Gen<M_FloatRect> Of();
template Gen<M_Point> Of();
template Gen<M_LPoint> Of();
template Gen<M_FixedPoint> Of();
template Gen<V2> Of();
template Gen<V3> Of();
template Gen<V4> Of();
template Gen<F2> Of();
template Gen<M_PlaneEq> Of();
template Gen<M_Ray> Of();
template Gen<M_Matrix4Decomp> Of();

}  // namespace operands
