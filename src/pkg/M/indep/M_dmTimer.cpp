// The timer service is accepted at birth and does nothing.

#include "Mp_Life.h"

extern "C" {

int32_t Mp_SetupTimer() { return 0; }
int32_t Mp_SetdownTimer() { return 0; }
int32_t Mp_PauseTimer() { return 0; }
int32_t Mp_ContinueTimer() { return 0; }

}  // extern "C"
