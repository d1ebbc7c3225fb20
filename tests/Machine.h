/// \file
/// Any function, to be called as its signature says, with drawn operands, wherever its outputs
/// stand.
#ifndef TESTS_MACHINE_H
#define TESTS_MACHINE_H

#include <string_view>

#include "Law.h"

/// What a signature does not say. Sets of parameters are bits, the first is 1.
struct CallOptions {
  unsigned inOut = 0;     ///< Pointers whose target is read, too.
  unsigned nullable = 0;  ///< Outputs that may be left out without a change in the others.
  bool isKept = false;    ///< After some failures an output is what it was.
  int count = -1;         ///< The parameter that counts the targets of `many`; without one, four.
  unsigned many = 0;      ///< Pointers to several targets.
};

/// What is done with values of a type.
struct Type {
  size_t size;
  bool isOfDoubles;
  void (*draw)(void* value);
  std::string (*bits)(const void* value);
  void (*show)(const void* value, std::ostream& os);
};
template <class T>
inline const Type kType = {
    sizeof(T), !std::has_unique_object_representations_v<T> && !std::is_same_v<T, F2>,
    [](void* value) { *static_cast<T*>(value) = *operands::Of<T>(); },
    [](const void* value) { return BitsOf(*static_cast<const T*>(value)); },
    [](const void* value, std::ostream& os) { rc::show(*static_cast<const T*>(value), os); }};

struct Parameter {
  const Type* type;
  bool isPointer;  ///< Or a reference.
  bool isOutput;
  bool isInOut;
  size_t targets;
};

/// Room for what a parameter is, or points to.
struct alignas(16) Room {
  char bytes[1024];
};

struct Function {
  std::string name;
  CallOptions options;
  std::vector<Parameter> parameters;
  std::string (*call)(void* const* places);  ///< Gives the bits of the result.

  using Values = std::vector<Room>;
  using Places = std::vector<void*>;

  Values Draw() const;
  static Places OwnPlaces(Values& values);
  /// Calls with each parameter where it is told, or null; gives all outputs but those that are null
  /// or one that is left out, the result, what was thrown and what the host was asked.
  std::string Outcome(const Places& places, size_t without = 99) const;
  std::string Outcome(Values values) const { return Outcome(OwnPlaces(values)); }
  /// The call as one could type it.
  std::string Text(const Values& values) const;
};

template <auto kFunction>
std::string NameOf() {
  const std::string_view text = __PRETTY_FUNCTION__;
  const size_t start = text.find_first_not_of(" =&", text.find("kFunction") + 9);
  return std::string(text.substr(start, text.find_first_of(";]", start) - start));
}

template <auto kFunction, class Result, class... Parameters, size_t... k>
std::string CallAt(void* const* places, Result (*)(Parameters...), std::index_sequence<k...>) {
  const auto get = []<class P>(void* place) -> P {
    if constexpr (std::is_pointer_v<P>) {
      return static_cast<P>(place);
    } else {
      return *static_cast<std::remove_reference_t<P>*>(place);
    }
  };
  if constexpr (std::is_void_v<Result>) {
    kFunction(get.template operator()<Parameters>(places[k])...);
    return "";
  } else {
    return BitsOf(kFunction(get.template operator()<Parameters>(places[k])...));
  }
}

/// The description of a function by its signature.
template <auto kFunction, class Result, class... Parameters>
Function Describe(Result (*)(Parameters...), const CallOptions& options) {
  Function f = {NameOf<kFunction>(), options, {}, [](void* const* places) {
                  return CallAt<kFunction>(places, +kFunction,
                                           std::index_sequence_for<Parameters...>());
                }};
  const auto add = [&]<class P>() {
    using Target = std::remove_pointer_t<std::remove_reference_t<P>>;
    const auto k = f.parameters.size();
    const bool isMany = options.many >> k & 1;
    f.parameters.push_back(
        {&kType<std::remove_cv_t<Target>>, std::is_pointer_v<P> || std::is_reference_v<P>,
         std::is_pointer_v<P> && !std::is_const_v<Target>, (options.inOut >> k & 1) != 0,
         !isMany             ? 1u
         : options.count < 0 ? 4u
                             : 7u});
  };
  (add.template operator()<Parameters>(), ...);
  return f;
}

/// Of a member, by its object's address.
template <auto kMember, class Object, class... Parameters>
void CallMember(Object* object, Parameters... parameters) {
  (object->*kMember)(parameters...);
}
template <auto kMember, class Class, class... Parameters>
Function Describe(void (Class::*)(Parameters...), CallOptions options) {
  options.inOut |= 1;
  constexpr auto kCall = CallMember<kMember, Class, Parameters...>;
  return Describe<kCall>(kCall, options);
}
template <auto kMember, class Class, class... Parameters>
Function Describe(void (Class::*)(Parameters...) const, const CallOptions& options) {
  constexpr auto kCall = CallMember<kMember, const Class, Parameters...>;
  return Describe<kCall>(kCall, options);
}

#endif  // TESTS_MACHINE_H
