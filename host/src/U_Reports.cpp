// Reports and log lines: the thread's buffer and last error, and the callbacks that receive them.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>

#include "U.h"
#include "U_Limits.h"
#include "XLOG.h"

namespace {

thread_local char buffer[U_BUFFER_BYTES];
thread_local int32_t lastError;

constexpr int32_t kSeverityError = 8;
constexpr uint32_t kHostId = 0x010000;
constexpr int32_t kUnknownException = 1;
constexpr int32_t kOutOfMemory = 4;

void PrintReport(void*, const U_Report* report) {
  if (report->hostError == 0) {
    std::fprintf(stderr, "[0x%06X] %s\n", static_cast<unsigned>(report->id), report->text);
  } else {
    std::fprintf(stderr, "[0x%06X] host error %d %s\n", static_cast<unsigned>(report->id),
                 static_cast<int>(report->hostError), report->text);
  }
}

void PrintLogLine(void*, int32_t level, const char* component, const char* event,
                  const char* text) {
  static const bool isWanted = std::getenv("U_LOG") != nullptr;
  if (isWanted)
    std::fprintf(stderr, "%s %s (%d): %s\n", component, event, static_cast<int>(level), text);
}

// A callback and what it is called with, replaced and read as one.
template <class Callback>
class Sink {
 public:
  explicit constexpr Sink(Callback fallback) : fallback_(fallback), callback_(fallback) {}

  void Set(Callback callback, void* context) {
    const std::lock_guard lock(mutex_);
    callback_ = callback ? callback : fallback_;
    context_ = context;
  }

  // Calls without the lock, so that the callback may report in turn.
  template <class... Args>
  void Call(Args... args) {
    std::unique_lock lock(mutex_);
    const Callback callback = callback_;
    void* const context = context_;
    lock.unlock();
    callback(context, args...);
  }

 private:
  std::mutex mutex_;
  const Callback fallback_;
  Callback callback_;
  void* context_ = nullptr;
};

constinit Sink<U_ReportCallback> reportSink(PrintReport);
constinit Sink<U_LogCallback> logSink(PrintLogLine);

// The callback may do something that reports in turn; afterwards the thread's message and last
// error are this report's again.
void Send(uint32_t id, int32_t severity, int32_t hostError, const char* text) {
  char message[U_BUFFER_BYTES];
  std::memcpy(message, buffer, sizeof message);
  const int32_t error = hostError != 0 ? hostError : static_cast<int32_t>(id);
  const U_Report report = {id, severity, hostError, text == buffer ? message : text ? text : ""};
  lastError = error;
  reportSink.Call(&report);
  lastError = error;
  std::memcpy(buffer, message, sizeof message);
}

}  // namespace

extern "C" {

char* Up_GetThreadLoggingBuffer(void) { return buffer; }

void Up_SetThreadLastError(int32_t error) { lastError = error; }

int32_t Up_GetThreadLastError(void) { return lastError; }

int32_t Up_ReportError(uint32_t id, int32_t severity) {
  Send(id, severity, 0, buffer);
  return static_cast<int32_t>(id);
}

int32_t Up_ReportErrString(uint32_t id, int32_t severity, const char* text) {
  Send(id, severity, 0, text);
  return static_cast<int32_t>(id);
}

int32_t Up_ReportVarkErrString(uint32_t id, int32_t severity, int32_t hostError, const char* text) {
  Send(id, severity, hostError, text);
  return hostError;
}

int32_t U_TranslateAndReportException(const std::exception& thrown) {
  const bool isMemory = dynamic_cast<const std::bad_alloc*>(&thrown) != nullptr;
  const int32_t error = isMemory ? kOutOfMemory : kUnknownException;
  Send(kHostId, kSeverityError, error, thrown.what());
  return error;
}

void U_SetReportCallback(U_ReportCallback callback, void* context) {
  reportSink.Set(callback, context);
}

void U_SetLogCallback(U_LogCallback callback, void* context) { logSink.Set(callback, context); }

void XLOG_Log(int32_t level, const char* component, const char* event, const char* text) {
  logSink.Call(level, component, event, text);
}

}  // extern "C"
