// Birth, death, the hand-over and the fast tables, as the host sees them.

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "M_Utils.h"
#include "Mp_Life.h"
#include "TestHost.h"

namespace {

const char kBirth[] = "log 10 M Birth M Birth";
const char kDeath[] = "log 10 M Death M Death";
const char kGauss[] = "11001d 8 host 5 Gaussian table initialization.";
const char kTrigTable[] = "allocate 110019 FCM/D table 1024";
const char kCharTable[] = "allocate 11001b FCM/D table 65536";

bool IsAlive() { return Mp_G.birthMagic == 0x27182818 && Mp_G.birthMagic2 == 0x27182818; }

class LifeTest : public HostTest {
 protected:
  void SetUp() override {
    HostTest::SetUp();
    Mp_G = {};
  }
  void TearDown() override {
    HostTest::TearDown();
    Mp_SetdownTrig();
    Mp_SetdownFCM();
    EXPECT_EQ(host.handles, leaked_);
    host.calls.clear();
  }
  void Birth(uint32_t services) {
    EXPECT_EQ(M_Birth(services, nullptr), 0);
    host.calls.clear();
  }
  int leaked_ = 0;
};

// Reclaims a table's memory, as a host may while nobody holds it.
void Reclaim(U_Handle handle) {
  std::free(*handle);
  *handle = nullptr;
}

TEST_F(LifeTest, BirthGrantsWhatCouldBeSetUp) {
  struct Row {
    const char* says;
    uint32_t services;
    std::vector<int> failing;
    int32_t reportResult;
    int32_t result;
    uint32_t granted;
    Calls calls;
  };
  const Row rows[] = {
      {"nothing", 0, {}, 0, 0, 0, {kBirth}},
      {"unknown bits are ignored", 0xFFFFFFF0, {}, 0, 0, 0, {kBirth}},
      {"timer", 1, {}, 0, 0, 1, {kBirth}},
      {"all tables", 7, {}, 0, 0, 7, {kBirth, kTrigTable, kCharTable, kCharTable}},
      {"Gauss never is", 8, {}, 0, 5, 0, {kBirth, kGauss}},
      {"a failure after a success", 10, {}, 0, 5, 2, {kBirth, kTrigTable, kGauss}},
      {"the host's answer is the result", 8, {}, -9, -9, 0, {kBirth, kGauss}},
      {"no trig memory", 3, {1}, 0, 4, 1, {kBirth, kTrigTable}},
      {"nothing is granted after a failure, and the first code is kept",
       15,
       {1},
       0,
       4,
       1,
       {kBirth, kTrigTable, kCharTable, kCharTable, kGauss}},
      {"no memory for the first character table", 4, {1}, 0, 4, 0, {kBirth, kCharTable}},
      {"none for the second",
       6,
       {3},
       0,
       4,
       2,
       {kBirth, kTrigTable, kCharTable, kCharTable, "free"}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.says);
    host = {};
    host.failing = row.failing;
    host.reportResult = row.reportResult;
    Mp_G = {};
    Mp_G.services = 0xFF;
    Mp_G.fcmdPrepareCount = 7;
    uint32_t granted = 99;
    EXPECT_EQ(M_Birth(row.services, &granted), row.result);
    EXPECT_EQ(granted, row.granted);
    EXPECT_EQ(Mp_G.services, row.granted);
    EXPECT_EQ(IsAlive(), row.result == 0);
    EXPECT_EQ(Mp_G.fcmdPrepareCount, 7) << "nothing resets the counts";
    EXPECT_EQ(host.Take(), row.calls);
    EXPECT_EQ(host.handles, (Mp_G.trigTable != nullptr) + 2 * (Mp_G.fcmTable != nullptr));
    EXPECT_EQ(Mp_G.fcmTable == nullptr, Mp_G.fcdTable == nullptr);
    Mp_SetdownTrig();
    Mp_SetdownFCM();
    host.calls.clear();
  }
}

TEST_F(LifeTest, BirthIsRefusedWhileAlive) {
  Birth(2);
  const M_Globals before = Mp_G;
  uint32_t granted = 99;
  host.reportResult = 1234;
  EXPECT_EQ(M_Birth(0, &granted), 1234);
  EXPECT_EQ(granted, 99u);
  EXPECT_EQ(std::memcmp(&before, &Mp_G, sizeof Mp_G), 0);
  EXPECT_EQ(host.Take(), (Calls{kBirth, "110014 8 host 12 -"}));
}

TEST_F(LifeTest, DeathSetsDownWhatWasGranted) {
  Birth(7);
  EXPECT_EQ(M_Death(), 0);
  EXPECT_EQ(host.Take(), (Calls{kDeath, "free", "free", "free"}));
  EXPECT_EQ(Mp_G.services, 7u) << "the services stay as they were";
  EXPECT_EQ(Mp_G.birthMagic | Mp_G.birthMagic2, 0u);
  EXPECT_EQ(Mp_G.trigTable, nullptr);
  EXPECT_EQ(M_Death(), 11);
  EXPECT_EQ(host.Take(), (Calls{kDeath, "110015 8 host 11 -"}));

  // The result is the last set-down's, and a service not granted is left alone.
  Birth(2);
  Mp_G.services = 1 | 8;
  EXPECT_EQ(M_Death(), 5);
  EXPECT_EQ(host.Take(), (Calls{kDeath, "11001e 8 host 5 Gaussian table initialization."}));
  EXPECT_NE(Mp_G.trigTable, nullptr);
}

TEST_F(LifeTest, AliveTakesBothWords) {
  for (const bool first : {true, false}) {
    Mp_G = {};
    (first ? Mp_G.birthMagic : Mp_G.birthMagic2) = 0x27182818;
    M_Globals out = {};
    EXPECT_EQ(M_GetGlobals(&out), 11);
    EXPECT_EQ(M_Death(), 11);
    EXPECT_EQ(host.Take(), (Calls{"110016 8 host 11 -", kDeath, "110015 8 host 11 -"}));
    EXPECT_EQ(M_Birth(0, nullptr), 0);
    host.calls.clear();
  }
}

TEST_F(LifeTest, HandOver) {
  Birth(2);
  Mp_G.reserved1 = 0x1111111111111111;
  Mp_G.reserved2 = 0x2222222222222222;
  Mp_G.fcmdPrepareCount = 3;
  Mp_G.ftrigPrepareCount = 4;
  const M_Globals alive = Mp_G;
  M_Globals out = {};
  EXPECT_EQ(M_GetGlobals(&out), 0);
  EXPECT_EQ(std::memcmp(&out, &alive, sizeof out), 0);
  EXPECT_EQ(Mp_G.birthMagic | Mp_G.birthMagic2, 0u);
  EXPECT_EQ(Mp_G.trigTable, alive.trigTable) << "only the birth words are cleared";

  M_Globals untouched = out;
  EXPECT_EQ(M_GetGlobals(&untouched), 11);
  EXPECT_EQ(std::memcmp(&untouched, &out, sizeof out), 0);
  EXPECT_EQ(M_SetGlobals(&out), 0);
  EXPECT_EQ(std::memcmp(&Mp_G, &alive, sizeof out), 0);
  EXPECT_EQ(host.Take(), (Calls{"110016 8 host 11 -"}));

  const M_Globals dead = {0x27182818, 1, 2, nullptr, nullptr, 3, nullptr, 0, 5, 6};
  EXPECT_EQ(M_SetGlobals(&dead), 12);
  EXPECT_EQ(std::memcmp(&Mp_G, &alive, sizeof out), 0) << "refused while alive";
  EXPECT_EQ(M_GetGlobals(&out), 0);
  EXPECT_EQ(M_SetGlobals(&dead), 2);
  EXPECT_EQ(std::memcmp(&Mp_G, &dead, sizeof out), 0) << "copied in all the same";
  EXPECT_EQ(host.Take(), (Calls{"110017 8 host 12 -", "110017 8 host 2 -"}));
  Mp_G.trigTable = out.trigTable;
}

TEST_F(LifeTest, TimerDoesNothing) {
  EXPECT_EQ(Mp_SetupTimer() | Mp_SetdownTimer() | Mp_PauseTimer() | Mp_ContinueTimer(), 0);
  EXPECT_EQ(host.touches, 0);
}

TEST_F(LifeTest, TableContents) {
  Birth(6);
  const float* sine = nullptr;
  const unsigned char* mul = nullptr;
  const unsigned char* div = nullptr;
  unsigned char ready = 9;
  EXPECT_EQ(M_PrepareFTrig(true, false, &ready, &sine), 0);
  EXPECT_EQ(ready, 1);
  ASSERT_NE(sine, nullptr);
  ready = 9;
  EXPECT_EQ(M_PrepareFCMD(true, false, &ready, &mul, &div), 0);
  EXPECT_EQ(ready, 1);
  ASSERT_NE(mul, nullptr);
  ASSERT_NE(div, nullptr);

  EXPECT_EQ(sine[0], 0.0f);
  EXPECT_EQ(sine[255], 1.0f);
  for (int i = 0; i < 256; ++i) {
    EXPECT_EQ(sine[i], static_cast<float>(std::sin(i / 255.0 * 1.5707963267948966))) << i;
  }
  for (int a = 0; a < 256; ++a) {
    for (int b = 0; b < 256; ++b) {
      // Nearest by comparing doubled distances; nothing but the division lies on a half.
      ASSERT_LE(std::abs(2 * (a * b - 255 * mul[a * 256 + b])), 255) << a << ' ' << b;
      if (b >= a) {
        ASSERT_EQ(div[a * 256 + b], 255);
      } else {
        const int rest = 2 * (255 * b - a * div[a * 256 + b]);
        ASSERT_TRUE(-a <= rest && rest < a + a % 2) << a << ' ' << b;
      }
    }
  }
}

// The two prepares as one, so that one table of cases serves both.
struct Service {
  uint32_t flag;
  U_Handle M_Globals::*handle;
  uint16_t M_Globals::*count;
  const char* allocation;
  int blocks;
  const char* missing;
  const char* missingOnUnprepare;
  const char* unavailable;

