#include <cstdio>

#include "M_Rect.h"

int main() {
  const M_LRect a = {0, 0, 10, 10}, b = {5, 5, 20, 8};
  M_LRect both, either;
  const int32_t meet = M_SectLRect(&a, &b, &both);
  std::printf("%d: %d %d %d %d\n", meet, both.left, both.top, both.right,
              both.bottom);  // -> 1: 5 5 10 8
  M_UnionLRect(&a, &b, &either);
  std::printf("%d %d\n", either.right, either.bottom);  // -> 20 10
}
