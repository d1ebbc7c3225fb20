// Handles whose blocks can be reclaimed, and tracked memory.

#include <atomic>
#include <cstdlib>
#include <new>

#include "U.h"

namespace {

std::atomic<size_t> handles;
std::atomic<size_t> handleBytes;
std::atomic<size_t> trackedBlocks;
std::atomic<size_t> trackedBytes;

constexpr int32_t kSeverityError = 8;
constexpr int32_t kOutOfMemory = 4;

// What a handle points into: its first member is the data pointer.
struct HandleRecord {
  void* data;
  size_t bytes;
};

HandleRecord* RecordOf(U_Handle handle) { return reinterpret_cast<HandleRecord*>(handle); }

void FreeBlock(HandleRecord* record) {
  std::free(record->data);
  handleBytes -= record->bytes;
  *record = {nullptr, 0};
}

U_Handle AllocateHandle(size_t bytes) {
  auto* const record = new (std::nothrow) HandleRecord{std::malloc(bytes), bytes};
  if (!record) return nullptr;
  if (!record->data) {
    delete record;
    return nullptr;
  }
  ++handles;
  handleBytes += bytes;
  return &record->data;
}

// Stands before each tracked block and keeps the block's alignment.
struct alignas(std::max_align_t) TrackedHeader {
  size_t bytes;
};

}  // namespace

extern "C" {

U_Handle U_AllocateHandle(uint32_t id, const char* name, size_t bytes) {
  const U_Handle handle = AllocateHandle(bytes);
  if (!handle) Up_ReportVarkErrString(id, kSeverityError, kOutOfMemory, name);
  return handle;
}

U_Handle U_AllocateHandleQuiet(size_t bytes) { return AllocateHandle(bytes); }

void U_FreeHandle(U_Handle handle) {
  if (!handle) return;
  FreeBlock(RecordOf(handle));
  delete RecordOf(handle);
  --handles;
}

void U_ReclaimHandle(U_Handle handle) { FreeBlock(RecordOf(handle)); }

U_MemoryUse U_GetMemoryUse(void) { return {handles, handleBytes, trackedBlocks, trackedBytes}; }

}  // extern "C"

void* U_MemTrackedObject::TrackedNew(size_t bytes, bool mayFail) {
  void* const memory = bytes <= SIZE_MAX - sizeof(TrackedHeader)
                           ? std::malloc(sizeof(TrackedHeader) + bytes)
                           : nullptr;
  if (!memory) {
    if (mayFail) return nullptr;
    throw std::bad_alloc();
  }
  ++trackedBlocks;
  trackedBytes += bytes;
  return new (memory) TrackedHeader{bytes} + 1;
}

void U_MemTrackedObject::TrackedDelete(void* block) {
  if (!block) return;
  TrackedHeader* const header = static_cast<TrackedHeader*>(block) - 1;
  --trackedBlocks;
  trackedBytes -= header->bytes;
  std::free(header);
}
