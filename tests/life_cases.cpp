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

// Two lent pointers against the tables they should be.
template <class T>
std::string Lent(const T* lent, U_Handle handle) {
  if (!lent) return "null";
  return handle && lent == *handle ? "lent" : "stray";
}

const Operation kOperations[] = {
    {"Fresh",
     [](Arguments&) {
       Mp_SetdownTrig(), Mp_SetdownFCM();
       const int left = host.handles;
       Mp_G = handedOver = {};
       host = {};
       return Text(left);
     }},
    {"Fail",
     [](Arguments& in) {
       host.failing.clear();
       for (int count = in.Int(); count > 0; --count)
         host.failing.push_back(host.allocations + in.Int());
       return std::string();
     }},
    {"HostAnswers", [](Arguments& in) { return host.reportResult = in.Int(), std::string(); }},
    {"Reclaim",
     [](Arguments& in) {
       const std::string name = in.Word();
       const U_Handle handle = name == "trig"  ? Mp_G.trigTable
                               : name == "fcm" ? Mp_G.fcmTable
                                               : Mp_G.fcdTable;
       std::free(*handle);
       *handle = nullptr;
       return std::string();
     }},
    {"Set",
     [](Arguments& in) {
       const std::string name = in.Word();
       const uint32_t value = in.Unsigned();
       if (name == "birthMagic") Mp_G.birthMagic = value;
       if (name == "birthMagic2") Mp_G.birthMagic2 = value;
       if (name == "services") Mp_G.services = value;
       if (name == "counts")
         Mp_G.ftrigPrepareCount = Mp_G.fcmdPrepareCount = static_cast<uint16_t>(value);
       if (name == "reserved") Mp_G.reserved1 = value, Mp_G.reserved2 = value + 1;
       if (name == "fcm") std::swap(Mp_G.fcmTable, handedOver.fcmTable);
       if (name == "fcd") std::swap(Mp_G.fcdTable, handedOver.fcdTable);
       if (name == "trig") std::swap(Mp_G.trigTable, handedOver.trigTable);
       return std::string();
     }},
    {"State", [](Arguments&) { return State(Mp_G); }},
    {"HandedOver",
     [](Arguments&) {
       return State(handedOver)
           .append(Text(static_cast<int64_t>(handedOver.reserved1),
                        static_cast<int64_t>(handedOver.reserved2)));
     }},
    {"Birth",
     [](Arguments& in) {
       uint32_t granted = 99;
       const int32_t code = M_Birth(in.Unsigned(), &granted);
       return Text(granted).append(Outcome(code));
     }},
    {"BirthWithoutOutput", [](Arguments& in) { return Outcome(M_Birth(in.Unsigned(), nullptr)); }},
    {"Death", [](Arguments&) { return Outcome(M_Death()); }},
    {"GetGlobals", [](Arguments&) { return Outcome(M_GetGlobals(&handedOver)); }},
    {"SetGlobals", [](Arguments&) { return Outcome(M_SetGlobals(&handedOver)); }},
    {"Timer",
     [](Arguments&) {
       return Outcome(Mp_SetupTimer() | Mp_SetdownTimer() | Mp_PauseTimer() | Mp_ContinueTimer());
     }},
    {"PrepareFTrig",
     [](Arguments& in) {
       const bool report = in.Int(), noRebuild = in.Int();
       const float stray = 0, *table = &stray;
       unsigned char ready = 9;
       const int32_t code = M_PrepareFTrig(report, noRebuild, &ready, &table);
       return Text(ready, Lent(table, Mp_G.trigTable)).append(Outcome(code));
     }},
    {"PrepareFCMD",
     [](Arguments& in) {
       const bool report = in.Int(), noRebuild = in.Int();
       const unsigned char stray = 0, *mul = &stray, *div = &stray;
       unsigned char ready = 9;
       const int32_t code = M_PrepareFCMD(report, noRebuild, &ready, &mul, &div);
       return Text(ready, Lent(mul, Mp_G.fcmTable), Lent(div, Mp_G.fcdTable)).append(Outcome(code));
     }},
    {"PrepareWithoutOutputs",
     [](Arguments&) {
       return Outcome(M_PrepareFTrig(false, false, nullptr, nullptr) |
                      M_PrepareFCMD(false, false, nullptr, nullptr, nullptr));
     }},
    {"UnprepareFTrig", [](Arguments&) { return Outcome(M_UnprepareFTrig()); }},
    {"UnprepareFCMD", [](Arguments&) { return Outcome(M_UnprepareFCMD()); }},
    {"TrigEntry",
     [](Arguments& in) {
       return Text(static_cast<int>(static_cast<float*>(*Mp_G.trigTable)[in.Int()] * 0x1p24f));
     }},
    {"CharEntries",
     [](Arguments& in) {
       const int a = in.Int(), b = in.Int();
       return Text(static_cast<unsigned char*>(*Mp_G.fcmTable)[a * 256 + b],
                   static_cast<unsigned char*>(*Mp_G.fcdTable)[a * 256 + b]);
     }},
    {"ReportErr",
     [](Arguments& in) {
       const auto place = static_cast<int16_t>(in.Int());
       const int32_t code = in.Int();
       host.touches = 0;
       EXPECT_EQ(Mp_ReportErr(place, code, static_cast<int16_t>(in.Int())), code);
       return Text(host.touches).append(Outcome(0));
     }},
};

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
