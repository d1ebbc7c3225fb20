/// \file
/// The private integer entry point.
#ifndef MP_UTILS_H
#define MP_UTILS_H

#include <cstdint>

#pragma GCC visibility push(default)
extern "C" {

/// The signed 64-bit product: out[0] its high 32 bits, out[1] its low 32 bits. Always 0.
int32_t Mp_LongMul(int32_t a, int32_t b, int32_t out[2]);
}
#pragma GCC visibility pop

#endif  // MP_UTILS_H
