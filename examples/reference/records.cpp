#include <cstdio>

#include "M_Rect.h"

int main() {
  // Half-open: column 100 and row 50 are the first ones outside.
  const M_LRect longs = {0, 0, 100, 50};
  const M_Rect shorts = {0, 0, 50, 100};                // the vertical values first
  std::printf("%d %d\n", longs.right, longs.bottom);    // -> 100 50
  std::printf("%d %d\n", shorts.right, shorts.bottom);  // -> 100 50
}
