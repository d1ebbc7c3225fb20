// The library's life, its tables and its reports, beside a model that says what the host is asked,
// and in which state the library is meanwhile.

#include <cstring>

#include "Law.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"

namespace {

// A table: none, its memory reclaimed, or there.
enum Table : char { kNo = '-', kReclaimed = '0', kThere = 't' };

std::string Text(uint32_t magic, uint32_t magic2, uint32_t services, char trig, char fcm, char fcd,
                 int trigCount, int fcmdCount) {
  std::string text = magic == M_LIFE_MAGIC ? " a" : " d";
  text.append(magic2 == M_LIFE_MAGIC ? "a " : "d ").append(std::to_string(services)).append(" ");
  text.append({trig, fcm, fcd, ' '}).append(std::to_string(trigCount)).append("/");
  return text.append(std::to_string(fcmdCount));
}

std::string StateOfLibrary() {
  const auto table = [](U_Handle h) -> char { return !h ? kNo : *h ? kThere : kReclaimed; };
  return Text(Mp_G.birthMagic, Mp_G.birthMagic2, Mp_G.services, table(Mp_G.trigTable),
              table(Mp_G.fcmTable), table(Mp_G.fcdTable), Mp_G.ftrigPrepareCount,
              Mp_G.fcmdPrepareCount);
}

struct Model {
  uint32_t magic = 0, magic2 = 0, services = 0;
  char trig = kNo, fcm = kNo, fcd = kNo, orphan = kNo;
  uint16_t trigCount = 0, fcmdCount = 0;
  unsigned failing = 0, reclaiming = 0;
  int answers = -1;
  std::vector<char*> given;
  Calls calls;

  std::string State() const {
    return Text(magic, magic2, services, trig, fcm, fcd, trigCount, fcmdCount);
  }
  bool IsAlive() const { return magic == M_LIFE_MAGIC && magic2 == M_LIFE_MAGIC; }

  void Note(const std::string& call) { calls.push_back(call + State()); }
  int32_t Report(const std::string& report, int32_t usual) {
    Note(report);
    return answers < 0 ? usual : answers;
  }
  bool Allocate(const std::string& call, char* table) {
    Note("allocate " + call);
    const bool fails = std::exchange(failing, failing >> 1) & 1;
    if (std::exchange(reclaiming, reclaiming >> 1) & 1 && !given.empty())
      *given.back() = kReclaimed;
    *table = fails ? kNo : kThere;
    // What stood there before is nobody's any more, but the host still has it.
    std::replace(given.begin(), given.end(), table, &orphan);
    if (!fails) given.push_back(table);
    return !fails;
  }
  void Free(char* table) {
    if (*table == kNo) return;
    Note("free");
    *table = kNo;
    std::erase(given, table);
  }

  int32_t SetUp(uint32_t flag) {
    if (flag == M_SERVICE_TIMER) return 0;
    if (flag == M_SERVICE_GAUSS) return Report("11001d 8 host 5 Gaussian table initialization.", 5);
    if (flag == M_SERVICE_TRIG) return Allocate("110019 FCM/D table 1024", &trig) ? 0 : 4;
    if (!Allocate("11001b FCM/D table 65536", &fcm)) return 4;
    if (Allocate("11001b FCM/D table 65536", &fcd)) return 0;
    Free(&fcm);
    return 4;
  }
  int32_t SetDown(uint32_t flag) {
    if (flag == M_SERVICE_GAUSS) return Report("11001e 8 host 5 Gaussian table initialization.", 5);
    if (flag == M_SERVICE_TRIG) Free(&trig);
    if (flag == M_SERVICE_FCMD) Free(&fcm), Free(&fcd);
    return 0;
  }

