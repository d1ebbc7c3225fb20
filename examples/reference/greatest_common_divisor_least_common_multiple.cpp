#include <cstdio>

#include "M_Utils.h"

int main() {
  // After how many samples at 48000 a second a frame at 25 a second begins with a sample again.
  uint32_t gcd, lcm;
  M_UnsignedGCD(48000, 25, &gcd);
  M_UnsignedLCM(1920, 1001, &lcm);
  std::printf("%u %u\n", gcd, lcm);  // -> 25 1921920
}
