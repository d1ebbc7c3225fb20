// Adds two ratios and shows an overflow's report.

#include <cstdio>

#include "M_Utils.h"

static void Print(void*, const U_Report* report) {
  std::printf("%x %s\n", report->id, report->text);
}

int main() {
  U_SetReportCallback(Print, nullptr);
  const M_Ratio half = {1, 2};
  const M_Ratio third = {1, 3};
  M_Ratio sum;
  M_AddRatio(&half, &third, &sum, nullptr);
  std::printf("%d/%u\n", sum.num, sum.den);
  const M_Ratio large = {0x40000000, 1};
  return M_AddRatio(&large, &large, &sum, nullptr) == M_ERR_OVERFLOW ? 0 : 1;
}
