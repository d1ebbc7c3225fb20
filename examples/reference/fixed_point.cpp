#include <cstdio>

#include "M_Utils.h"

int main() {
  const M_Fixed half = 0x8000, three = 3 << 16;
  std::printf("%g\n", M_FixMul(half, three) / 65536.0);        // -> 1.5
  std::printf("%g\n", M_FixDiv(three, half) / 65536.0);        // -> 6
  std::printf("%g\n", M_Fix24Ratio(1001, 8000) / 16777216.0);  // -> 0.125125
}
