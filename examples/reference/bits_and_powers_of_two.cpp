#include <cstdio>

#include "M_Utils.h"

int main() {
  // A texture for 1920 pixels, and how many levels it has.
  const uint32_t width = M_RoundUpToPowerOf2(1920);
  std::printf("%u %d\n", width, M_TrailingZeros(width) + 1);  // -> 2048 12
  std::printf("%d\n", M_LeadingZeros(1));                     // -> 31
  std::printf("%d\n", M_BitsUsed(1920));                      // -> 11
}
