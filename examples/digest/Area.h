/// \file
/// Calls of the functions of an area, and the digest of all they give.
#ifndef DIGEST_AREA_H
#define DIGEST_AREA_H

#include <array>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "Operands.h"

namespace digest {

/// One parameter of a call. A pointer gets room for four values, all of them drawn.
template <class Parameter>
struct Slot {
  static constexpr bool kIsPointer = std::is_pointer_v<Parameter>;
  using Value = std::remove_cvref_t<std::remove_pointer_t<std::remove_reference_t<Parameter>>>;
  static constexpr size_t kRoom = kIsPointer ? 4 : 1;

  std::array<Value, kRoom> values;
  bool isLeftOut = false;

  Parameter Get() {
    if constexpr (kIsPointer) {
      return isLeftOut ? nullptr : values.data();
    } else {
      return values[0];
    }
  }
};

/// Names of functions with the digests of what they give.
using Digests = std::vector<std::pair<std::string, uint64_t>>;

/// The name of a function, as the compiler has it.
template <auto kFunction>
std::string NameOf() {
  const std::string text = __PRETTY_FUNCTION__;
  const size_t start = text.find_first_not_of(" =&", text.find("kFunction") + 9);
  return text.substr(start, text.find_first_of(";]", start) - start);
}

class Area {
 public:
  const Digests& Values() const { return digests_; }
  Operands& operands() { return operands_; }

  /// Begins the digest of a function, with operands that no other has a part in.
  void Begin(const std::string& name);

  /// All NaNs are alike: which of them an operation gives is the processor's choice.
  template <class Record>
  void Add(const Record& record) {
    ForEachNumber(record, [&](const auto& number) {
      if constexpr (std::is_floating_point_v<std::remove_cvref_t<decltype(number)>>) {
        const double wide = number;
        AddWord(wide != wide ? 0x7FF8u << 16 : BitCast<uint64_t>(wide));
      } else {
        AddWord(static_cast<uint64_t>(number));
      }
    });
  }

  /// A report of the library in this thread.
  void AddReport(uint32_t id, int32_t severity, const char* text);

  /// Calls a function many times as its signature says. Outputs are drawn like inputs, so that what
  /// is left as it was counts. The parameters that are bits of `nullable`, the first is 1, are left
  /// out at times.
  template <class Result, class... Parameters>
  void Call(const std::string& name, Result (*function)(Parameters...), unsigned nullable = 0) {
    Begin(name);
    CallAs<Result, Parameters...>(function, nullable, std::index_sequence_for<Parameters...>());
  }

  template <auto kFunction>
  void Call(unsigned nullable = 0) {
    Call(NameOf<kFunction>(), kFunction, nullable);
  }

  /// Calls work() and counts what it throws, if it does, and after a report the last error.
  template <class Work>
  void Try(const Work& work) {
    try {
      work();
    } catch (int code) {
      Add(code);
    }
    if (std::exchange(hasReported_, false)) AddLastError();
  }

  static constexpr int kTimes = 2000;

 private:
  template <class Result, class... Parameters, class Function, size_t... kIndex>
  void CallAs(Function function, unsigned nullable, std::index_sequence<kIndex...>) {
    for (int i = 0; i < kTimes; ++i) {
      std::tuple<Slot<Parameters>...> slots;
      operands_.BeginCall();
      (DrawAll(&std::get<kIndex>(slots)), ...);
      const uint32_t leftOut = operands_.Word() & nullable;
      ((std::get<kIndex>(slots).isLeftOut = (leftOut >> kIndex & 1) != 0), ...);
      // Equal operands are too rare by chance.
      if (operands_.Below(8) == 0) (CopyFirst(std::get<0>(slots), &std::get<kIndex>(slots)), ...);
      Try([&] {
        if constexpr (std::is_void_v<Result>) {
          function(std::get<kIndex>(slots).Get()...);
        } else {
          Add(function(std::get<kIndex>(slots).Get()...));
        }
      });
      (AddAll(std::get<kIndex>(slots).values), ...);
    }
  }

  void AddLastError();

  template <class Parameter>
  void DrawAll(Slot<Parameter>* slot) {
    using Value = typename Slot<Parameter>::Value;
    for (auto& value : slot->values) value = operands_.Make<Value>();
  }

  template <class Values>
  void AddAll(const Values& values) {
    for (const auto& value : values) Add(value);
  }

  template <class First, class Other>
  static void CopyFirst(const Slot<First>& first, Slot<Other>* other) {
    if constexpr (std::is_same_v<decltype(first.values), decltype(other->values)>) {
      other->values = first.values;
    }
  }

  void AddWord(uint64_t word) {
    uint64_t& digest = digests_.back().second;
    digest = (digest ^ word) * 0x9E3779B97F4A7C15;
    digest ^= digest >> 29;
  }

  Digests digests_;
  bool hasReported_ = false;
  Operands operands_{0};
};

/// An area's calls, and what it depends on.
struct AreaEntry {
  void (*run)(Area&);
  bool usesLibm;     ///< Results pass through the platform's sin, cos, asin, acos or atan2.
  bool isReentrant;  ///< May run in several threads at once.
};

extern const AreaEntry kAreas[];
extern const size_t kAreaCount;

/// Runs an area; what the library reports meanwhile in this thread counts, too.
Digests DigestsOf(const AreaEntry& entry);

void RunTables(Area& area);
void RunIntegers(Area& area);
void RunFixed(Area& area);
void RunRatios(Area& area);
void RunRectangles(Area& area);
void RunMatrices(Area& area);
void RunMembers(Area& area);
void RunBatches(Area& area);
void RunLines(Area& area);
void RunPolygons(Area& area);
void RunHulls(Area& area);
void RunScreen(Area& area);
void RunSineTable(Area& area);
void RunRotations(Area& area);
void RunBearings(Area& area);

}  // namespace digest

#endif  // DIGEST_AREA_H
