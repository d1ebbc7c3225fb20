// The library's life, its tables and its reports.

#include <cstring>
#include <functional>

#include "Law.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Strs.h"
#include "XLOG.h"

namespace {

const char* TextOf(int number) { return U_ZLookupLStrCache(&M_G_zhdr, number, 0, 0); }

// What the library is to do, with a record of its own. Its kinds of tables are 0, trigonometry,
// with one, and 1, character math, with two.
struct Model {
  M_Globals g = {};

  bool IsAlive() const { return g.birthMagic == M_LIFE_MAGIC && g.birthMagic2 == M_LIFE_MAGIC; }
  uint16_t& Count(int kind) { return kind == 0 ? g.ftrigPrepareCount : g.fcmdPrepareCount; }
  std::vector<U_Handle*> Tables(int kind) {
    if (kind == 0) return {&g.trigTable};
    return {&g.fcmTable, &g.fcdTable};
  }
  // A letter for each table: there is none, its memory is reclaimed, or it is there.
  std::string Letters(int kind) {
    std::string text;
    for (const U_Handle* const table : Tables(kind)) text += !*table ? '-' : **table ? 't' : '0';
    return text;
  }
  bool HasOne(int kind, char letter) { return Letters(kind).find(letter) != std::string::npos; }
  std::string State() {
    char text[200];
    std::snprintf(text, sizeof text, " %x %x %u %s%s %u %u %zx %zx", g.birthMagic, g.birthMagic2,
                  g.services, Letters(0).c_str(), Letters(1).c_str(), Count(0), Count(1),
                  size_t{g.reserved1}, size_t{g.reserved2});
    return text;
  }

