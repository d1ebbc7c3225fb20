#include "TestHost.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "Mp_Strs.h"
#include "XLOG.h"

namespace {

thread_local char buffer[4096];
thread_local int32_t lastError = 99;

// Records a call, and gives what it answers.
template <class... Args>
int32_t Answer(int32_t usual, const char* format, Args... args) {
  char text[sizeof buffer + 100];
  std::snprintf(text, sizeof text, format, args...);
  host.calls.emplace_back(text);
  if (host.state) host.calls.back().append(host.state());
  return host.answers < 0 ? usual : host.answers;
}

void Reclaim(U_Handle handle) { std::free(std::exchange(*handle, nullptr)); }
void Delete(U_Handle handle) {
  Reclaim(handle);
  delete handle;
}

// The block is filled, so that a table nobody has filled is noticed.
U_Handle Allocate(size_t bytes) {
  const unsigned mood = std::exchange(host.moods, host.moods >> 3);
  for (const auto& handle : host.handles) {
    if (mood & TestHost::kReclaims) Reclaim(handle.get());
  }
  if (mood & TestHost::kFails) return nullptr;
  host.handles.emplace_back(new void*(std::memset(std::malloc(bytes), 0xEE, bytes)), Delete);
  if (mood & TestHost::kReclaimsThis) Reclaim(host.handles.back().get());
  return host.handles.back().get();
}

}  // namespace

void* operator new(size_t bytes) {
  ++memory.news;
  const bool fails = memory.newToFail > 0 && --memory.newToFail == 0;
  void* const block = fails ? nullptr : std::malloc(bytes);
  if (!block) throw std::bad_alloc();
  ++memory.blocks;
  return block;
}
void operator delete(void* block) noexcept {
  if (block) --memory.blocks;
  std::free(block);
}
void operator delete(void* block, size_t) noexcept { operator delete(block); }
// Named, too, because a sanitizer's own does not come here.
void* operator new[](size_t bytes) { return operator new(bytes); }
void operator delete[](void* block) noexcept { operator delete(block); }
void operator delete[](void* block, size_t) noexcept { operator delete(block); }

void* U_MemTrackedObject::TrackedNew(size_t bytes, bool mayFail) {
  EXPECT_FALSE(mayFail);
  ++memory.trackedBlocks;
  return std::malloc(memory.trackedBytes = bytes);
}
void U_MemTrackedObject::TrackedDelete(void* block) {
  --memory.trackedBlocks;
  std::free(block);
}

extern "C" {

U_Handle U_AllocateHandle(uint32_t id, const char* name, size_t bytes) {
  Answer(0, "allocate %x %s %zu", id, name, bytes);
  return Allocate(bytes);
}
U_Handle U_AllocateHandleQuiet(size_t bytes) {
  Answer(0, "allocate %zu", bytes);
  return Allocate(bytes);
}
void U_FreeHandle(U_Handle handle) {
  Answer(0, "%s", "free");
  const auto isIt = [&](const auto& given) { return given.get() == handle; };
  EXPECT_EQ(std::erase_if(host.handles, isIt), 1u) << "freed, but not given";
}

const char* U_ZLookupLStrCache(const void* header, int32_t index, int32_t x, int32_t y) {
  EXPECT_EQ(x | y, 0);
  EXPECT_EQ(header, &M_G_zhdr);
  if (index < 0 || static_cast<uint64_t>(index) + 1 >= M_G_zhdr.count) return "(no such text)";
  return std::strchr(M_G_zhdr.table[index].key, '=') + 1;
}

char* Up_GetThreadLoggingBuffer(void) { return buffer; }
void Up_SetThreadLastError(int32_t error) {
  lastError = error;
  std::strcpy(buffer, "(not written)");
}
int32_t Up_ReportError(uint32_t id, int32_t severity) {
  EXPECT_EQ(std::exchange(lastError, 99), 0) << "cleared before a message is written";
  return Answer(77, "%x %d %s", id, severity, buffer);
}
int32_t Up_ReportErrString(uint32_t id, int32_t severity, const char* text) {
  return Answer(78, "%x %d %s", id, severity, text);
}
int32_t Up_ReportVarkErrString(uint32_t id, int32_t severity, int32_t hostError, const char* text) {
  return Answer(hostError, "%x %d host %d %s", id, severity, hostError, text ? text : "-");
}
int32_t U_TranslateAndReportException(const std::exception& thrown) {
  return Answer(79, "exception %s", thrown.what());
}

int64_t WideMultiply(int32_t a, int32_t b) {
  Answer(0, "multiply %d %d", a, b);
  return int64_t{a} * b;
}
void XLOG_Log(int32_t level, const char* component, const char* event, const char* text) {
  Answer(0, "log %d %s %s %s", level, component, event, text);
}

}  // extern "C"
