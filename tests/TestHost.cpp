#include "TestHost.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "Mp_Strs.h"
#include "XLOG.h"

thread_local TestHost host;
thread_local TestMemory memory;

namespace {

thread_local char buffer[4096];
thread_local int32_t lastError = 99;

template <class... Args>
void Note(const char* format, Args... args) {
  char text[sizeof buffer + 100];
  std::snprintf(text, sizeof text, format, args...);
  host.calls.emplace_back(text);
  if (host.state) host.calls.back().append(host.state());
}

int32_t Answer(int32_t usual) { return host.answers < 0 ? usual : host.answers; }

// Filled, so that a table nobody has filled is noticed.
U_Handle Allocate(size_t bytes) {
  const bool fails = host.failing & 1;
  if (host.reclaiming & 1 && !host.handles.empty()) Reclaim(host.handles.back());
  host.failing >>= 1;
  host.reclaiming >>= 1;
  if (fails) return nullptr;
  host.handles.push_back(new void*(std::memset(std::malloc(bytes), 0xEE, bytes)));
  return host.handles.back();
}

}  // namespace

void Reclaim(U_Handle handle) { std::free(std::exchange(*handle, nullptr)); }

void FreeHandles() {
  for (; !host.handles.empty(); host.handles.pop_back()) {
    Reclaim(host.handles.back());
    delete host.handles.back();
  }
}

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
  Note("allocate %x %s %zu", id, name, bytes);
  return Allocate(bytes);
}

U_Handle U_AllocateHandleQuiet(size_t bytes) {
  Note("allocate %zu", bytes);
  return Allocate(bytes);
}

void U_FreeHandle(U_Handle handle) {
  Note("%s", "free");
  EXPECT_EQ(std::erase(host.handles, handle), 1u) << "freed, but not given";
  Reclaim(handle);
  delete handle;
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
  Note("%x %d %s", id, severity, buffer);
  return Answer(77);
}

int32_t Up_ReportErrString(uint32_t id, int32_t severity, const char* text) {
  Note("%x %d %s", id, severity, text);
  return Answer(78);
}

int32_t Up_ReportVarkErrString(uint32_t id, int32_t severity, int32_t hostError, const char* text) {
  Note("%x %d host %d %s", id, severity, hostError, text ? text : "-");
  return Answer(hostError);
}

int32_t U_TranslateAndReportException(const std::exception& thrown) {
  Note("exception %s", thrown.what());
  return Answer(79);
}

int64_t WideMultiply(int32_t a, int32_t b) {
  Note("multiply %d %d", a, b);
  return int64_t{a} * b;
}

void XLOG_Log(int32_t level, const char* component, const char* event, const char* text) {
  Note("log %d %s %s %s", level, component, event, text);
}

}  // extern "C"
