#include <cstdio>

#include "M_Utils.h"

int main() {
  // Once in a program, before the tables are used.
  uint32_t granted;
  if (M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, &granted) != 0) return 1;
  std::printf("%d\n", granted == (M_SERVICE_TRIG | M_SERVICE_FCMD));  // -> 1
  return M_Death();
}
