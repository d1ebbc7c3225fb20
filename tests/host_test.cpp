// The stand-in host itself, and the library on top of it.

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <clocale>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <limits>
#include <new>
#include <sstream>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "M_Utils.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"
#include "U.h"
#include "XLOG.h"

namespace {

const size_t kTooMuch = std::numeric_limits<size_t>::max() / 2;

using Texts = std::vector<std::string>;

// Keeps reports as text for as long as it lives.
struct Reports {
  Reports() {
    const auto receive = [](void* context, const U_Report* r) {
      std::ostringstream text;
      text << std::hex << r->id << ' ' << std::dec << r->severity << ' ' << r->hostError << ' '
           << r->text;
      static_cast<Texts*>(context)->push_back(text.str());
    };
    U_SetReportCallback(receive, &all);
  }
  ~Reports() { U_SetReportCallback(nullptr, nullptr); }
  Texts all;
};

// Handles, their bytes, tracked blocks, their bytes.
std::array<size_t, 4> InUse() {
  const U_MemoryUse use = U_GetMemoryUse();
  return {use.handles, use.handleBytes, use.trackedBlocks, use.trackedBytes};
}
using Use = std::array<size_t, 4>;

TEST(Handles, AreCountedReclaimedAndFreed) {
  const Reports reports;
  EXPECT_EQ(InUse(), Use());
  const U_Handle handle = U_AllocateHandle(0x123, "block", 1000);
  const U_Handle quiet = U_AllocateHandleQuiet(24);
  ASSERT_TRUE(handle && *handle && quiet && *quiet);
  std::memset(*handle, 7, 1000);
  EXPECT_EQ(InUse(), (Use{2, 1024, 0, 0}));
  U_ReclaimHandle(handle);
  U_ReclaimHandle(handle);
  EXPECT_EQ(*handle, nullptr);
  EXPECT_EQ(InUse(), (Use{2, 24, 0, 0}));
  for (const U_Handle each : {handle, quiet, U_Handle()}) U_FreeHandle(each);
  EXPECT_EQ(InUse(), Use());

  EXPECT_EQ(U_AllocateHandle(0x124, "large", kTooMuch), nullptr);
  EXPECT_EQ(U_AllocateHandleQuiet(kTooMuch), nullptr);
  EXPECT_EQ(reports.all, (Texts{"124 8 4 large"}));
  EXPECT_EQ(InUse(), Use());
}

TEST(Handles, ReclaimedTablesAreRebuilt) {
  ASSERT_EQ(M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
  for (const U_Handle each : {Mp_G.trigTable, Mp_G.fcmTable, Mp_G.fcdTable}) U_ReclaimHandle(each);
  EXPECT_EQ(InUse(), (Use{3, 0, 0, 0}));
  const float* sine = nullptr;
  const unsigned char *mul = nullptr, *div = nullptr;
  M_PrepareFTrig(true, false, nullptr, &sine);
  M_PrepareFCMD(true, false, nullptr, &mul, &div);
  EXPECT_EQ(InUse(), (Use{3, 1024 + 2 * 65536, 0, 0}));
  ASSERT_TRUE(sine && mul && div);
  EXPECT_TRUE(sine[255] == 1 && mul[128 * 256 + 255] == 128 && div[200 * 256 + 100] == 128);
  EXPECT_EQ(M_UnprepareFTrig() | M_UnprepareFCMD() | M_Death(), 0);
  EXPECT_EQ(InUse(), Use());
}

TEST(TrackedMemory, IsCountedAndAligned) {
  {
    std::vector<double, U_Allocator<double>> numbers(3), others(1);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(numbers.data()) % alignof(std::max_align_t), 0u);
    EXPECT_EQ(InUse(), (Use{0, 0, 2, 32}));
    EXPECT_TRUE(numbers.get_allocator() == U_Allocator<int>());
  }
  U_MemTrackedObject::TrackedDelete(nullptr);
  for (const size_t bytes : {kTooMuch, std::numeric_limits<size_t>::max()}) {
    EXPECT_THROW(U_MemTrackedObject::TrackedNew(bytes, false), std::bad_alloc);
    EXPECT_EQ(U_MemTrackedObject::TrackedNew(bytes, true), nullptr);
  }
  EXPECT_THROW(U_Allocator<double>().allocate(kTooMuch), std::bad_alloc);
  EXPECT_EQ(InUse(), Use());
}

TEST(Reporting, GoesToTheCallbackAndTheLastError) {
  const Reports reports;
  std::strcpy(Up_GetThreadLoggingBuffer(), "in the buffer");
  EXPECT_EQ(Up_ReportError(0x11, 4), 0x11);
  EXPECT_EQ(Up_GetThreadLastError(), 0x11);
  EXPECT_EQ(Up_ReportErrString(0x12, 8, "given"), 0x12);
  EXPECT_EQ(Up_ReportVarkErrString(0x13, 8, -5, nullptr), -5);
  EXPECT_EQ(Up_GetThreadLastError(), -5);
  EXPECT_EQ(U_TranslateAndReportException(std::bad_alloc()), 4);
  EXPECT_EQ(U_TranslateAndReportException(std::bad_array_new_length()), 4);
  EXPECT_EQ(U_TranslateAndReportException(std::runtime_error("odd")), 1);
  Up_SetThreadLastError(9);
  EXPECT_EQ(Up_GetThreadLastError(), 9);
  EXPECT_EQ(reports.all,
            (Texts{"11 4 0 in the buffer", "12 8 0 given", "13 8 -5 ", "10000 8 4 std::bad_alloc",
                   "10000 8 4 std::bad_array_new_length", "10000 8 1 odd"}));
}

TEST(Reporting, MayReportInTurn) {
  Texts received;
  const auto receive = [](void* context, const U_Report* report) {
    if (report->id == 0x110001) Mp_ReportErr(2, 2, 0);
    static_cast<Texts*>(context)->emplace_back(report->text);
  };
  U_SetReportCallback(receive, &received);
  Mp_ReportErr(1, 1, 0);
  U_SetReportCallback(nullptr, nullptr);
  EXPECT_EQ(received, (Texts{"unknown error (2).", "unknown error (1)."}));
  std::thread([] { Mp_ReportErr(3, 3, 0); }).join();
  EXPECT_STREQ(Up_GetThreadLoggingBuffer(), "unknown error (1).");
  EXPECT_EQ(Up_GetThreadLastError(), 0x110001);
}

TEST(Reporting, GoesToStandardErrorWithoutACallback) {
  ::testing::internal::CaptureStderr();
  Up_ReportErrString(0x1B, 8, "text");
  Up_ReportVarkErrString(0x1C, 8, 12, nullptr);
  XLOG_Log(10, "M", "Birth", "M Birth");
  const bool isLogged = std::getenv("U_LOG") != nullptr;
  EXPECT_EQ(::testing::internal::GetCapturedStderr(),
            std::string("[0x00001B] text\n[0x00001C] host error 12 \n")
                .append(isLogged ? "M Birth (10): M Birth\n" : ""));
}

// Each thread sees its own message and last error, whatever the others report.
TEST(Reporting, IsPerThread) {
  static std::atomic<int> received;
  const auto count = [](void*, const U_Report* report) {
    received += report->text == std::string(Up_GetThreadLoggingBuffer()) &&
                Up_GetThreadLastError() == static_cast<int32_t>(report->id);
  };
  U_SetReportCallback(count, nullptr);
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([t] {
      for (int32_t code = 20000 + t; code < 22000; code += 4) {
        EXPECT_EQ(Mp_ReportErr(static_cast<int16_t>(code), code, 0), code);
        EXPECT_EQ(Up_GetThreadLoggingBuffer(),
                  std::string("unknown error (").append(std::to_string(code)).append(")."));
        EXPECT_EQ(Up_GetThreadLastError(), 0x110000 + code);
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  U_SetReportCallback(nullptr, nullptr);
  EXPECT_EQ(received, 2000);
}

TEST(Services, WideMultiply) { EXPECT_EQ(WideMultiply(INT32_MIN, INT32_MAX), -0x3FFFFFFF80000000); }

const char* Text(int32_t index) { return U_ZLookupLStrCache(M_G_zref.header, index, 0, 0); }

// gettext looks at the environment again once the locale has changed.
void SetLanguage(const char* language) {
  setenv("LANGUAGE", language, 1);
  std::setlocale(LC_ALL, "C");
  EXPECT_NE(std::setlocale(LC_ALL, "C.UTF-8"), nullptr);
}

TEST(Messages, OutsideTheTableAreEmpty) {
  for (const int32_t index : {-1, 42, 43, 100000}) EXPECT_STREQ(Text(index), "");
  const std::string tooLong = "p=" + std::string(1024, 'x');
  Mp_StrEntry own[] = {{"p=", {}}, {"p", {}}, {tooLong.c_str(), {}}, {"p=a=b", {}}, {"p=c", {}}};
  const Mp_StrHeader header = {"M", 4, own, 0};
  SetLanguage("de");
  for (const int32_t i : {0, 1, 2, 4}) EXPECT_STREQ(U_ZLookupLStrCache(&header, i, 0, 0), "") << i;
  EXPECT_STREQ(U_ZLookupLStrCache(&header, 3, 0, 0), "a=b");
  SetLanguage("");
  EXPECT_STREQ(Text(41), "attempt to normalize a homegeneous point");
}

// The catalogues in the folder of the environment were made for this: each line of the rows beside
// them is a language and what is to come of its translation.
TEST(Messages, OfBadCataloguesAreNotUsed) {
  const Reports reports;
  const char* const folder = std::getenv("CATALOGUES");
  ASSERT_NE(folder, nullptr);
  U_SetMessageFolder(folder);
  std::ifstream rows(std::string(folder).append("/rows"));
  int count = 0;
  for (std::string language, expected; rows >> language && std::getline(rows >> std::ws, expected);
       ++count) {
    SetLanguage(language.c_str());
    EXPECT_EQ(Text(Mp_STR_OVERFLOW), expected);
    Mp_ReportErr(1, M_ERR_OVERFLOW, Mp_STR_OVERFLOW);
    EXPECT_EQ(reports.all.back(),
              "110001 8 0 " + std::string(expected).replace(expected.find("%s"), 2, expected));
  }
  EXPECT_GT(count, 10);
  U_SetMessageFolder(nullptr);
  SetLanguage("de");
  EXPECT_STRNE(Text(Mp_STR_OVERFLOW), "overflow %s.");
}

}  // namespace
