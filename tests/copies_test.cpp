// Several copies of the library in one process: each has data of its own, however it was loaded.

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstring>
#include <filesystem>

#include "Mp_Life.h"
#include "Mp_Strs.h"

namespace {

struct Copy {
  void* library;

  // What a function or an object of this program's own copy is in this one.
  template <class T>
  T& operator()(T& own) const {
    Dl_info found;
    EXPECT_NE(dladdr(reinterpret_cast<const void*>(&own), &found), 0);
    return *reinterpret_cast<T*>(dlsym(library, found.dli_sname));
  }
};

// Births one copy and hands its state, with tables that both lend, to another and back.
void HandOver(const Copy& a, const Copy& b) {
  EXPECT_NE(&a(M_G_ztab), &b(M_G_ztab));
  ASSERT_EQ(a(M_Birth)(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
  for (const auto& [from, to] : {std::pair(a, b), std::pair(b, a)}) {
    EXPECT_EQ(from(M_PrepareFTrig)(true, false, nullptr, nullptr), 0);
    EXPECT_EQ(from(M_PrepareFCMD)(true, false, nullptr, nullptr, nullptr), 0);
    M_Globals record;
    ASSERT_EQ(from(M_GetGlobals)(&record), 0);
    EXPECT_EQ(from(M_Death)(), 11);
    ASSERT_EQ(to(M_SetGlobals)(&record), 0);
    EXPECT_EQ(std::memcmp(&to(Mp_G), &record, sizeof record), 0);
  }
  EXPECT_EQ(a(Mp_G).ftrigPrepareCount * a(Mp_G).fcmdPrepareCount, 4);
  for (int i = 0; i < 2; ++i) EXPECT_EQ(a(M_UnprepareFTrig)() | a(M_UnprepareFCMD)(), 0);
  EXPECT_EQ(a(M_Death)(), 0);
  EXPECT_EQ(U_GetMemoryUse().handles, 0u);
  b(Mp_G) = {};
}

TEST(Copies, HaveAStateEachAndHandItOver) {
  Dl_info own;
  ASSERT_NE(dladdr(&Mp_G, &own), 0);
  const auto folder = std::filesystem::temp_directory_path() / std::to_string(getpid());
  std::filesystem::create_directory(folder);
  const auto load = [&](const char* name, int scope) {
    std::filesystem::copy_file(own.dli_fname, folder / name);
    return dlopen((folder / name).c_str(), RTLD_NOW | scope);
  };
  const Copy copies[] = {{dlopen(own.dli_fname, RTLD_NOW | RTLD_NOLOAD)},
                         {load("local.so", RTLD_LOCAL)},
                         {load("global.so", RTLD_GLOBAL)},
                         {load("other.so", RTLD_LOCAL)}};
  std::filesystem::remove_all(folder);
  U_SetReportCallback([](void*, const U_Report*) {}, nullptr);
  for (const Copy& a : copies) {
    ASSERT_NE(a.library, nullptr);
    EXPECT_EQ(a(M_G_zref).header, &a(M_G_zhdr));
    EXPECT_EQ(a(M_G_zhdr).table, a(M_G_ztab));
    for (const Copy& b : copies) {
      if (&a != &b) HandOver(a, b);
    }
  }
  U_SetReportCallback(nullptr, nullptr);
}

}  // namespace