  int32_t Prepare(bool report, bool noRebuild, unsigned char* ready, const void** table) const {
    if (flag == M_SERVICE_TRIG) {
      const float* sine = reinterpret_cast<const float*>(&host);
      const int32_t code = M_PrepareFTrig(report, noRebuild, ready, &sine);
      *table = sine;
      return code;
    }
    const auto* mul = reinterpret_cast<const unsigned char*>(&host);
    const auto* div = mul;
    const int32_t code = M_PrepareFCMD(report, noRebuild, ready, &mul, &div);
    EXPECT_EQ(mul == nullptr, div == nullptr);
    *table = mul;
    return code;
  }
  int32_t PrepareWithoutOutputs() const {
    return flag == M_SERVICE_TRIG ? M_PrepareFTrig(false, false, nullptr, nullptr)
                                  : M_PrepareFCMD(false, false, nullptr, nullptr, nullptr);
  }
  int32_t Unprepare() const {
    return flag == M_SERVICE_TRIG ? M_UnprepareFTrig() : M_UnprepareFCMD();
  }
  void ReclaimAll() const {
    Reclaim(Mp_G.*handle);
    if (flag == M_SERVICE_FCMD) Reclaim(Mp_G.fcdTable);
  }
};

const Service kTrig = {M_SERVICE_TRIG,
                       &M_Globals::trigTable,
                       &M_Globals::ftrigPrepareCount,
                       "allocate 1024",
                       1,
                       "11002a 8 attempt to use unrequested math service (fast trig).",
                       "11002a 8 attempt to use unrequested math service (fast trig).",
                       "11002a 8 fast trig will be unavailable."};
const Service kFcmd = {M_SERVICE_FCMD,
                       &M_Globals::fcmTable,
                       &M_Globals::fcmdPrepareCount,
                       "allocate 65536",
                       2,
                       "11001f 8 attempt to use unrequested math service (fast char math).",
                       "110020 8 attempt to use unrequested math service (fast char math).",
                       "11001f 8 fast character math will be unavailable."};

class PrepareTest : public LifeTest, public ::testing::WithParamInterface<Service> {
 protected:
  const Service& S() { return GetParam(); }
  uint16_t& Count() { return Mp_G.*S().count; }
  // What a rebuild does: frees all blocks, then asks for as many.
  Calls Rebuild() {
    Calls calls(static_cast<size_t>(S().blocks), "free");
    calls.insert(calls.end(), static_cast<size_t>(S().blocks), S().allocation);
    return calls;
  }
  const void* table_ = nullptr;
  unsigned char ready_ = 9;
};
INSTANTIATE_TEST_SUITE_P(, PrepareTest, ::testing::Values(kTrig, kFcmd), [](const auto& service) {
  return service.param.flag == M_SERVICE_TRIG ? "Trig" : "Fcmd";
});

TEST_P(PrepareTest, NeedsTheServiceAndItsTables) {
  EXPECT_EQ(S().Prepare(true, false, &ready_, &table_), M_ERR_UNREQUESTED_SERVICE);
  EXPECT_EQ(ready_, 0);
  EXPECT_EQ(table_, nullptr);
  EXPECT_EQ(S().Unprepare(), M_ERR_UNREQUESTED_SERVICE);
  EXPECT_EQ(Count(), 0);
  EXPECT_EQ(host.Take(), (Calls{S().missing, S().missingOnUnprepare}));

  // Either the bit or the handles alone are not enough.
  Birth(S().flag);
  Mp_G.services = ~S().flag;
  EXPECT_EQ(S().PrepareWithoutOutputs(), M_ERR_UNREQUESTED_SERVICE);
  Mp_G.services = S().flag;
  for (U_Handle* handle : {&(Mp_G.*S().handle), S().blocks == 2 ? &Mp_G.fcdTable : nullptr}) {
    if (!handle) continue;
    const U_Handle kept = std::exchange(*handle, nullptr);
    EXPECT_EQ(S().PrepareWithoutOutputs(), M_ERR_UNREQUESTED_SERVICE);
    EXPECT_EQ(S().Unprepare(), M_ERR_UNREQUESTED_SERVICE);
    *handle = kept;
  }
  EXPECT_EQ(Count(), 0);
  host.calls.clear();
}

TEST_P(PrepareTest, CountsUncheckedSixteenBits) {
  Birth(S().flag);
  EXPECT_EQ(S().PrepareWithoutOutputs(), 0);
  EXPECT_EQ(S().PrepareWithoutOutputs(), 0);
  EXPECT_EQ(Count(), 2);
  EXPECT_EQ(S().Unprepare() | S().Unprepare() | S().Unprepare(), 0);
  EXPECT_EQ(Count(), 65535);
  EXPECT_EQ(S().PrepareWithoutOutputs(), 0);
  EXPECT_EQ(Count(), 0);
  EXPECT_EQ(M_Death() | M_Birth(S().flag, nullptr), 0);
  host.calls.clear();
}

TEST_P(PrepareTest, RebuildsWhatWasReclaimed) {
  Birth(S().flag);
  S().ReclaimAll();
  EXPECT_EQ(S().Prepare(true, false, &ready_, &table_), 0);
  EXPECT_EQ(ready_, 1);
  EXPECT_EQ(table_, *(Mp_G.*S().handle));
  EXPECT_EQ(Count(), 1);
  EXPECT_EQ(host.Take(), Rebuild());
  const auto* bytes = static_cast<const unsigned char*>(table_);
  EXPECT_TRUE(S().blocks == 2 ? bytes[0xFFFF] == 255 : static_cast<const float*>(table_)[255] == 1);

  // Held tables are handed out as they are, even if the host took the memory away.
  S().ReclaimAll();
  EXPECT_EQ(S().Prepare(true, false, &ready_, &table_), 0);
  EXPECT_EQ(ready_, 1);
  EXPECT_EQ(table_, nullptr);
  EXPECT_EQ(Count(), 2);
}

TEST_P(PrepareTest, NoRebuildLeavesTheHandles) {
  Birth(S().flag);
  S().ReclaimAll();
  const U_Handle handle = Mp_G.*S().handle;
  EXPECT_EQ(S().Prepare(false, true, &ready_, &table_), 0);
  EXPECT_EQ(ready_, 0);
  EXPECT_EQ(table_, nullptr);
  EXPECT_EQ(Count(), 1);
  Count() = 0;
  EXPECT_EQ(S().Prepare(true, true, &ready_, &table_), M_ERR_MEMORY);
  EXPECT_EQ(ready_, 0);
  EXPECT_EQ(table_, nullptr);
  EXPECT_EQ(Count(), 1);
  EXPECT_EQ(Mp_G.*S().handle, handle);
  EXPECT_EQ(host.Take(), (Calls{S().unavailable}));
}

TEST_P(PrepareTest, FailedRebuildLeavesNothing) {
  for (int failing = 1; failing <= S().blocks; ++failing) {
    for (const bool report : {false, true}) {
      SCOPED_TRACE(failing);
      host = {};
      Mp_G = {};
      Birth(S().flag);
      S().ReclaimAll();
      host.failing = {S().blocks + failing};
      EXPECT_EQ(S().Prepare(report, false, &ready_, &table_), report ? M_ERR_MEMORY : 0);
      EXPECT_EQ(ready_, 0);
      EXPECT_EQ(table_, nullptr);
      EXPECT_EQ(Count(), 1);
      EXPECT_EQ(Mp_G.*S().handle, nullptr);
      EXPECT_EQ(Mp_G.fcdTable, nullptr);
      EXPECT_EQ(host.handles, 0) << "no block of the failed rebuild is left";
      const Calls calls = host.Take();
      EXPECT_EQ(calls.back() == S().unavailable, report);
      EXPECT_EQ(S().Prepare(report, false, &ready_, &table_), M_ERR_UNREQUESTED_SERVICE);
      EXPECT_EQ(host.Take(), (Calls{S().missing}));
    }
  }
}

TEST_F(LifeTest, OneReclaimedCharacterTableIsEnough) {
  for (U_Handle M_Globals::*handle : {&M_Globals::fcmTable, &M_Globals::fcdTable}) {
    Mp_G = {};
    Birth(M_SERVICE_FCMD);
    Reclaim(Mp_G.*handle);
    const unsigned char* mul = nullptr;
    const unsigned char* div = nullptr;
    unsigned char ready = 9;
    EXPECT_EQ(M_PrepareFCMD(false, true, &ready, &mul, &div), 0);
    EXPECT_EQ(ready, 0);
    EXPECT_EQ(mul, *Mp_G.fcmTable) << "the pointers are the handles' own";
    EXPECT_EQ(div, *Mp_G.fcdTable);
    Mp_G.fcmdPrepareCount = 0;
    EXPECT_EQ(M_PrepareFCMD(false, false, &ready, &mul, &div), 0);
    EXPECT_EQ(ready, 1);
    EXPECT_EQ(mul[0xFFFF] & div[0], 255);
    Mp_SetdownFCM();
    host.calls.clear();
  }
}

}  // namespace
