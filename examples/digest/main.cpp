// Prints a digest of the results of each function of the library, to see that a machine gives the
// bits that others do.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <map>
#include <string>
#include <thread>

#include "Area.h"
#include "U.h"

namespace {

using digest::Digests;
using digest::DigestsOf;
using digest::kAreaCount;
using digest::kAreas;

constexpr const char* kUsage =
    "usage: digest [--threads N] [--compare FILE]\n"
    "Prints a digest of what each function gives for many operands.\n"
    "  --threads N     also runs what is reentrant in N threads at once and compares\n"
    "  --compare FILE  compares with digests that were printed before; what passes through the\n"
    "                  platform's sines may differ, nothing else\n";

std::string Hex(uint64_t value) {
  char text[17];
  std::snprintf(text, sizeof text, "%016llx", static_cast<unsigned long long>(value));
  return text;
}

// The digests of a file, by function.
std::map<std::string, std::string> Read(const char* path) {
  std::map<std::string, std::string> digests;
  std::ifstream file(path);
  for (std::string line; std::getline(file, line);) {
    const size_t space = line.find(' ');
    if (space != std::string::npos) digests[line.substr(space + 1)] = line.substr(0, space);
  }
  return digests;
}

// False if one of many threads sees something else than this one has.
bool AreThreadsAlike(int count, const std::vector<Digests>& expected) {
  std::vector<int> differences(static_cast<size_t>(count), 0);
  std::vector<std::thread> threads;
  threads.reserve(differences.size());
  for (size_t t = 0; t < differences.size(); ++t) {
    // Each begins elsewhere, so that neighbours have other things to report.
    threads.emplace_back([t, &differences, &expected] {
      for (size_t k = 0; k < kAreaCount; ++k) {
        const size_t i = (t * 5 + k) % kAreaCount;
        if (kAreas[i].isReentrant) differences[t] += DigestsOf(kAreas[i]) != expected[i];
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  int sum = 0;
  for (const int number : differences) sum += number;
  return sum == 0;
}

int Run(int threads, const char* file) {
  std::vector<Digests> digests(kAreaCount);
  for (size_t i = 0; i < kAreaCount; ++i) {
    digests[i] = DigestsOf(kAreas[i]);
    for (const auto& [name, value] : digests[i]) {
      std::printf("%s %s\n", Hex(value).c_str(), name.c_str());
    }
  }
  int status = 0;
  if (threads > 0 && !AreThreadsAlike(threads, digests)) {
    std::fprintf(stderr, "digest: threads give different results\n");
    status = 1;
  }
  if (!file) return status;
  const auto expected = Read(file);
  for (size_t i = 0; i < kAreaCount; ++i) {
    for (const auto& [name, value] : digests[i]) {
      const auto line = expected.find(name);
      if (line != expected.end() && line->second == Hex(value)) continue;
      std::fprintf(stderr, "digest: %s differs%s\n", name.c_str(),
                   kAreas[i].usesLibm ? ", as it may on another platform" : "");
      if (!kAreas[i].usesLibm) status = 1;
    }
  }
  return status;
}

}  // namespace

int main(int argc, char** argv) {
  int threads = 0;
  const char* file = nullptr;
  for (int i = 1; i < argc; ++i) {
    const bool hasValue = i + 1 < argc;
    if (hasValue && std::strcmp(argv[i], "--threads") == 0) {
      threads = static_cast<int>(std::strtol(argv[++i], nullptr, 10));
    } else if (hasValue && std::strcmp(argv[i], "--compare") == 0) {
      file = argv[++i];
    } else {
      std::fputs(kUsage, stderr);
      return 2;
    }
  }
  U_SetLogCallback([](void*, int32_t, const char*, const char*, const char*) {}, nullptr);
  if (M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr) != 0) return 3;
  const int status = Run(threads, file);
  return M_Death() == 0 ? status : 3;
}
