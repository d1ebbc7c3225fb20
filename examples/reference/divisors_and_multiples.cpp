#include <cstdio>

#include "M_Utils.h"

int main() {
  // At 48000 samples a second a frame at 25 a second has 1920. A frame and a block of 1024 samples
  // begin together every
  uint32_t samples, common;
  M_UnsignedLCM(1920, 1024, &samples);
  std::printf("%u\n", samples);  // -> 15360
  M_UnsignedGCD(1920, 1024, &common);
  std::printf("%u\n", common);  // -> 128
}
