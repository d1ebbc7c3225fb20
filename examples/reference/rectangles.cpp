#include <cstdio>

#include "M_Rect.h"

int main() {
  const M_LRect screen = {0, 0, 1920, 1080};
  M_LRect window = {0, 0, 640, 480};
  M_CenterLRect(&screen, &window);
  std::printf("%d %d\n", window.left, window.top);  // -> 640 300
  M_InsetLRect(&window, 400, 0);
  std::printf("%d\n", M_EmptyLRect(&window));  // -> 1
}
