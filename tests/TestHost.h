/// \file
/// A host of the tests' own, which takes the stand-in's place in their executable. It records every
/// call in order, with its arguments and the library's state at that moment, answers what a test
/// wants, fails any allocation and reclaims at any moment. Each thread has its own.
#ifndef TESTS_TEST_HOST_H
#define TESTS_TEST_HOST_H

#include <cstdint>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "U.h"

using Calls = std::vector<std::string>;

struct TestHost {
  /// What an allocation does: reclaim what was given before, fail, give what is reclaimed at once.
  enum Mood { kReclaims = 1, kFails = 2, kReclaimsThis = 4 };

  Calls calls;                                  ///< In order, as text.
  std::string (*state)() = nullptr;             ///< What to append to each call.
  int answers = -1;                             ///< What reports return; -1 for what is usual.
  unsigned moods = 0;                           ///< Of the next allocations, three bits each.
  std::vector<std::shared_ptr<void*>> handles;  ///< Given, and not freed.
  Calls Take() { return std::exchange(calls, {}); }
};
inline thread_local TestHost host;

/// Memory of this thread: plain operator new, and the host's tracked blocks.
struct TestMemory {
  int news;             ///< Calls of operator new.
  int newToFail;        ///< Which of the next ones fails; 0 for none.
  int blocks;           ///< Of operator new, not freed.
  int trackedBlocks;    ///< Not freed.
  size_t trackedBytes;  ///< Of the last one.
};
inline thread_local TestMemory memory;

#endif  // TESTS_TEST_HOST_H
