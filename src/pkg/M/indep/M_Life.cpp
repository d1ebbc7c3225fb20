#include "M_Utils.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "U.h"
#include "XLOG.h"

extern "C" {
M_Globals Mp_G;
}

namespace {

struct Service {
  uint32_t flag;
  int32_t (*setUp)();
  int32_t (*setDown)();
};

constexpr Service kServices[] = {
    {M_SERVICE_TIMER, Mp_SetupTimer, Mp_SetdownTimer},
    {M_SERVICE_TRIG, Mp_SetupTrig, Mp_SetdownTrig},
    {M_SERVICE_FCMD, Mp_SetupFCM, Mp_SetdownFCM},
    {M_SERVICE_GAUSS, Mp_SetupGauss, Mp_SetdownGauss},
};

constexpr int32_t kLogLevel = 10;

bool IsAlive() { return Mp_G.birthMagic == M_LIFE_MAGIC && Mp_G.birthMagic2 == M_LIFE_MAGIC; }

void SetBirthWords(uint32_t word) {
  Mp_G.birthMagic2 = word;
  Mp_G.birthMagic = word;
}

int32_t Refuse(uint32_t id, int32_t hostError) {
  return Up_ReportVarkErrString(id, Mp_SEVERITY_ERROR, hostError, nullptr);
}

}  // namespace

extern "C" {

int32_t M_Birth(uint32_t services, uint32_t* granted) {
  XLOG_Log(kLogLevel, "M", "Birth", "M Birth");
  if (IsAlive()) {
    const int32_t refusal = Refuse(Mp_ID_BIRTH, Mp_HOST_ALREADY_ALIVE);
    Mp_TestAreEqual();
    return refusal;
  }
  // Handles of an earlier life may still stand in Mp_G. They are overwritten and not freed, since
  // after M_GetGlobals they belong to whoever received the record.
  Mp_G.services = 0;
  int32_t result = 0;
  for (const Service& service : kServices) {
    if ((services & service.flag) == 0) continue;
    const int32_t code = service.setUp();
    if (result == 0) result = code;
    // Kept on purpose: after one failure no later service is granted, though it is set up.
    if (result == 0) Mp_G.services |= service.flag;
  }
  if (granted) *granted = Mp_G.services;
  if (result == 0) SetBirthWords(M_LIFE_MAGIC);
  Mp_TestAreEqual();
  return result;
}

int32_t M_Death() {
  XLOG_Log(kLogLevel, "M", "Death", "M Death");
  if (!IsAlive()) return Refuse(Mp_ID_DEATH, Mp_HOST_NOT_ALIVE);
  int32_t result = 0;
  for (const Service& service : kServices) {
    if (Mp_G.services & service.flag) result = service.setDown();
  }
  SetBirthWords(0);
  return result;
}

int32_t M_GetGlobals(M_Globals* out) {
  if (!IsAlive()) return Refuse(Mp_ID_GET_GLOBALS, Mp_HOST_NOT_ALIVE);
  const int32_t result = Mp_PauseTimer();
  *out = Mp_G;
  SetBirthWords(0);
  return result;
}

int32_t M_SetGlobals(const M_Globals* in) {
  if (IsAlive()) return Refuse(Mp_ID_SET_GLOBALS, Mp_HOST_ALREADY_ALIVE);
  Mp_G = *in;
  return IsAlive() ? Mp_ContinueTimer() : Refuse(Mp_ID_SET_GLOBALS, Mp_HOST_BAD_ARGUMENT);
}

}  // extern "C"
