/// \file
/// A host of the tests' own, which takes the stand-in's place in their executable: it notes every
/// call as text and fails on request.
#ifndef TESTS_TEST_HOST_H
#define TESTS_TEST_HOST_H

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "U.h"

struct TestHost {
  std::vector<std::string> calls;  ///< Reports, log lines and calls about memory, in order.
  int touches = 0;                 ///< Calls of any kind.
  int allocations = 0;             ///< Attempts to allocate a handle.
  std::vector<int> failing;        ///< Attempts that fail, counted from 1.
  std::vector<int> reclaiming;     ///< Attempts at which the block given before is reclaimed.
  U_Handle lastHandle = nullptr;   ///< What was given before.
  int handles = 0;                 ///< Handles not freed.
  int trackedBlocks = 0;           ///< Tracked blocks not freed.
  size_t trackedBytes = 0;         ///< Of the last one.
  int news = 0;                    ///< Calls of operator new.
  int newToFail = 0;               ///< Which of the next ones fails; 0 for none.
  int blocks = 0;                  ///< Blocks of operator new not freed.
  int32_t reportResult = 0;        ///< What reports with a host error return; 0: the host error.
  std::vector<std::string> Take() { return std::exchange(calls, {}); }
};
extern TestHost host;

using Calls = std::vector<std::string>;

/// Begins every test with a fresh host and ends it with every call looked at.
class HostTest : public ::testing::Test {
 protected:
  void SetUp() override { host = {}; }
  void TearDown() override { EXPECT_EQ(host.calls, Calls()) << "calls that no test asked for"; }
};

#endif  // TESTS_TEST_HOST_H
