#include <cstdio>

#include "M_Utils.h"

int main() {
  // A frame of film on video and a clock of 600 units: no rounding, ever.
  const M_Ratio frame = {1001, 30000}, tick = {1, 600};
  M_Ratio time;
  if (M_AddRatio(&frame, &tick, &time, nullptr) != 0) return 1;
  std::printf("%d/%u\n", time.num, time.den);  // -> 1051/30000

  // The same in 90000ths of a second, if that is exact.
  M_Ratio stamp;
  unsigned char isExact;
  if (M_ConvRatio(&time, 90000, &stamp, &isExact, nullptr) != 0) return 1;
  std::printf("%d/%u %d\n", stamp.num, stamp.den, isExact);  // -> 3153/90000 1

  // A measured rate as a ratio.
  M_Ratio rate;
  M_FpLong2Ratio(&rate, nullptr, 12.5);
  std::printf("%d/%u\n", rate.num, rate.den);  // -> 25/2
}
