#include <iostream>

#include "M_Ops.h"

int main() {
  constexpr M_LRect frame = {0, 0, 1920, 1080}, layer = {-100, 900, 300, 1300};
  constexpr M_LRect seen = layer & frame;
  std::cout << seen.right - seen.left << " x " << seen.bottom - seen.top << '\n';  // -> 300 x 180
  const M_LRect both = layer | frame;
  std::cout << both.left << ", " << both.bottom << '\n';              // -> -100, 1300
  std::cout << M_Contains(frame, M_LPoint{1919, 0}) << '\n';          // -> 1
  std::cout << M_Contains(frame, M_LPoint{1920, 0}) << '\n';          // -> 0
  std::cout << M_IsEmpty(frame & M_LRect{2000, 0, 2100, 9}) << '\n';  // -> 1
  // 16.16, half a pixel each way: the whole pixels around it.
  const M_FixedRect fixed = {0x8000, 0x8000, 0x18000, 0x18000};
  std::cout << M_ToLRect(fixed, M_RectRounding::Out).right << '\n';  // -> 2
}
