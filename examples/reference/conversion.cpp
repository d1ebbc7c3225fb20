#include <cstdio>

#include "M_Rect.h"

int main() {
  const M_FixedRect r = {0x8000, 0x8000, 0x18000, 0x18000};  // 0.5 to 1.5
  M_LRect in, out;
  M_FixedRect2LRectIn(&r, &in);
  M_FixedRect2LRectOut(&r, &out);
  std::printf("%d %d, %d %d\n", in.left, in.right, out.left, out.right);  // -> 1 1, 0 2
}
