/// \file
/// XLOG.h: the host's logging library, as far as M calls it.
#ifndef XLOG_H
#define XLOG_H

#include <cstdint>

#pragma GCC visibility push(default)
extern "C" {

/// Writes a line to the host's log: a level (greater is less important), the component that logs,
/// the event and a text for people.
void XLOG_Log(int32_t level, const char* component, const char* event, const char* text);
}
#pragma GCC visibility pop

#endif  // XLOG_H