  static int32_t Report(uint32_t id, int32_t hostError, const char* text = nullptr) {
    return Up_ReportVarkErrString(id, 8, hostError, text);
  }
  void Free(int kind) {
    for (U_Handle* const table : Tables(kind)) {
      if (*table) U_FreeHandle(*table);
      *table = nullptr;
    }
  }
  int32_t SetUp(uint32_t service) {
    if (service == M_SERVICE_GAUSS) return Report(0x11001D, 5, TextOf(5));
    const int kind = service == M_SERVICE_FCMD;
    for (U_Handle* const table : Tables(kind)) {
      *table = U_AllocateHandle(kind ? 0x11001B : 0x110019, TextOf(6), kind ? 65536 : 1024);
      if (!*table && table == &g.fcdTable) Free(kind);
      if (!*table) return M_ERR_MEMORY;
    }
    return 0;
  }
  int32_t Birth(uint32_t wanted) {
    XLOG_Log(10, "M", "Birth", "M Birth");
    if (IsAlive()) return Report(0x110014, 12);
    g.services = wanted & M_SERVICE_TIMER;
    int32_t result = 0;
    for (const uint32_t service : {2u, 4u, 8u}) {
      const int32_t code = wanted & service ? SetUp(service) : 0;
      if (result == 0) result = code;
      if (result == 0) g.services |= wanted & service;
    }
    return result == 0 ? SetMagic(M_LIFE_MAGIC, 0) : result;
  }
  int32_t Death() {
    XLOG_Log(10, "M", "Death", "M Death");
    if (!IsAlive()) return Report(0x110015, 11);
    if (g.services & M_SERVICE_TRIG) Free(0);
    if (g.services & M_SERVICE_FCMD) Free(1);
    return SetMagic(0, g.services & M_SERVICE_GAUSS ? Report(0x11001E, 5, TextOf(5)) : 0);
  }
  int32_t SetMagic(uint32_t magic, int32_t code) {
    g.birthMagic = g.birthMagic2 = magic;
    return code;
  }
  int32_t Set(const M_Globals& record) {
    if (IsAlive()) return Report(0x110017, 12);
    g = record;
    return IsAlive() ? 0 : Report(0x110017, 2);
  }
  // Asks for a service, under the number of a place.
  int32_t Ask(int kind, int16_t place) {
    const bool isThere = g.services & M_SERVICE_TRIG << kind && !HasOne(kind, '-');
    return isThere ? 0 : Mp_ReportErr(place, M_ERR_UNREQUESTED_SERVICE, kind == 0 ? 31 : 18);
  }
  int32_t Prepare(int kind, bool isReported, bool isKept, unsigned char* isReady) {
    if (const int32_t code = Ask(kind, kind == 0 ? 42 : 31)) return code;
    if (Count(kind) == 0 && HasOne(kind, '0') && !isKept) {
      Free(kind);
      for (auto* const table : Tables(kind)) *table = U_AllocateHandleQuiet(kind ? 65536 : 1024);
      if (HasOne(kind, '-')) Free(kind);
    }
    *isReady = Count(kind)++ > 0 || (!HasOne(kind, '-') && !HasOne(kind, '0'));
    if (*isReady || !isReported) return 0;
    Up_ReportErrString(kind ? 0x11001F : 0x11002A, 8, TextOf(kind ? 8 : 32));
    return M_ERR_MEMORY;
  }
  int32_t Unprepare(int kind) {
    const int32_t code = Ask(kind, kind == 0 ? 42 : 32);
    if (code == 0) --Count(kind);
    return code;
  }
};

// Calls a function of the library, with the bits of a word as arguments, and one of the model, with
// a host of its own.
void Call(Model& model, TestHost& hostOfModel, uint32_t function, uint32_t word) {
  enum { kBirth, kDeath, kGet, kSet, kUnprepareTrig, kUnprepareChars, kPrepareTrig, kPrepareChars };
  const auto bit = [&](int i) { return (word >> i & 1) != 0; };
  const auto ask = [&](int i, auto* out) { return bit(i) ? out : nullptr; };
  // The record of another copy, in any state; the tables stay those that there are.
  const auto changed = [&](const M_Globals& g) -> M_Globals {
    return {
        word & 3 ? M_LIFE_MAGIC : 0,  word >> 8, word,  g.fcmTable, g.fcdTable, ~word, g.trigTable,
        word & 12 ? M_LIFE_MAGIC : 0, bit(6),    bit(7)};
  };
  const M_Globals before = Mp_G;
  const bool wasAlive = model.IsAlive();
  M_Globals record = changed(before);
  uint32_t granted = 99;
  unsigned char ready = 9, isReady = 0;
  const float stray = 0, *sine = &stray;
  const unsigned char *mul = &ready, *div = &ready;
  const std::pair<std::function<int32_t()>, std::function<int32_t()>> calls[] = {
      {[&] { return M_Birth(word, ask(4, &granted)); }, [&] { return model.Birth(word); }},
      {M_Death, [&] { return model.Death(); }},
      {[&] { return M_GetGlobals(&record); },
       [&] { return wasAlive ? model.SetMagic(0, 0) : Model::Report(0x110016, 11); }},
      {[&] { return M_SetGlobals(&record); }, [&] { return model.Set(changed(model.g)); }},
      {M_UnprepareFTrig, [&] { return model.Unprepare(0); }},
      {M_UnprepareFCMD, [&] { return model.Unprepare(1); }},
      {[&] { return M_PrepareFTrig(bit(1), bit(2), ask(3, &ready), ask(4, &sine)); },
       [&] { return model.Prepare(0, bit(1), bit(2), &isReady); }},
      {[&] { return M_PrepareFCMD(bit(1), bit(2), ask(3, &ready), ask(4, &mul), ask(5, &div)); },
       [&] { return model.Prepare(1, bit(1), bit(2), &isReady); }}};
  std::swap(host, hostOfModel);
  const int32_t code = calls[function].second();
  std::swap(host, hostOfModel);
  Equal(calls[function].first(), code);
  Equal(host.Take(), hostOfModel.Take());
  Equal(Model{Mp_G}.State(), model.State());
  Equal(granted, function == kBirth && bit(4) && !wasAlive ? model.g.services : 99);
  Equal(ready, function >= kPrepareTrig && bit(3) ? isReady : 9);
  Check(function != kGet || BitsOf(record) == BitsOf(wasAlive ? before : changed(before)));
  // What is lent is the table's memory, or null where there is nothing to lend.
  const auto lent = [&](U_Handle table) { return code == 0 && table ? *table : nullptr; };
  Check(function != kPrepareTrig || !bit(4) || sine == lent(Mp_G.trigTable));
  Check(function != kPrepareChars || !bit(4) || mul == lent(Mp_G.fcmTable));
  Check(function != kPrepareChars || !bit(5) || div == lent(Mp_G.fcdTable));
}

TEST(Life, IsThatOfTheModel) {
  // A function, its arguments, and what the host is up to.
  Holds([](const std::vector<std::array<uint32_t, 3>>& steps) {
    static Model model;
    TestHost hostOfModel;
    hostOfModel.state = [] { return model.State(); };
    host = {};
    host.state = [] { return Model{Mp_G}.State(); };
    Mp_G = model.g = {};
    for (const auto& [function, word, whims] : steps) {
      host.answers = hostOfModel.answers = (whims & 3) != 3 ? -1 : whims & 4 ? 0 : 1234;
      host.moods = hostOfModel.moods = whims & 8 ? whims >> 4 : 0;
      Call(model, hostOfModel, function % 8, word);
    }
  });
  Mp_G = {};
  EXPECT_EQ(Mp_SetupTimer() | Mp_SetdownTimer() | Mp_PauseTimer() | Mp_ContinueTimer(), 0);
}

TEST(Tables, AreRoundedToNearest) {
  // Of the three none, or one, is reclaimed as soon as it is given; then its kind is made anew.
  for (const unsigned moods : {0u, 04u, 040u, 0400u}) {
    host.moods = moods;
    ASSERT_EQ(M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr), 0);
    for (int missing = moods != 0; missing >= 0; --missing) {
      const auto* const sine = static_cast<const float*>(*Mp_G.trigTable);
      const auto* const mul = static_cast<const unsigned char*>(*Mp_G.fcmTable);
      const auto* const div = static_cast<const unsigned char*>(*Mp_G.fcdTable);
      ASSERT_EQ(!sine + !mul + !div, missing);
      for (int i = 0; i < 65536; ++i) {
        const int a = i / 256, b = i % 256, rest = div ? 2 * (255 * b - a * div[i]) : 0;
        ASSERT_TRUE(!sine || std::abs(sine[a] - std::sin(a / 510.0 * std::acos(-1))) <= 0x1p-25);
        ASSERT_TRUE(!mul || std::abs(2 * (a * b - 255 * mul[i])) <= 255) << i;
        ASSERT_TRUE(!div || (b < a ? -a <= rest && rest < a + a % 2 : div[i] == 255)) << i;
      }
      EXPECT_EQ(M_PrepareFTrig(true, false, nullptr, nullptr), 0);
      EXPECT_EQ(M_PrepareFCMD(true, false, nullptr, nullptr, nullptr), 0);
    }
    EXPECT_EQ(M_Death(), 0);
    Mp_G = {};
    host = {};
  }
}

