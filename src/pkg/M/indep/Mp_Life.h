/// \file
/// The globals record and the set-up and set-down routines of the services.
#ifndef MP_LIFE_H
#define MP_LIFE_H

#include <cstdint>

#include "M_Utils.h"

#pragma GCC visibility push(default)
extern "C" {

extern M_Globals Mp_G;

int32_t Mp_SetupTimer();
int32_t Mp_SetdownTimer();
int32_t Mp_PauseTimer();
int32_t Mp_ContinueTimer();

int32_t Mp_SetupTrig();
int32_t Mp_SetdownTrig();
int32_t Mp_SetupFCM();
int32_t Mp_SetdownFCM();

/// The Gauss service exists in name only: both report and return what the host answers.
int32_t Mp_SetupGauss();
int32_t Mp_SetdownGauss();

/// Does nothing; called as birth ends, whatever its result.
void Mp_TestAreEqual();
}
#pragma GCC visibility pop

#endif  // MP_LIFE_H
