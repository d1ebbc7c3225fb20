#include "TestHost.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "Mp_Strs.h"
#include "U.h"
#include "XLOG.h"

TestHost host;

namespace {

char buffer[4096];
int32_t lastError = 99;

template <class... Args>
void Note(const char* format, Args... args) {
  char text[sizeof buffer + 100];
  std::snprintf(text, sizeof text, format, args...);
  host.calls.emplace_back(text);
  ++host.touches;
}

// Filled, so that a table nobody has filled is noticed.
U_Handle Allocate(size_t bytes) {
  ++host.allocations;
  if (std::count(host.failing.begin(), host.failing.end(), host.allocations)) return nullptr;
  if (std::count(host.reclaiming.begin(), host.reclaiming.end(), host.allocations)) {
    std::free(std::exchange(*host.lastHandle, nullptr));
  }
  ++host.handles;
  return host.lastHandle = new void*(std::memset(std::malloc(bytes), 0xEE, bytes));
}

}  // namespace

void* operator new(size_t bytes) {
  ++host.news;
  const bool fails = host.newToFail > 0 && --host.newToFail == 0;
  void* const block = fails ? nullptr : std::malloc(bytes);
  if (!block) throw std::bad_alloc();
  ++host.blocks;
  return block;
}
void operator delete(void* block) noexcept {
  if (block) --host.blocks;
  std::free(block);
}
void* U_MemTrackedObject::TrackedNew(size_t bytes, bool) {
  ++host.trackedBlocks;
  return std::malloc(host.trackedBytes = bytes);
}
void U_MemTrackedObject::TrackedDelete(void* block) {
  --host.trackedBlocks;
  std::free(block);
}

// Named, too, because a sanitizer's own does not come here.
void* operator new[](size_t bytes) { return operator new(bytes); }
void operator delete[](void* block) noexcept { operator delete(block); }
void operator delete[](void* block, size_t) noexcept { operator delete(block); }
void operator delete(void* block, size_t) noexcept { operator delete(block); }

extern "C" {

U_Handle U_AllocateHandle(uint32_t id, const char* name, size_t bytes) {
  Note("allocate %x %s %zu", id, name, bytes);
  return Allocate(bytes);
}

U_Handle U_AllocateHandleQuiet(size_t bytes) {
  Note("allocate %zu", bytes);
  return Allocate(bytes);
}

void U_FreeHandle(U_Handle handle) {
  Note("%s", "free");
  std::free(*handle);
  delete handle;
  --host.handles;
}

const char* U_ZLookupLStrCache(const void* header, int32_t index, int32_t x, int32_t y) {
  ++host.touches;
  EXPECT_EQ(x | y, 0);
  const auto* const strings = static_cast<const Mp_StrHeader*>(header);
  EXPECT_STREQ(strings->component, "M");
  if (index < 0 || static_cast<uint64_t>(index) + 1 >= strings->count) return "(no such text)";
  return std::strchr(strings->table[index].key, '=') + 1;
}

char* Up_GetThreadLoggingBuffer(void) {
  ++host.touches;
  return buffer;
}

void Up_SetThreadLastError(int32_t error) {
  ++host.touches;
  lastError = error;
  std::strcpy(buffer, "(not written)");
}

int32_t Up_ReportError(uint32_t id, int32_t severity) {
  EXPECT_EQ(std::exchange(lastError, 99), 0) << "cleared before a message is written";
  Note("%x %d %s", id, severity, buffer);
  return 77;
}

int32_t Up_ReportErrString(uint32_t id, int32_t severity, const char* text) {
  Note("%x %d %s", id, severity, text);
  return 78;
}

int32_t Up_ReportVarkErrString(uint32_t id, int32_t severity, int32_t hostError, const char* text) {
  Note("%x %d host %d %s", id, severity, hostError, text ? text : "-");
  return host.reportResult != 0 ? host.reportResult : hostError;
}

int32_t U_TranslateAndReportException(const std::exception& thrown) {
  Note("exception %s", thrown.what());
  return 79;
}

int64_t WideMultiply(int32_t a, int32_t b) {
  ++host.touches;
  return int64_t{a} * b;
}

void XLOG_Log(int32_t level, const char* component, const char* event, const char* text) {
  Note("log %d %s %s %s", level, component, event, text);
}

}  // extern "C"
