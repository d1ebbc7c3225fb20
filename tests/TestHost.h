/// \file
/// A host of the tests' own, which takes the stand-in's place in their executable. It records every
/// call in order, with its arguments and the library's state at that moment, answers what a test
/// wants, fails any allocation and reclaims at any moment. Each thread has its own.
#ifndef TESTS_TEST_HOST_H
#define TESTS_TEST_HOST_H

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "U.h"

using Calls = std::vector<std::string>;

struct TestHost {
  Calls calls;                       ///< In order, as text.
  std::string (*state)() = nullptr;  ///< What to append to each call.
  int answers = -1;                  ///< What reports return; -1 for what is usual.
  unsigned failing = 0;           ///< Allocations of handles that fail, a bit each; the first is 1.
  unsigned reclaiming = 0;        ///< Allocations at which the block given before is reclaimed.
  std::vector<U_Handle> handles;  ///< Given, and not freed.
  Calls Take() { return std::exchange(calls, {}); }
};
extern thread_local TestHost host;

/// Takes a block away, as a host may; frees all handles.
void Reclaim(U_Handle handle);
void FreeHandles();

/// Memory of this thread: plain operator new, and the host's tracked blocks.
struct TestMemory {
  int news;             ///< Calls of operator new.
  int newToFail;        ///< Which of the next ones fails; 0 for none.
  int blocks;           ///< Of operator new, not freed.
  int trackedBlocks;    ///< Not freed.
  size_t trackedBytes;  ///< Of the last one.
};
extern thread_local TestMemory memory;

#endif  // TESTS_TEST_HOST_H
