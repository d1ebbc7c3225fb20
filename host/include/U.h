/// \file
/// U.h: the host's utility library: memory handles, messages, reports, tracked memory.
///
/// The first part is the interface that M calls; an application that brings its own host defines
/// these functions. The second part is what this stand-in offers to the applications that use it.
/// All of it may be called from any thread; only the contents of a handle are the caller's to
/// guard.
#ifndef U_H
#define U_H

#include <cstddef>
#include <cstdint>
#include <exception>

#pragma GCC visibility push(default)

// ---------------------------------------------------------------------------------------------
/// \defgroup host_interface What M calls
/// \{
// ---------------------------------------------------------------------------------------------

extern "C" {

/// Points to the block's data pointer, which is null once the block has been reclaimed.
typedef void** U_Handle;

/// A block of `bytes` bytes. Null on failure, which is reported under `id` with the name.
U_Handle U_AllocateHandle(uint32_t id, const char* name, size_t bytes);

/// As U_AllocateHandle(), without a report.
U_Handle U_AllocateHandleQuiet(size_t bytes);

/// Frees the handle and its block. Null is allowed.
void U_FreeHandle(U_Handle handle);

/// The text of entry `index` of the message table behind `header`, in the user's language. The
/// entry's key is "path/number=English text". "" where there is no such entry. The last two
/// arguments are not used.
const char* U_ZLookupLStrCache(const void* header, int32_t index, int32_t, int32_t);

/// The calling thread's buffer, in which a message stands when it is reported. It holds any text of
/// U_ZLookupLStrCache() with any other filled in.
char* Up_GetThreadLoggingBuffer(void);

/// Sets the calling thread's last error.
void Up_SetThreadLastError(int32_t error);

/// Reports the message in the thread's buffer. The last error becomes the identifier, which is
/// returned.
int32_t Up_ReportError(uint32_t id, int32_t severity);

/// As Up_ReportError() with a text of its own, which may be null.
int32_t Up_ReportErrString(uint32_t id, int32_t severity, const char* text);

/// As Up_ReportErrString() for one of the host's error numbers, which is returned and becomes the
/// last error.
int32_t Up_ReportVarkErrString(uint32_t id, int32_t severity, int32_t hostError, const char* text);

/// Reports an exception; returns the error it stands for: 4 for want of memory, else 1.
int32_t U_TranslateAndReportException(const std::exception& thrown);

/// The 64-bit product.
int64_t WideMultiply(int32_t a, int32_t b);

}  // extern "C"

/// Memory that the host keeps count of.
struct U_MemTrackedObject {
  /// A block, never null unless `mayFail`: without it a failure throws std::bad_alloc.
  static void* TrackedNew(size_t bytes, bool mayFail);
  /// Null is allowed.
  static void TrackedDelete(void* block);
};

/// A standard allocator of tracked memory.
template <class T>
class U_Allocator {
 public:
  using value_type = T;  ///< As the standard wants it.

  /// All are alike.
  U_Allocator() = default;
  /// \copydoc U_Allocator
  template <class Other>
  U_Allocator(const U_Allocator<Other>&) {}

  /// Room for so many, or std::bad_alloc.
  T* allocate(size_t count) {
    if (count > SIZE_MAX / sizeof(T)) count = SIZE_MAX / sizeof(T);
    return static_cast<T*>(U_MemTrackedObject::TrackedNew(count * sizeof(T), false));
  }
  /// Gives it back.
  void deallocate(T* block, size_t) { U_MemTrackedObject::TrackedDelete(block); }
};

/// All are equal.
template <class T, class Other>
bool operator==(const U_Allocator<T>&, const U_Allocator<Other>&) {
  return true;
}
/// None differs from another.
template <class T, class Other>
bool operator!=(const U_Allocator<T>&, const U_Allocator<Other>&) {
  return false;
}

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup host_stand_in What this stand-in offers beyond that
/// \{
// ---------------------------------------------------------------------------------------------

extern "C" {

/// Reclaims a handle's block: its data pointer becomes null, the handle stays.
void U_ReclaimHandle(U_Handle handle);

/// What is allocated. Reclaimed blocks count as handles of 0 bytes.
struct U_MemoryUse {
  size_t handles;        ///< Not freed.
  size_t handleBytes;    ///< Of their blocks.
  size_t trackedBlocks;  ///< Not freed.
  size_t trackedBytes;   ///< Of these.
};
/// What is allocated at this moment.
U_MemoryUse U_GetMemoryUse(void);

/// The calling thread's last error: 0, an identifier or a host error number.
int32_t Up_GetThreadLastError(void);

/// One report.
struct U_Report {
  uint32_t id;        ///< Who reports: for M 0x110000 and the number of the place.
  int32_t severity;   ///< 8 an error, 4 a warning.
  int32_t hostError;  ///< One of the host's error numbers, or 0.
  const char* text;   ///< In the user's language; never null.
};

/// Receives every report, on the thread that reports, while it is reported; it may report in turn.
typedef void (*U_ReportCallback)(void* context, const U_Report* report);

/// From now on `callback` receives every report, with `context`. Null stands for a line on standard
/// error. A callback that was replaced may still be running on another thread.
void U_SetReportCallback(U_ReportCallback callback, void* context);

/// Receives every log line, on the thread that logs.
typedef void (*U_LogCallback)(void* context, int32_t level, const char* component,
                              const char* event, const char* text);

/// From now on `callback` receives every log line, as U_SetReportCallback() has it. Null stands for
/// a line on standard error where the environment has a variable U_LOG when the first line comes,
/// and for nothing where it has none.
void U_SetLogCallback(U_LogCallback callback, void* context);

/// Where the translations are: the folder above LANGUAGE/LC_MESSAGES/COMPONENT.mo. Null stands for
/// the folder that belongs to this library's place on the disk. The language is the environment's,
/// once the application has called setlocale(LC_ALL, "").
void U_SetMessageFolder(const char* folder);

}  // extern "C"

/// \}

#pragma GCC visibility pop

#endif  // U_H
