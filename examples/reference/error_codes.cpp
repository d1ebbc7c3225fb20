#include <cstdio>

#include "M_Utils.h"

int main() {
  const M_Ratio half = {1, 2}, broken = {1, 0};
  M_Ratio sum;
  unsigned char status = 0;  // Given one, the function leaves overflows to the client.
  const int32_t code = M_AddRatio(&half, &broken, &sum, &status);
  std::printf("%d\n", code == M_ERR_ZERO_DENOMINATOR);  // -> 1
}
