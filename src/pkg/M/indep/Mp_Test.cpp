#include "Mp_Life.h"

extern "C" void Mp_TestAreEqual() {}