TEST(Reports, AreMessagesWithTheirDetails) {
  // The messages of the codes, from the first one on.
  const int messages[] = {2, 1, 3, 7, 10, 24, 34, 36, 37};
  Holds([&](Short place) {
    const auto detail = *rc::gen::inRange<int16_t>(-2, 45);
    const int code = *rc::gen::oneOf(rc::gen::inRange(0x1100, 0x110D), operands::Ints());
    std::string text = "unknown error (" + std::to_string(code) + ").";
    if (0x1102 <= code && code <= 0x110A) text = TextOf(messages[code - 0x1102]);
    if (const size_t at = text.find("%s"); at != std::string::npos)
      text.replace(at, 2, TextOf(detail));
    std::ostringstream report;
    report << std::hex << (0x110000 | (place & 0xFFFF)) << (code == 0x1103 ? " 4 " : " 8 ") << text;
    const std::string before = Up_GetThreadLoggingBuffer();
    Equal(Mp_ReportErr(place, code, detail), code);
    Equal(host.Take(), (code == 0 ? Calls() : Calls{report.str()}));
    Check(code != 0 || before == Up_GetThreadLoggingBuffer());
  });
}

TEST(MessageTable, Layout) {
  EXPECT_STREQ(M_G_zhdr.component, "M");
  EXPECT_TRUE(M_G_zhdr.count == 43 && M_G_zhdr.table == M_G_ztab && M_G_zref.header == &M_G_zhdr);
  EXPECT_EQ(M_G_zhdr.reserved | M_G_zref.reserved, 0u);
  uint64_t hash = 0xCBF29CE484222325;  // FNV-1a
  for (const Mp_StrEntry& entry : M_G_ztab) {
    const uint64_t cache = &entry == &M_G_ztab[42] ? UINT64_MAX : 0;
    EXPECT_TRUE(entry.cache[0] == cache && entry.cache[1] == cache && entry.cache[2] == 0);
    for (const char* c = entry.key; c; c = *c ? c + 1 : nullptr) {
      hash = (hash ^ static_cast<unsigned char>(*c)) * 0x100000001B3;
    }
  }
  EXPECT_EQ(hash, 0xE670E85681B32FDE) << "a text has changed, and with it the catalogues' keys";
}

}  // namespace
