/// \file
/// The message table: keys that the host turns into text in the user's language.
#ifndef MP_STRS_H
#define MP_STRS_H

#include <cstddef>
#include <cstdint>

/// Index of a message, the four digits of its key. "In..." are the details that fill a "%s".
enum : int16_t {
  Mp_STR_UNKNOWN_ERROR = 0,
  Mp_STR_UNDERFLOW = 1,
  Mp_STR_OVERFLOW = 2,
  Mp_STR_DIVIDE_BY_ZERO = 3,
  Mp_STR_TRIG_TABLE_INITIALIZATION = 4,
  Mp_STR_GAUSSIAN_TABLE_INITIALIZATION = 5,
  Mp_STR_FCMD_TABLE = 6,
  Mp_STR_UNREQUESTED_SERVICE = 7,
  Mp_STR_FCMD_UNAVAILABLE = 8,
  Mp_STR_FCMD_UNPREPARE = 9,
  Mp_STR_ZERO_DENOMINATOR = 10,
  Mp_STR_IN_RATIO_ADDITION = 11,
  Mp_STR_IN_RATIO_SUBTRACTION = 12,
  Mp_STR_IN_RATIO_MULTIPLY = 13,
  Mp_STR_IN_RATIO_CONVERSION = 14,
  Mp_STR_IN_RATIO_COMPARISON = 15,
  Mp_STR_INVALID_RANGE = 16,
  Mp_STR_IN_RATIO_SPAN = 17,
  Mp_STR_IN_FAST_CHAR_MATH = 18,
  Mp_STR_IN_FIXED_MULTIPLY = 19,
  Mp_STR_IN_FIXED_DIVIDE = 20,
  Mp_STR_IN_FIX24_MULTIPLY = 21,
  Mp_STR_IN_FIX24_DIVIDE = 22,
  Mp_STR_IN_MATRIX_CONVERSION = 23,
  Mp_STR_NOT_INVERTIBLE = 24,
  Mp_STR_IN_FIXED_POINT_TRANSFORMATION = 25,
  Mp_STR_IN_POINT_TRANSFORMATION = 26,
  Mp_STR_IN_FIXED_VECTOR_TRANSFORMATION = 27,
  Mp_STR_UNIMPLEMENTED = 28,
  Mp_STR_IN_RATIO_DIVIDE = 29,
  Mp_STR_TRIG_TABLE = 30,
  Mp_STR_IN_FAST_TRIG = 31,
  Mp_STR_FTRIG_UNAVAILABLE = 32,
  Mp_STR_FTRIG_UNPREPARE = 33,
  Mp_STR_NOT_DECOMPOSABLE = 34,
  Mp_STR_NO_ROTATION_MATRIX = 35,
  Mp_STR_NO_NORMAL = 36,
  Mp_STR_NO_PLANE_INTERSECTION = 37,
  Mp_STR_ZERO_VECTOR = 38,
  Mp_STR_IN_VECTOR_DIVIDE = 39,
  Mp_STR_W_IS_ZERO = 40,
  Mp_STR_NORMALIZE_HOMOGENEOUS = 41,
};

/// One message. The host's string cache owns the three words behind the key.
struct Mp_StrEntry {
  const char* key;
  alignas(8) uint64_t cache[3];
};
static_assert(sizeof(Mp_StrEntry) == 32 && offsetof(Mp_StrEntry, cache) == 8);

/// What the host is handed to find a message.
struct Mp_StrHeader {
  const char* component;
  alignas(8) uint64_t count;  ///< Entries of the table, its terminator included.
  Mp_StrEntry* table;
  alignas(8) uint64_t reserved;
};
static_assert(sizeof(Mp_StrHeader) == 32 && offsetof(Mp_StrHeader, count) == 8);
static_assert(offsetof(Mp_StrHeader, table) == 16 && offsetof(Mp_StrHeader, reserved) == 24);

struct Mp_StrRef {
  Mp_StrHeader* header;
  alignas(8) uint64_t reserved;
};
static_assert(sizeof(Mp_StrRef) == 16 && offsetof(Mp_StrRef, reserved) == 8);

#pragma GCC visibility push(default)
extern "C" {
extern Mp_StrEntry M_G_ztab[43];
extern Mp_StrHeader M_G_zhdr;
extern Mp_StrRef M_G_zref;
}
#pragma GCC visibility pop

namespace Mp {

/// The text of a message, as the host has it in the user's language.
const char* Text(int32_t index);

}  // namespace Mp

#endif  // MP_STRS_H
