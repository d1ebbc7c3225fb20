#include <cstdio>

#include "M_Utils.h"

int main() {
  M_Birth(M_SERVICE_FCMD, nullptr);
  // Half-transparent grey, a pixel at a time: as long as the tables are lent they stay in place.
  const unsigned char* mul;
  const unsigned char* div;
  unsigned char isReady;
  if (M_PrepareFCMD(true, false, &isReady, &mul, &div) != 0) return 1;
  const int premultiplied = mul[200 * 256 + 128];
  std::printf("%d\n", premultiplied);                   // -> 100
  std::printf("%d\n", div[128 * 256 + premultiplied]);  // -> 199
  M_UnprepareFCMD();
  return M_Death();
}
