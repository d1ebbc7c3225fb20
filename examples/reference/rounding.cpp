#include <cstdio>

#include "M_Utils.h"

int main() {
  std::printf("%d %d\n", M_RoundDouble(2.5), M_RoundDouble(-2.5));  // -> 3 -2
  std::printf("%d\n", M_RoundDoubleSafe(1e12));                     // -> 2147483647
  std::printf("%d\n", M_RoundToNearestMult(17, 8));                 // -> 16
}
