#include "Comparison.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <map>

namespace bench {
namespace {

// The lines in the order of their first mention; they are measured in a random one.
std::vector<std::string>& Lines() {
  static std::vector<std::string> lines;
  return lines;
}

std::map<std::string, int>& ItemsOfLines() {
  static std::map<std::string, int> items;
  return items;
}

// Collects the fastest repetition of every line and leaves the printing to the table.
class FastestReporter : public benchmark::BenchmarkReporter {
 public:
  bool ReportContext(const Context& context) override {
    PrintBasicContext(&GetErrorStream(), context);
    return true;
  }

  void ReportRuns(const std::vector<Run>& runs) override {
    for (const Run& run : runs) {
      if (run.run_type != Run::RT_Iteration) continue;
      const std::string name = run.run_name.function_name;
      const size_t slash = name.rfind('/');
      const std::string what = name.substr(0, slash);
      const double time = run.GetAdjustedCPUTime() / ItemsOfLines()[what];
      const auto entry = fastest_[what].emplace(name.substr(slash + 1), time).first;
      entry->second = std::min(entry->second, time);
    }
  }

  void Finalize() override {
    std::printf("%-32s %9s  %9s  %s\n", "", "M [ns]", "M / best", "others [ns]");
    for (const std::string& what : Lines()) {
      const auto& subjects = fastest_[what];
      double best = 0;
      std::string peers;
      for (const auto& [subject, time] : subjects) {
        if (subject == "M") continue;
        // A yardstick and a peer built for this machine are shown, but are not what M is measured
        // by.
        const bool counts = subject[0] != '(';
        if (counts && (best == 0 || time < best)) best = time;
        char text[64];
        std::snprintf(text, sizeof text, "%s %.2f  ", subject.c_str(), time);
        peers += text;
      }
      const auto ours = subjects.find("M");
      if (ours == subjects.end()) continue;
      std::printf("%-32s %9.2f  ", what.c_str(), ours->second);
      if (best > 0) {
        std::printf("%9.2f  %s\n", ours->second / best, peers.c_str());
      } else {
        std::printf("%9s  %s\n", "-", peers.c_str());
      }
    }
  }

 private:
  std::map<std::string, std::map<std::string, double>> fastest_;
};

}  // namespace

void NoteLine(const std::string& what, int items) {
  if (ItemsOfLines().emplace(what, items).second) Lines().push_back(what);
}

void Require(bool condition, const char* what) {
  if (condition) return;
  std::fprintf(stderr, "wrong result: %s\n", what);
  std::exit(1);
}

int RunAndCompare(int argc, char** argv) {
  // Repetitions in random order, so that a slow moment of the machine does not fall on one subject.
  static char interleave[] = "--benchmark_enable_random_interleaving=true";
  static char repetitions[] = "--benchmark_repetitions=9";
  static char time[] = "--benchmark_min_time=0.05";
  std::vector<char*> arguments = {argv[0], interleave, repetitions, time};
  arguments.insert(arguments.end(), argv + 1, argv + argc);
  int count = static_cast<int>(arguments.size());
  benchmark::Initialize(&count, arguments.data());
  if (benchmark::ReportUnrecognizedArguments(count, arguments.data())) return 1;
  FastestReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  return 0;
}

}  // namespace bench
