// The message table's layout and texts, and the one reporting routine.

#include <cstring>

#include "M_Utils.h"
#include "Mp_Err.h"
#include "Mp_Strs.h"
#include "TestHost.h"

namespace {

TEST(MessageTable, Layout) {
  EXPECT_STREQ(M_G_zhdr.component, "M");
  EXPECT_EQ(M_G_zhdr.count, 43u);
  EXPECT_EQ(M_G_zhdr.table, M_G_ztab);
  EXPECT_EQ(M_G_zhdr.reserved, 0u);
  EXPECT_EQ(M_G_zref.header, &M_G_zhdr);
  EXPECT_EQ(M_G_zref.reserved, 0u);
  uint64_t hash = 0xCBF29CE484222325;  // FNV-1a
  for (size_t i = 0; i < 42; ++i) {
    char prefix[32];
    std::snprintf(prefix, sizeof prefix, "$$$/QV/M/LStr/%04zu=", i);
    EXPECT_EQ(std::strncmp(M_G_ztab[i].key, prefix, std::strlen(prefix)), 0) << M_G_ztab[i].key;
    for (const uint64_t word : M_G_ztab[i].cache) EXPECT_EQ(word, 0u);
    for (const char* c = M_G_ztab[i].key;; ++c) {
      hash = (hash ^ static_cast<unsigned char>(*c)) * 0x100000001B3;
      if (!*c) break;
    }
  }
  EXPECT_EQ(hash, 0xE670E85681B32FDEU) << "a text has changed, and with it the catalogues' keys";
  EXPECT_EQ(M_G_ztab[42].key, nullptr);
  EXPECT_EQ(M_G_ztab[42].cache[0], UINT64_MAX);
  EXPECT_EQ(M_G_ztab[42].cache[1], UINT64_MAX);
  EXPECT_EQ(M_G_ztab[42].cache[2], 0u);
}

using ReportTest = HostTest;

TEST_F(ReportTest, SuccessDoesNotTouchTheHost) {
  EXPECT_EQ(Mp_ReportErr(16, 0, 11), 0);
  EXPECT_EQ(host.touches, 0);
}

}  // namespace
