#include <cstdio>

#include "M_Rect.h"

int main() {
  M_Point p;
  M_SetPt(&p, 10, 20);
  const M_Point step = {-5, 1};  // the vertical value first
  M_AddPt(step, &p);
  std::printf("%d %d\n", p.h, p.v);  // -> 11 15
}
