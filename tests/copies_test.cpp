// Several copies of the library in one process: each has data of its own, however it was loaded.

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstring>
#include <filesystem>

#include "M_Utils.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"

namespace {

class Copy {
 public:
  explicit Copy(void* library) : library_(library) { EXPECT_NE(library, nullptr) << dlerror(); }

  template <class T>
  T* Find(T&, const char* name) const {
    return reinterpret_cast<T*>(dlsym(library_, name));
  }

 private:
  void* library_;
};
#define FIND(copy, name) (copy).Find(name, #name)

void HandOver(const Copy& from, const Copy& to) {
  M_Globals &state = *FIND(from, Mp_G), &other = *FIND(to, Mp_G), record = {}, before = state;
  ASSERT_NE(&state, &other);
  ASSERT_EQ(FIND(from, M_GetGlobals)(&record), 0);
  EXPECT_EQ(std::memcmp(&record, &before, sizeof record), 0);
  before.birthMagic = before.birthMagic2 = 0;
  EXPECT_EQ(std::memcmp(&state, &before, sizeof record), 0);
  ASSERT_EQ(FIND(to, M_SetGlobals)(&record), 0);
  EXPECT_EQ(std::memcmp(&other, &record, sizeof record), 0);
  EXPECT_EQ(FIND(from, M_Death)(), 11);
  EXPECT_EQ(FIND(to, M_SetGlobals)(&record), 12);
}

TEST(Copies, HaveAStateEachAndHandItOver) {
  Dl_info file;
  ASSERT_NE(dladdr(&Mp_G, &file), 0);
  const auto folder = std::filesystem::temp_directory_path() / std::to_string(getpid());
  std::filesystem::create_directory(folder);
  const auto load = [&](const char* name, int scope) {
    std::filesystem::copy_file(file.dli_fname, folder / name);
    return Copy(dlopen((folder / name).c_str(), RTLD_NOW | scope));
  };
  const Copy copies[] = {Copy(dlopen(file.dli_fname, RTLD_NOW | RTLD_NOLOAD)),
                         load("local.so", RTLD_LOCAL), load("global.so", RTLD_GLOBAL),
                         load("other.so", RTLD_LOCAL)};
  std::filesystem::remove_all(folder);
  U_SetReportCallback([](void*, const U_Report*) {}, nullptr);
  for (const Copy& a : copies) {
    EXPECT_EQ(FIND(a, M_G_zref)->header, FIND(a, M_G_zhdr));
    EXPECT_EQ(FIND(a, M_G_zhdr)->table, *FIND(a, M_G_ztab));
    for (const Copy& b : copies) {
      if (&a == &b) continue;
      EXPECT_NE(FIND(a, M_G_ztab), FIND(b, M_G_ztab));
      ASSERT_EQ(FIND(a, M_Birth)(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
      FIND(a, Mp_G)->reserved1 = 0x1122334455667788;
      FIND(a, Mp_G)->reserved2 = 0x99AABBCCDDEEFF00;
      const float *sine = nullptr, *sineOfB = nullptr;
      const unsigned char *mul = nullptr, *div = nullptr, *mulOfB = nullptr, *divOfB = nullptr;
      ASSERT_EQ(FIND(a, M_PrepareFTrig)(true, false, nullptr, &sine), 0);
      ASSERT_EQ(FIND(a, M_PrepareFCMD)(true, false, nullptr, &mul, &div), 0);
      HandOver(a, b);
      ASSERT_EQ(FIND(b, M_PrepareFTrig)(true, false, nullptr, &sineOfB), 0);
      ASSERT_EQ(FIND(b, M_PrepareFCMD)(true, false, nullptr, &mulOfB, &divOfB), 0);
      EXPECT_TRUE(sine && sine == sineOfB && mul && mul == mulOfB && div && div == divOfB);
      EXPECT_EQ(FIND(b, Mp_G)->ftrigPrepareCount * FIND(b, Mp_G)->fcmdPrepareCount, 4);
      HandOver(b, a);
      for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(FIND(a, M_UnprepareFTrig)() | FIND(a, M_UnprepareFCMD)(), 0);
      }
      ASSERT_EQ(FIND(a, M_Death)(), 0);
      EXPECT_EQ(U_GetMemoryUse().handles, 0u);
      EXPECT_EQ(FIND(b, M_Death)(), 11);
      *FIND(b, Mp_G) = {};
    }
  }
  U_SetReportCallback(nullptr, nullptr);
}

}  // namespace
