/// \file
/// How long a message may be, so that no message can overrun the buffer it is written into.
#ifndef U_LIMITS_H
#define U_LIMITS_H

#include <cstddef>

/// Longest text that a lookup gives out, its final null included.
inline constexpr size_t U_TEXT_BYTES = 1024;

/// A text with another filled in, or with a number of 64 bits at most.
inline constexpr size_t U_BUFFER_BYTES = 2 * U_TEXT_BYTES;

#endif  // U_LIMITS_H
