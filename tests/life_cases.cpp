// Birth, death, the hand-over, the fast tables and the reporting routine, as lines of a story: each
// line finds the state that the lines above it left.

#include "Cases.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"

namespace {

M_Globals handedOver;

// Alive or not, services, which tables there are ("-" none, "0" reclaimed), counts, blocks of the
// host.
std::string State(const M_Globals& globals) {
  const auto table = [](U_Handle handle) { return handle ? *handle ? "table" : "0" : "-"; };
  return Text(globals.birthMagic == 0x27182818 ? "alive" : "dead",
              globals.birthMagic2 == globals.birthMagic ? "both" : "half", globals.services,
              table(globals.trigTable), table(globals.fcmTable), table(globals.fcdTable),
              globals.ftrigPrepareCount, globals.fcmdPrepareCount, host.handles);
}

U_Handle M_Globals::*Table(const std::string& name) {
  if (name == "trig") return &M_Globals::trigTable;
  return name == "fcm" ? &M_Globals::fcmTable : &M_Globals::fcdTable;
}

// Two lent pointers against the tables they should be.
template <class T>
std::string Lent(const T* lent, U_Handle handle) {
  return !lent ? "null" : handle && lent == *handle ? "lent" : "stray";
}

const Operation kFresh("Fresh", [](Arguments&) {
  Mp_SetdownTrig(), Mp_SetdownFCM();
  const int left = host.handles;
  Mp_G = handedOver = {};
  host = {};
  return Text(left);
});

const Operation kFail("Fail", [](Arguments& in) {
  host.failing.clear();
  for (int i = in.Int(); i > 0; --i) host.failing.push_back(host.allocations + in.Int());
  return std::string();
});

const Operation kHostAnswers("HostAnswers", [](Arguments& in) {
  return host.reportResult = in.Int(), std::string();
});

// Takes a table's memory away, as a host may.
const Operation kReclaim("Reclaim", [](Arguments& in) {
  void*& data = *(Mp_G.*Table(in.Word()));
  std::free(std::exchange(data, nullptr));
  return std::string();
});

// Puts a table aside, or brings it back.
const Operation kSwap("Swap", [](Arguments& in) {
  const auto table = Table(in.Word());
  return std::swap(Mp_G.*table, handedOver.*table), std::string();
});

const Operation kSet("Set", [](Arguments& in) {
  const std::string name = in.Word();
  const uint32_t value = in.Unsigned();
  if (name == "birthMagic") Mp_G.birthMagic = value;
  if (name == "birthMagic2") Mp_G.birthMagic2 = value;
  if (name == "services") Mp_G.services = value;
  if (name == "counts") Mp_G.ftrigPrepareCount = Mp_G.fcmdPrepareCount = value & 0xFFFF;
  if (name == "reserved") Mp_G.reserved1 = value, Mp_G.reserved2 = value + 1;
  return std::string();
});

const Operation kState("State", [](Arguments&) { return State(Mp_G); });

const Operation kHandedOver("HandedOver", [](Arguments&) {
  return State(handedOver)
      .append(Text(static_cast<int64_t>(handedOver.reserved1),
                   static_cast<int64_t>(handedOver.reserved2)));
});

const Operation kBirth("Birth", [](Arguments& in) {
  uint32_t granted = 99;
  const int32_t code = M_Birth(in.Unsigned(), &granted);
  return Text(granted).append(Outcome(code));
});

const Operation kBirthWithoutOutput("BirthWithoutOutput", [](Arguments& in) {
  return Outcome(M_Birth(in.Unsigned(), nullptr));
});

const Operation kDeath("Death", [](Arguments&) { return Outcome(M_Death()); });

const Operation kGetGlobals("GetGlobals",
                            [](Arguments&) { return Outcome(M_GetGlobals(&handedOver)); });

const Operation kSetGlobals("SetGlobals",
                            [](Arguments&) { return Outcome(M_SetGlobals(&handedOver)); });

const Operation kTimer("Timer", [](Arguments&) {
  return Outcome(Mp_SetupTimer() | Mp_SetdownTimer() | Mp_PauseTimer() | Mp_ContinueTimer());
});

const Operation kPrepareFTrig("PrepareFTrig", [](Arguments& in) {
  const bool report = in.Int(), noRebuild = in.Int();
  const float stray = 0, *table = &stray;
  unsigned char ready = 9;
  const int32_t code = M_PrepareFTrig(report, noRebuild, &ready, &table);
  return Text(ready, Lent(table, Mp_G.trigTable)).append(Outcome(code));
});

const Operation kPrepareFCMD("PrepareFCMD", [](Arguments& in) {
  const bool report = in.Int(), noRebuild = in.Int();
  const unsigned char stray = 0, *mul = &stray, *div = &stray;
  unsigned char ready = 9;
  const int32_t code = M_PrepareFCMD(report, noRebuild, &ready, &mul, &div);
  return Text(ready, Lent(mul, Mp_G.fcmTable), Lent(div, Mp_G.fcdTable)).append(Outcome(code));
});

const Operation kPrepareWithoutOutputs("PrepareWithoutOutputs", [](Arguments&) {
  return Outcome(M_PrepareFTrig(false, false, nullptr, nullptr) |
                 M_PrepareFCMD(false, false, nullptr, nullptr, nullptr));
});

const Operation kUnprepareFTrig("UnprepareFTrig",
                                [](Arguments&) { return Outcome(M_UnprepareFTrig()); });

const Operation kUnprepareFCMD("UnprepareFCMD",
                               [](Arguments&) { return Outcome(M_UnprepareFCMD()); });

const Operation kTrigEntry("TrigEntry", [](Arguments& in) {
  return Text(static_cast<int>(static_cast<float*>(*Mp_G.trigTable)[in.Int()] * 0x1p24f));
});

const Operation kCharEntries("CharEntries", [](Arguments& in) {
  const int a = in.Int(), b = in.Int();
  return Text(static_cast<unsigned char*>(*Mp_G.fcmTable)[a * 256 + b],
              static_cast<unsigned char*>(*Mp_G.fcdTable)[a * 256 + b]);
});

const Operation kReportErr("ReportErr", [](Arguments& in) {
  const auto place = static_cast<int16_t>(in.Int());
  const int32_t code = in.Int();
  host.touches = 0;
  EXPECT_EQ(Mp_ReportErr(place, code, static_cast<int16_t>(in.Int())), code);
  return Text(host.touches).append(Outcome(0));
});

TEST(MessageTable, Layout) {
  EXPECT_STREQ(M_G_zhdr.component, "M");
  EXPECT_EQ(M_G_zhdr.count, 43u);
  EXPECT_EQ(M_G_zhdr.table, M_G_ztab);
  EXPECT_EQ(M_G_zref.header, &M_G_zhdr);
  EXPECT_EQ(M_G_zhdr.reserved | M_G_zref.reserved, 0u);
  uint64_t hash = 0xCBF29CE484222325;  // FNV-1a
  for (const Mp_StrEntry& entry : M_G_ztab) {
    const bool isEnd = &entry == &M_G_ztab[42];
    EXPECT_EQ(entry.key == nullptr, isEnd);
    for (int i = 0; i < 3; ++i) EXPECT_EQ(entry.cache[i], isEnd && i < 2 ? UINT64_MAX : 0);
    for (const char* c = entry.key; c; c = *c ? c + 1 : nullptr) {
      hash = (hash ^ static_cast<unsigned char>(*c)) * 0x100000001B3;
    }
  }
  EXPECT_EQ(hash, 0xE670E85681B32FDE) << "a text has changed, and with it the catalogues' keys";
}

// A host that takes the first block back to give the second.
TEST(CharTables, AreFilledAsFarAsTheyAreThere) {
  host.reclaiming = {2, 4};
  EXPECT_EQ(M_Birth(M_SERVICE_FCMD, nullptr), 0);
  unsigned char ready = 9;
  const unsigned char *mul = nullptr, *div = nullptr;
  EXPECT_EQ(M_PrepareFCMD(true, false, &ready, &mul, &div), M_ERR_MEMORY);
  EXPECT_EQ(M_UnprepareFCMD(), 0);
  EXPECT_TRUE(ready == 0 && !mul && !div && !*Mp_G.fcmTable && *Mp_G.fcdTable);
  EXPECT_EQ(M_PrepareFCMD(true, false, &ready, &mul, &div), 0);
  EXPECT_TRUE(ready == 1 && mul[65535] == 255 && div[65535] == 255);
  EXPECT_EQ(M_UnprepareFCMD() | M_Death() | host.handles, 0);
  Mp_G = {};
  host = {};
}

// Every entry of the character tables is the nearest of its quotient.
TEST(CharTables, AreRoundedToNearest) {
  EXPECT_EQ(Mp_SetupFCM(), 0);
  const auto* mul = static_cast<const unsigned char*>(*Mp_G.fcmTable);
  const auto* div = static_cast<const unsigned char*>(*Mp_G.fcdTable);
  for (int a = 0; a < 256; ++a) {
    for (int b = 0; b < 256; ++b) {
      ASSERT_LE(std::abs(2 * (a * b - 255 * *mul++)), 255) << a << ' ' << b;
      const int rest = 2 * (255 * b - a * *div++);
      ASSERT_TRUE(b >= a ? div[-1] == 255 : -a <= rest && rest < a + a % 2) << a << ' ' << b;
    }
  }
  Mp_SetdownFCM();
  host = {};
}

}  // namespace
