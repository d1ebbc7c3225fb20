#include <cstdio>

#include "M_Utils.h"

int main() {
  // A prediction of a product may warn in vain: it counts bits, and 46340 x 46340 fits.
  std::printf("%d\n", M_AddWouldOverflow(2147483647, 1));  // -> 1
  std::printf("%d\n", M_MulWouldOverflow(46340, 46340));   // -> 1
  std::printf("%d\n", M_MulWouldOverflow(65536, 65536));   // -> 1
}
