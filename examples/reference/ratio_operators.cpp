#include <iostream>
#include <unordered_set>

#include "M_Ops.h"

int main() {
  constexpr M_Ratio frame = "1001/30000"_ratio;
  std::cout << frame + M_Ratio{1, 600} << '\n';              // -> 1051/30000
  std::cout << M_ParseRatio("23.976").value() << '\n';       // -> 2997/125
  std::cout << M_RatioOf(48000) / frame << '\n';             // -> 1440000000/1001
  std::cout << (M_Ratio{1, 2} == M_Ratio{2, 4}) << '\n';     // -> 1
  std::cout << (frame < M_Ratio{1, 30}) << '\n';             // -> 0
  std::cout << M_Ratio{1 << 30, 1} * M_Ratio{1, 1} << '\n';  // -> 1073741824
  const std::unordered_set<M_Ratio> rates = {{24, 1}, {48, 2}, {25, 1}};
  std::cout << rates.size() << '\n';  // -> 2
  try {
    std::cout << M_Ratio{1 << 30, 1} * M_Ratio{4, 1};
  } catch (int code) {                              // It has been reported.
    std::cout << (code == M_ERR_OVERFLOW) << '\n';  // -> 1
  }
}
