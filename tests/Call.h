/// \file
/// Operations of the tables that need no code of their own: a function called as its signature
/// says.
#ifndef TESTS_CALL_H
#define TESTS_CALL_H

#include <tuple>
#include <type_traits>

#include "SpaceText.h"

/// What a signature does not say. Sets of parameters are bits, the first is 1.
struct CallOptions {
  unsigned inOut = 0;     ///< Pointers whose target is read, too.
  unsigned nullable = 0;  ///< Outputs that may be left out without a change in the others.
  bool isNear = false;    ///< Numbers come from sines and roots.
};

/// One parameter, with room for what it points to.
template <class Parameter, CallOptions kOptions, size_t kIndex>
class Slot {
 public:
  using Value = std::remove_cvref_t<std::remove_pointer_t<std::remove_reference_t<Parameter>>>;
  static constexpr bool kIsPointer = std::is_pointer_v<Parameter>;
  static constexpr bool kIsOutput =
      kIsPointer && !std::is_const_v<std::remove_pointer_t<Parameter>>;
  static constexpr bool kIsInOut = (kOptions.inOut >> kIndex & 1) != 0;

  explicit Slot(Arguments& in) {
    std::memset(&value_, 0x11, sizeof value_);
    if constexpr (!kIsOutput || kIsInOut) value_ = Take(in);
    place_ = &value_;
  }
  Slot(const Slot& other) : value_(other.value_), place_(&value_) {}

  Parameter Get() {
    if constexpr (kIsPointer) {
      return place_;
    } else {
      return value_;
    }
  }

  Value* Place() { return &value_; }
  void SetPlace(Value* place) { place_ = place; }

  std::string Result() const {
    if constexpr (!kIsOutput) return "";
    return place_ ? Text(Shown(*place_)) : "";
  }

  static std::string Shown(const Value& value) {
    if constexpr (std::is_same_v<Value, M_Vector2T<float>>) {
      const M_Vector2T<double> wide = {value.x, value.y};
      return NearElements(wide, 1e4);
    } else if constexpr (std::is_same_v<Value, M_Ratio>) {
      return ::ToText(value);
    } else if constexpr (std::is_integral_v<Value>) {
      return std::to_string(value);
    } else if constexpr (IsPoint<Value> || IsRect<Value> || std::is_same_v<Value, M_WHRect>) {
      return ToText(value);
    } else {
      return kOptions.isNear ? NearElements(value) : Elements(value);
    }
  }

 private:
  static Value Take(Arguments& in) {
    if constexpr (std::is_same_v<Value, double>) {
      return in.Double();
    } else if constexpr (std::is_same_v<Value, M_Ratio>) {
      return in.Ratio();
    } else if constexpr (std::is_integral_v<Value>) {
      return static_cast<Value>(in.Int());
    } else if constexpr (std::is_same_v<Value, M_Vector2T<float>>) {
      const auto wide = Read<M_Vector2T<double>>(in);
      return {static_cast<float>(wide.x), static_cast<float>(wide.y)};
    } else if constexpr (requires(Value v) { v.m; }) {
      return ReadMatrix<Value>(in);
    } else {
      return Read<Value>(in);
    }
  }

  Value value_;
  Value* place_;
};

template <auto kFunction, CallOptions kOptions, class Result, class... Parameters, size_t... kIndex>
std::string CallAs(Arguments& in, Result (*)(Parameters...), std::index_sequence<kIndex...>) {
  using Slots = std::tuple<Slot<Parameters, kOptions, kIndex>...>;
  const Slots given{Slot<Parameters, kOptions, kIndex>(in)...};
  constexpr bool kHasOutput = (Slot<Parameters, kOptions, kIndex>::kIsOutput || ...);

  // Calls with the outputs where they are, or with one of them in an input or left out; `hidden` is
  // the one that is left out.
  const auto call = [&](Slots slots, const auto& move, size_t hidden) {
    move(slots);
    const auto result = kFunction(std::get<kIndex>(slots).Get()...);
    std::string text;
    ((text += kIndex == hidden ? "" : std::get<kIndex>(slots).Result()), ...);
    if constexpr (std::is_same_v<Result, int32_t> && kHasOutput) return text + Outcome(result);
    using Returned = Slot<std::decay_t<Result>, kOptions, sizeof...(Parameters)>;
    return text.append(Text(Returned::Shown(result))).append(Outcome(0));
  };
  const auto all = sizeof...(Parameters);
  const std::string text = call(
      given, [](Slots&) {}, all);

  const auto tryPlace = [&]<size_t kOut, size_t kIn>() {
    using Out = std::tuple_element_t<kOut, Slots>;
    using In = std::tuple_element_t<kIn, Slots>;
    if constexpr (Out::kIsOutput && !Out::kIsInOut && In::kIsPointer && !In::kIsOutput &&
                  std::is_same_v<typename Out::Value, typename In::Value>) {
      const auto move = [](Slots& s) { std::get<kOut>(s).SetPlace(std::get<kIn>(s).Place()); };
      EXPECT_EQ(call(given, move, all), text) << "with output " << kOut << " in input " << kIn;
    }
  };
  const auto tryOutput = [&]<size_t kOut>() {
    (tryPlace.template operator()<kOut, kIndex>(), ...);
    if constexpr ((kOptions.nullable >> kOut & 1) != 0) {
      const auto leaveOut = [](Slots& s) { std::get<kOut>(s).SetPlace(nullptr); };
      EXPECT_EQ(call(given, leaveOut, kOut), call(
                                                 given, [](Slots&) {}, kOut));
    }
  };
  (tryOutput.template operator()<kIndex>(), ...);
  return text;
}

/// Takes the inputs from the line in the order of the parameters and gives all outputs in that
/// order, then the code and the host's calls, or what the function returns where that is no status.
/// Each output is also put in the place of each input of its type, which must give the same.
template <auto kFunction, CallOptions kOptions = CallOptions{}>
std::string Call(Arguments& in) {
  const auto as = [&]<class Result, class... Parameters>(Result (*signature)(Parameters...)) {
    return CallAs<kFunction, kOptions>(in, signature, std::index_sequence_for<Parameters...>());
  };
  return as(kFunction);
}

#endif  // TESTS_CALL_H
