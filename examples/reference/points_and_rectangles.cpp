#include <cstdio>

#include "M_Rect.h"

int main() {
  const M_LRect r = {10, 10, 20, 20};
  const M_LPoint corner = {10, 10}, opposite = {20, 20};
  std::printf("%d %d\n", M_LPtInRect(&corner, &r), M_LPtInRect(&opposite, &r));  // -> 1 0
}
