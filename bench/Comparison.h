/// \file
/// Benchmarks that stand beside one another: ours and the same work by peers, on the same operands,
/// measured in one run and shown as ratios.
#ifndef BENCH_COMPARISON_H
#define BENCH_COMPARISON_H

#include <benchmark/benchmark.h>

#include <cstddef>
#include <string>
#include <vector>

namespace bench {

/// Gives a line its place in the table, that of its first mention, and says how many items one run
/// of its work deals with: times are shown for one.
void NoteLine(const std::string& what, int items = 1);

/// Measures work(), which deals with `items` items, in ns an item, as line `what` of `subject`.
template <class Work>
void Batch(const std::string& what, const std::string& subject, int items, Work work) {
  NoteLine(what, items);
  const auto run = [work](benchmark::State& state) {
    for (auto unused : state) {
      (void)unused;
      work();
      benchmark::ClobberMemory();
    }
  };
  benchmark::RegisterBenchmark((what + '/' + subject).c_str(), run);
}

/// Measures work(operand) over all operands, in ns an operand, as line `what` of `subject`. The
/// subject "M" is ours; every other one is a peer.
template <class Operand, class Work>
void Line(const std::string& what, const std::string& subject, const std::vector<Operand>& operands,
          Work work) {
  NoteLine(what);
  const auto run = [work, &operands](benchmark::State& state) {
    size_t next = 0;
    for (auto unused : state) {
      (void)unused;
      auto result = work(operands[next]);
      benchmark::DoNotOptimize(result);
      if (++next == operands.size()) next = 0;
    }
  };
  benchmark::RegisterBenchmark((what + '/' + subject).c_str(), run);
}

/// Ends the program when a fast answer is a wrong one.
void Require(bool condition, const char* what);

/// Runs what was registered and prints a table: the fastest of the repetitions of each line, and
/// ours divided by the best peer's.
int RunAndCompare(int argc, char** argv);

}  // namespace bench

#endif  // BENCH_COMPARISON_H
