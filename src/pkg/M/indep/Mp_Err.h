/// \file
/// The one way by which the library reports an error, and the places that report.
#ifndef MP_ERR_H
#define MP_ERR_H

#include <cstdint>

#include "Mp_Strs.h"

/// A report's identifier is 0x110000 plus the number of its place. Place numbers never change:
/// hosts and their users look errors up by them.
enum : int16_t {
  Mp_PLACE_FIX24_MUL = 8,
  Mp_PLACE_FIX24_RATIO = 9,
  Mp_PLACE_CALC_RATIO = 16,
  Mp_PLACE_MUL_RATIO = 17,
  Mp_PLACE_CONV_RATIO = 18,
  Mp_PLACE_SHORT_CONV_RATIO = 19,
  Mp_PLACE_PREPARE_FCMD = 31,
  Mp_PLACE_UNPREPARE_FCMD = 32,
  Mp_PLACE_INVERSE_MATRIX = 35,
  Mp_PLACE_TRANSFORM_POINTS = 38,
  Mp_PLACE_TRANSFORM_FIX_POINTS = 39,
  Mp_PLACE_FTRIG = 42,
  Mp_PLACE_MATRIX4 = 45,
  Mp_PLACE_RAY_INTERSECT_PLANE = 47,
};

/// Identifiers of the reports, and of the allocations, that go straight to the host.
enum : uint32_t {
  Mp_ID_BASE = 0x110000,
  Mp_ID_BIRTH = 0x110014,
  Mp_ID_DEATH = 0x110015,
  Mp_ID_GET_GLOBALS = 0x110016,
  Mp_ID_SET_GLOBALS = 0x110017,
  Mp_ID_CLIP_RATIO = 0x110018,
  Mp_ID_TRIG_TABLE = 0x110019,
  Mp_ID_FCMD_TABLES = 0x11001B,
  Mp_ID_SETUP_GAUSS = 0x11001D,
  Mp_ID_SETDOWN_GAUSS = 0x11001E,
  Mp_ID_FCMD_UNAVAILABLE = 0x11001F,
  Mp_ID_FTRIG_UNAVAILABLE = 0x11002A,
  Mp_ID_ROTATE_MATRIX4 = 0x11002E,
  Mp_ID_NORMALIZE = 0x110037,
  Mp_ID_TRANSFORM_POINT3 = 0x110039,
  Mp_ID_TRANSFORM_POINTS3 = 0x11003A,
  Mp_ID_TRANSFORM_POINT4 = 0x11003B,
  Mp_ID_TRANSFORM_POINTS4 = 0x11003C,
};

/// Severities and error numbers that mean something to the host only.
enum : int32_t {
  Mp_SEVERITY_WARNING = 4,
  Mp_SEVERITY_ERROR = 8,
  Mp_HOST_BAD_ARGUMENT = 2,
  Mp_HOST_BAD_RANGE = 3,
  Mp_HOST_NOT_AVAILABLE = 5,
  Mp_HOST_NOT_ALIVE = 11,
  Mp_HOST_ALREADY_ALIVE = 12,
};

#pragma GCC visibility push(default)
extern "C" {

/// Writes the message of `code` into the thread's logging buffer, reports it under 0x110000 | place
/// and returns `code`. `detail` is the message that fills the "%s" (0 where there is none). Code 0
/// returns 0 and does not touch the host.
int32_t Mp_ReportErr(int16_t place, int32_t code, int16_t detail);
}
#pragma GCC visibility pop

#endif  // MP_ERR_H