  int32_t Birth(uint32_t wanted, uint32_t* granted) {
    Note("log 10 M Birth M Birth");
    if (IsAlive()) return Report("110014 8 host 12 -", 12);
    services = 0;
    int32_t result = 0;
    for (uint32_t flag = 1; flag <= 8; flag *= 2) {
      if (!(wanted & flag)) continue;
      const int32_t code = SetUp(flag);
      if (result == 0) result = code;
      if (result == 0) services |= flag;
    }
    *granted = services;
    if (result == 0) magic = magic2 = M_LIFE_MAGIC;
    return result;
  }
  int32_t Death() {
    Note("log 10 M Death M Death");
    if (!IsAlive()) return Report("110015 8 host 11 -", 11);
    int32_t result = 0;
    for (uint32_t flag = 1; flag <= 8; flag *= 2) {
      if (services & flag) result = SetDown(flag);
    }
    magic = magic2 = 0;
    return result;
  }

  // What is alike in both kinds of tables.
  int32_t Prepare(bool isTrig, bool report, bool noRebuild, unsigned char* ready, bool* isLent) {
    const char* const place = isTrig ? "11002a" : "11001f";
    uint16_t* const count = isTrig ? &trigCount : &fcmdCount;
    *ready = *isLent = 0;
    if (!Has(isTrig)) return Unrequested(place, isTrig);
    *ready = *isLent = 1;
    const bool isGone = isTrig ? trig == kReclaimed : fcm == kReclaimed || fcd == kReclaimed;
    if (*count == 0 && isGone) {
      *ready = !noRebuild && Rebuild(isTrig);
      *count = 1;
      if (!*ready && report) {
        *isLent = 0;
        Note(isTrig ? "11002a 8 fast trig will be unavailable."
                    : "11001f 8 fast character math will be unavailable.");
        return 4;
      }
    } else {
      ++*count;
    }
    return 0;
  }
  bool Rebuild(bool isTrig) {
    if (isTrig) {
      Free(&trig);
      return Allocate("1024", &trig);
    }
    Free(&fcm), Free(&fcd);
    const bool isFirst = Allocate("65536", &fcm), isSecond = Allocate("65536", &fcd);
    if (!isFirst || !isSecond) Free(&fcm), Free(&fcd);
    return fcm == kThere && fcd == kThere;
  }
  bool Has(bool isTrig) const {
    return isTrig ? services & M_SERVICE_TRIG && trig != kNo
                  : services & M_SERVICE_FCMD && fcm != kNo && fcd != kNo;
  }
  int32_t Unrequested(const std::string& place, bool isTrig) {
    Note(place + " 8 attempt to use unrequested math service (fast " +
         (isTrig ? "trig)." : "char math)."));
    return M_ERR_UNREQUESTED_SERVICE;
  }
  int32_t Unprepare(bool isTrig) {
    if (!Has(isTrig)) return Unrequested(isTrig ? "11002a" : "110020", isTrig);
    --(isTrig ? trigCount : fcmdCount);
    return 0;
  }
};

struct Step {
  int kind;
  uint32_t word;
};
void showValue(const Step& step, std::ostream& os) { ShowList(os, step.kind, step.word); }

// The pointer that a table lends; none for a table that is not there.
template <class T>
void IsLent(const T* lent, bool isLent, U_Handle handle) {
  const void* const expected = isLent && handle ? *handle : nullptr;
  Check(lent == expected);
}

void Do(const Step& step, Model& model) {
  const uint32_t word = step.word;
  const bool isTrig = word & 1, report = word & 2, noRebuild = word & 4,
             withOutputs = word % 5 != 0;
  U_Handle* const tables[] = {&Mp_G.trigTable, &Mp_G.fcmTable, &Mp_G.fcdTable};
  char* const modelTables[] = {&model.trig, &model.fcm, &model.fcd};
  M_Globals record, before = Mp_G;
  uint32_t granted = 99, modelGranted = 99;
  switch (step.kind) {
    case 0:
    case 1:
      Equal(M_Birth(word, withOutputs ? &granted : nullptr), model.Birth(word, &modelGranted));
      Check(!withOutputs || granted == modelGranted);
      break;
    case 2:
      Equal(M_Death(), model.Death());
      break;
    case 3: {
      std::memset(static_cast<void*>(&record), 0x55, sizeof record);
      const M_Globals untouched = record;
      const int32_t code = model.IsAlive() ? 0 : model.Report("110016 8 host 11 -", 11);
      Equal(M_GetGlobals(&record), code);
      Equal(std::memcmp(&record, model.IsAlive() ? &before : &untouched, sizeof record), 0);
      if (model.IsAlive()) model.magic = model.magic2 = 0;
      break;
    }
    case 4: {
      // The record of another copy, in any state; the tables stay those that there are.
      record = Mp_G;
      record.birthMagic = word & 3 ? M_LIFE_MAGIC : 0;
      record.birthMagic2 = word & 12 ? M_LIFE_MAGIC : 0;
      record.services = word >> 8 & 15;
      record.reserved1 = word, record.reserved2 = ~word;
      record.ftrigPrepareCount = word >> 16 & 1, record.fcmdPrepareCount = word >> 17 & 1;
      if (model.IsAlive()) {
        Equal(M_SetGlobals(&record), model.Report("110017 8 host 12 -", 12));
        Equal(std::memcmp(&Mp_G, &before, sizeof record), 0);
        break;
      }
      model.magic = record.birthMagic, model.magic2 = record.birthMagic2;
      model.services = record.services;
      model.trigCount = record.ftrigPrepareCount, model.fcmdCount = record.fcmdPrepareCount;
      const int32_t code = model.IsAlive() ? 0 : model.Report("110017 8 host 2 -", 2);
      Equal(M_SetGlobals(&record), code);
      Equal(std::memcmp(&Mp_G, &record, sizeof record), 0);
      break;
    }
    case 5: {
      unsigned char ready = 9, modelReady = 9;
      bool isLent = false;
      const int32_t code = model.Prepare(isTrig, report, noRebuild, &modelReady, &isLent);
      const float stray = 0, *sine = &stray;
      const unsigned char other = 0, *mul = &other, *div = &other;
      unsigned char* const out = withOutputs ? &ready : nullptr;
      if (isTrig) {
        Equal(M_PrepareFTrig(report, noRebuild, out, word & 64 ? nullptr : &sine), code);
        if (!(word & 64)) IsLent(sine, isLent, Mp_G.trigTable);
      } else {
        Equal(M_PrepareFCMD(report, noRebuild, out, word & 64 ? nullptr : &mul,
                            word & 128 ? nullptr : &div),
              code);
        if (!(word & 64)) IsLent(mul, isLent, Mp_G.fcmTable);
        if (!(word & 128)) IsLent(div, isLent, Mp_G.fcdTable);
      }
      Check(!withOutputs || ready == modelReady);
      break;
    }
    case 6:
      Equal((isTrig ? M_UnprepareFTrig : M_UnprepareFCMD)(), model.Unprepare(isTrig));
      break;
    case 7:
      if (const size_t i = word % 3; *tables[i] && **tables[i]) {
        Reclaim(*tables[i]);
        *modelTables[i] = kReclaimed;
      }
      break;
    case 8:
      model.failing = host.failing = word & 15;
      model.reclaiming = host.reclaiming = word >> 4 & 15;
      break;
    default:
      model.answers = host.answers = word % 3 == 0 ? -1 : word % 3 == 1 ? 0 : 1234;
  }
  // Tables that are there are filled.
  for (const U_Handle table : {Mp_G.fcmTable, Mp_G.fcdTable}) {
    // In brackets, or nothing is left out.
    Check(!table || !*table || static_cast<unsigned char*>(*table)[65535] == 255);
  }
  Check(!Mp_G.trigTable || !*Mp_G.trigTable || static_cast<float*>(*Mp_G.trigTable)[255] == 1);
}

TEST(Life, IsThatOfTheModel) {
  const auto step = operands::Make<Step>(rc::gen::inRange(0, 10), operands::Bits());
  Holds([&] {
    const auto steps = *rc::gen::container<std::vector<Step>>(step);
    FreeHandles();
    host = {};
    host.state = StateOfLibrary;
    Mp_G = {};
    Model model;
    for (const Step& each : steps) {
      Do(each, model);
      Equal(host.Take(), std::exchange(model.calls, {}));
      Equal(StateOfLibrary(), model.State());
    }
  });
  FreeHandles();
  Mp_G = {};
  EXPECT_EQ(Mp_SetupTimer() | Mp_SetdownTimer() | Mp_PauseTimer() | Mp_ContinueTimer(), 0);
}

TEST(Tables, AreRoundedToNearest) {
  ASSERT_EQ(M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
  for (int isRebuilt = 0; isRebuilt < 2; ++isRebuilt) {
    const unsigned char *mul, *div;
    const float* sine;
    ASSERT_EQ(M_PrepareFCMD(true, false, nullptr, &mul, &div), 0);
    ASSERT_EQ(M_PrepareFTrig(true, false, nullptr, &sine), 0);
    for (int a = 0; a < 256; ++a) {
      ASSERT_NEAR(sine[a], std::sin(a / 255.0 * std::acos(0.0)), 0x1p-25);
      for (int b = 0; b < 256; ++b) {
        ASSERT_LE(std::abs(2 * (a * b - 255 * *mul++)), 255) << a << ' ' << b;
        const int rest = 2 * (255 * b - a * *div++);
        ASSERT_TRUE(b >= a ? div[-1] == 255 : -a <= rest && rest < a + a % 2) << a << ' ' << b;
      }
    }
    EXPECT_EQ(M_UnprepareFCMD() | M_UnprepareFTrig(), 0);
    for (const U_Handle table : {Mp_G.trigTable, Mp_G.fcmTable, Mp_G.fcdTable}) Reclaim(table);
  }
  EXPECT_EQ(M_Death(), 0);
  EXPECT_TRUE(host.handles.empty());
  Mp_G = {};
  host = {};
}

TEST(Reports, AreMessagesWithTheirDetails) {
  const std::pair<int32_t, std::string> messages[] = {
      {0x1102, "8 overflow %s."},
      {0x1103, "4 underflow %s."},
      {0x1104, "8 divide by zero %s."},
      {0x1105, "8 attempt to use unrequested math service (%s)."},
      {0x1106, "8 zero denominator %s."},
      {0x1107, "8 unable to invert matrix."},
      {0x1108, "8 unable to decompose matrix."},
      {0x1109, "8 unable to calculate normal vector."},
      {0x110A, "8 unable to intersect plane."}};
  Holds([&](Short place, Int other, Digit kind) {
    const auto detail = static_cast<int16_t>(*rc::gen::inRange(-2, 45));
    const bool isOther = kind == 9;
    const auto& [code, message] = messages[isOther ? 0 : kind + 9 > 8 ? (kind + 9) / 2 : kind + 9];
    std::string text = message;
    if (const size_t at = text.find("%s"); at != std::string::npos) {
      const bool isText = detail >= 0 && detail < 42;
      text.replace(at, 2, isText ? std::strchr(M_G_ztab[detail].key, '=') + 1 : "(no such text)");
    }
    if (isOther) text = "8 unknown error (" + std::to_string(other.value) + ").";
    RC_PRE(!isOther || other < 0x1102 || other > 0x110A);
    const int32_t given = isOther ? other.value : code;
    char id[20];
    std::snprintf(id, sizeof id, "%x ", 0x110000 | static_cast<uint16_t>(place));
    Equal(Mp_ReportErr(place, given, detail), given);
    Equal(host.Take(), (given == 0 ? Calls() : Calls{id + text}));
  });
  std::strcpy(Up_GetThreadLoggingBuffer(), "kept");
  EXPECT_EQ(Mp_ReportErr(1, 0, 11), 0);
  EXPECT_STREQ(Up_GetThreadLoggingBuffer(), "kept");
}

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

}  // namespace
