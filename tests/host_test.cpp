// The stand-in host itself, and the library on top of it.

#include <gtest/gtest.h>

#include <atomic>
#include <clocale>
#include <cstring>
#include <fstream>
#include <thread>

#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"
#include "XLOG.h"

namespace {

// Handles, their bytes, tracked blocks, their bytes.
using Use = std::vector<size_t>;
Use InUse() {
  const auto [handles, handleBytes, blocks, bytes] = U_GetMemoryUse();
  return {handles, handleBytes, blocks, bytes};
}

using Texts = std::vector<std::string>;

// Keeps reports, and the last error as they come, as text for as long as it lives.
struct Reports {
  Texts all;

  Reports() {
    const auto receive = [](void* reports, const U_Report* r) {
      char text[3000];
      std::snprintf(text, sizeof text, "%x %d %d %d %s", r->id, r->severity, r->hostError,
                    Up_GetThreadLastError(), r->text);
      static_cast<Reports*>(reports)->all.emplace_back(text);
    };
    U_SetReportCallback(receive, this);
  }
  ~Reports() { U_SetReportCallback(nullptr, nullptr); }
};

TEST(Memory, IsCountedReclaimedAndFreed) {
  ASSERT_EQ(M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
  EXPECT_EQ(InUse(), (Use{3, 1024 + 2 * 65536, 0, 0}));
  for (const U_Handle table : {Mp_G.fcmTable, Mp_G.fcdTable, Mp_G.fcdTable}) {
    U_ReclaimHandle(table);
    EXPECT_EQ(*table, nullptr);
  }
  EXPECT_EQ(InUse(), (Use{3, 1024, 0, 0}));
  // The tables are made anew.
  EXPECT_EQ(M_PrepareFCMD(true, false, nullptr, nullptr, nullptr) | M_UnprepareFCMD(), 0);
  {
    const std::vector<double, U_Allocator<double>> numbers(3), others(1);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(numbers.data()) % alignof(std::max_align_t), 0u);
    EXPECT_EQ(InUse(), (Use{3, 1024 + 2 * 65536, 2, 32}));
  }
  EXPECT_EQ(M_Death(), 0);
  U_FreeHandle(nullptr);
  U_MemTrackedObject::TrackedDelete(nullptr);
  EXPECT_EQ(InUse(), Use(4));
}

TEST(Memory, CannotBeHadBeyondLimits) {
  const Reports reports;
  EXPECT_EQ(U_AllocateHandle(0x124, "large", SIZE_MAX / 2), nullptr);
  EXPECT_EQ(reports.all, Texts{"124 8 4 4 large"});
  for (const size_t bytes : {SIZE_MAX / 2, SIZE_MAX}) {
    EXPECT_EQ(U_AllocateHandleQuiet(bytes), nullptr);
    EXPECT_EQ(U_MemTrackedObject::TrackedNew(bytes, true), nullptr);
    EXPECT_THROW(U_MemTrackedObject::TrackedNew(bytes, false), std::bad_alloc);
  }
  // So many that the number of their bytes, cut off, would be small.
  EXPECT_THROW(U_Allocator<double>().allocate(SIZE_MAX / 8 + 2), std::bad_alloc);
  EXPECT_EQ(InUse(), Use(4));
}

TEST(Reporting, GoesToTheCallbackAndTheLastError) {
  const Reports reports;
  std::strcpy(Up_GetThreadLoggingBuffer(), "in the buffer");
  EXPECT_EQ(Up_ReportError(0x11, 4), 0x11);
  EXPECT_EQ(Up_ReportErrString(0x12, 8, "given"), 0x12);
  EXPECT_EQ(Up_ReportVarkErrString(0x13, 8, -5, nullptr), -5);
  EXPECT_EQ(U_TranslateAndReportException(std::bad_array_new_length()), 4);
  EXPECT_EQ(U_TranslateAndReportException(std::runtime_error("odd")), 1);
  EXPECT_EQ(reports.all, (Texts{"11 4 0 17 in the buffer", "12 8 0 18 given", "13 8 -5 -5 ",
                                "10000 8 4 4 std::bad_array_new_length", "10000 8 1 1 odd"}));
}

TEST(Reporting, GoesToStandardErrorWithoutACallback) {
  std::string line;
  const auto log = [](void* to, int32_t level, auto... texts) {
    *static_cast<std::string*>(to) = (std::to_string(level) + ... + texts);
  };
  U_SetLogCallback(log, &line);
  XLOG_Log(1, "a", "b", "c");
  U_SetLogCallback(nullptr, nullptr);
  EXPECT_EQ(line, "1abc");
  ::testing::internal::CaptureStderr();
  Up_ReportErrString(0x1B, 8, "text");
  Up_ReportVarkErrString(0x1C, 8, -12, nullptr);
  XLOG_Log(10, "M", "Birth", "M Birth");
  const char* const logged = std::getenv("U_LOG") ? "M Birth (10): M Birth\n" : "";
  EXPECT_EQ(::testing::internal::GetCapturedStderr(),
            std::string("[0x00001B] text\n[0x00001C] host error -12 \n") + logged);
}

// Each thread has its own message and last error, whatever another reports, or a callback in turn.
TEST(Reporting, IsPerThread) {
  static std::atomic<int> failures = 0;
  const auto receive = [](void*, const U_Report* report) {
    const std::string text = Up_GetThreadLoggingBuffer();
    const int32_t error = Up_GetThreadLastError();
    if (error % 2 == 0) Mp_ReportErr(static_cast<int16_t>(error + 1), 1, 0);
    failures += report->text != text || report->id != static_cast<uint32_t>(error);
  };
  const auto report = [](int16_t code) {
    for (int i = 0; i < 500; ++i) {
      Mp_ReportErr(code, code, 0);
      failures += Up_GetThreadLoggingBuffer() != "unknown error (" + std::to_string(code) + ").";
      failures += Up_GetThreadLastError() != 0x110000 + code;
    }
  };
  U_SetReportCallback(receive, nullptr);
  std::thread atTheSameTime(report, 2000);
  report(1000);
  atTheSameTime.join();
  std::thread(report, 3000).join();
  U_SetReportCallback(nullptr, nullptr);
  EXPECT_EQ(failures, 0);
  EXPECT_STREQ(Up_GetThreadLoggingBuffer(), "unknown error (1000).");
  EXPECT_EQ(Up_GetThreadLastError(), 0x110000 + 1000);
}

TEST(Services, WideMultiply) { EXPECT_EQ(WideMultiply(INT32_MIN, INT32_MAX), -0x3FFFFFFF80000000); }

std::string Text(int32_t index, const Mp_StrHeader& header = M_G_zhdr) {
  return U_ZLookupLStrCache(&header, index, 0, 0);
}
// gettext looks at the environment again once the locale has changed.
void SetLanguage(const std::string& language) {
  setenv("LANGUAGE", language.c_str(), 1);
  std::setlocale(LC_ALL, "C");
  EXPECT_NE(std::setlocale(LC_ALL, "C.UTF-8"), nullptr);
}

TEST(Messages, OutsideTheTableAreEmpty) {
  Mp_StrEntry own[] = {{nullptr, {}}, {"p=behind the end", {}}};
  const Mp_StrHeader header = {"M", 1, own, 0};
  const auto textOf = [&](const std::string& key) {
    own[0].key = key.c_str();
    return Text(0, header);
  };
  SetLanguage("de");
  EXPECT_EQ(textOf("p=a=b") + textOf("p=") + textOf("p") + Text(1, header), "a=b");
  for (const size_t length : {1022u, 1023u, 1024u}) {
    EXPECT_EQ(textOf("p=" + std::string(length, 'x')).size(), length < 1024 ? length : 0);
  }
  for (const int32_t index : {-1, 42, 43, 100000}) EXPECT_EQ(Text(index), "") << index;
  SetLanguage("");
  EXPECT_EQ(Text(41), "attempt to normalize a homegeneous point");
}

// Each line of the rows beside the catalogues made for this is a language and what is to come of
// its translation.
TEST(Messages, OfBadCataloguesAreNotUsed) {
  const Reports reports;
  const char* const folder = std::getenv("CATALOGUES");
  ASSERT_NE(folder, nullptr);
  U_SetMessageFolder(folder);
  std::ifstream rows(std::string(folder) + "/rows");
  for (std::string language, text; rows >> language && std::getline(rows >> std::ws, text);) {
    SetLanguage(language);
    EXPECT_EQ(Text(Mp_STR_OVERFLOW), text);
    Mp_ReportErr(1, M_ERR_OVERFLOW, Mp_STR_OVERFLOW);
    EXPECT_EQ(reports.all.back(),
              "110001 8 0 1114113 " + std::string(text).replace(text.find("%s"), 2, text));
  }
  EXPECT_GT(reports.all.size(), 10u);
  U_SetMessageFolder(nullptr);
  SetLanguage("de");
  EXPECT_NE(Text(Mp_STR_OVERFLOW), "overflow %s.");
}

}  // namespace
