// The platform's core services, as far as M calls them.

#include "U.h"

extern "C" int64_t WideMultiply(int32_t a, int32_t b) { return int64_t{a} * b; }
