/// \file
/// M_Utils.h: error codes, the life of the library, the fast tables, fixed point, integer utilities
/// and exact ratios.
///
/// Conventions: a function that can fail returns a 32-bit code, 0 for success. Pointers must not be
/// null unless their comment says so; flags that only inform (`unsigned char*`) may always be null.
/// Everything but the life cycle and the fast tables may be called from any thread.
///
/// In all headers, the same arguments give the same bits with every compiler, optimisation,
/// processor and number of threads, in the default floating-point environment: rounding to nearest,
/// and denormal numbers neither flushed to zero nor taken for zero, as media code likes to set it
/// for a thread. Excepted are the sine table and what M_Rect.h and M_Matrix.h compute by the
/// platform's sin, cos, asin, acos and atan2 (rotations, decompositions, slerp, bearings), and the
/// sign and payload of a NaN.

// Contents
//   Error codes
//   Life cycle        M_Birth M_Death M_GetGlobals M_SetGlobals
//   Fast tables       M_PrepareFTrig M_UnprepareFTrig M_PrepareFCMD M_UnprepareFCMD
//   Fixed point       M_FixMul M_FixDiv M_Fix24Mul M_Fix24Ratio
//   Bits and powers   M_LeadingZeros M_TrailingZeros M_RoundUpToPowerOf2 M_RoundDownToPowerOf2
//                     M_BitsUsed M_IsTopTwoBitsSame
//   Overflow          M_AddWouldOverflow M_MulWouldOverflow M_UMulWouldOverflow
//   GCD and LCM       M_SignedGCD M_UnsignedGCD M_SignedLCM M_UnsignedLCM
//   Rounding          M_RoundToNearestMult M_RoundDouble M_RoundDoubleSafe M_RoundDouble64
//                     M_fmod
//   Ratio arithmetic  M_ReduceRatio M_AddRatio M_SubRatio M_MulRatio M_DivRatio M_RecipRatio
//                     M_CompareRatio M_MinRatio M_MaxRatio M_FpLong2Ratio
//   Ratio conversion  M_ConvRatio M_ShortConvRatio M_ClipRatio M_ClipRatioToSpan
//                     M_ClipSpanToSpan

#ifndef M_UTILS_H
#define M_UTILS_H

#include <cstddef>
#include <cstdint>

#include "U.h"

#pragma GCC visibility push(default)

// ---------------------------------------------------------------------------------------------
/// \defgroup error_codes Error codes
/// \par Example
/// \include error_codes.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// What a failing function returns, or throws as an `int`. 0 is success.
enum : int32_t {
  M_ERR_MEMORY = 4,                      ///< An allocation failed.
  M_ERR_OVERFLOW = 0x1102,               ///< The result does not fit.
  M_ERR_UNDERFLOW = 0x1103,              ///< The result is too small.
  M_ERR_DIVIDE_BY_ZERO = 0x1104,         ///< A divisor is 0.
  M_ERR_UNREQUESTED_SERVICE = 0x1105,    ///< The service was not asked for at birth.
  M_ERR_ZERO_DENOMINATOR = 0x1106,       ///< A ratio's denominator is 0.
  M_ERR_NOT_INVERTIBLE = 0x1107,         ///< The matrix has no inverse.
  M_ERR_NOT_DECOMPOSABLE = 0x1108,       ///< The matrix has no decomposition.
  M_ERR_NO_NORMAL = 0x1109,              ///< The matrix has no normal matrix.
  M_ERR_NO_PLANE_INTERSECTION = 0x110A,  ///< The ray does not meet the plane.
  M_ERR_ZERO_VECTOR = 0x110B,            ///< A zero vector has no direction.
  M_ERR_W_IS_ZERO = 0x110C,              ///< A homogeneous point lies at infinity.
};

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup life_cycle Life cycle
/// \par Example
/// \include life_cycle.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// What both birth words hold while the library is alive: the first digits of e.
inline constexpr uint32_t M_LIFE_MAGIC = 0x27182818;

/// The services a client may ask for at birth.
enum : uint32_t {
  M_SERVICE_TIMER = 1,  ///< Accepted; the timer does nothing.
  M_SERVICE_TRIG = 2,   ///< Quarter-wave sine table, see M_PrepareFTrig().
  M_SERVICE_FCMD = 4,   ///< Fast character multiply and divide tables, see M_PrepareFCMD().
  M_SERVICE_GAUSS = 8,  ///< Not available: asking for it makes M_Birth() fail.
};

/// All state of the library, 56 bytes on every machine. Clients only carry it from one copy of the
/// library to another.
struct M_Globals {
  uint32_t birthMagic;              ///< M_LIFE_MAGIC while alive.
  uint32_t services;                ///< Services whose set-up succeeded.
  uint64_t reserved1;               ///< Carried along, never used.
  U_Handle fcmTable;                ///< 256 x 256 bytes: multiply. Null before set-up.
  alignas(8) U_Handle fcdTable;     ///< 256 x 256 bytes: divide. Null before set-up.
  alignas(8) uint64_t reserved2;    ///< Carried along, never used.
  U_Handle trigTable;               ///< 256 floats: quarter sine. Null before set-up.
  alignas(8) uint32_t birthMagic2;  ///< M_LIFE_MAGIC while alive; alive means both.
  uint16_t fcmdPrepareCount;        ///< Outstanding M_PrepareFCMD(). Survives death and birth.
  uint16_t ftrigPrepareCount;       ///< Outstanding M_PrepareFTrig(). Survives death and birth.
};
static_assert(sizeof(M_Globals) == 56);
static_assert(offsetof(M_Globals, birthMagic) == 0 && offsetof(M_Globals, services) == 4);
static_assert(offsetof(M_Globals, reserved1) == 8 && offsetof(M_Globals, fcmTable) == 16);
static_assert(offsetof(M_Globals, fcdTable) == 24 && offsetof(M_Globals, reserved2) == 32);
static_assert(offsetof(M_Globals, trigTable) == 40 && offsetof(M_Globals, birthMagic2) == 48);
static_assert(offsetof(M_Globals, fcmdPrepareCount) == 52);
static_assert(offsetof(M_Globals, ftrigPrepareCount) == 54);

extern "C" {

/// Brings the library to life and sets up the services asked for (M_SERVICE_..., other bits are
/// ignored). `granted` may be null; it receives the services that were set up, also when birth
/// fails. After the first set-up that fails no later service is granted, though it is set up, the
/// library stays not alive, and all tables that were made, before and after, stay allocated.
/// Returns the first failing set-up's code, or what the host's report returns when the library is
/// already alive (then nothing changes).
int32_t M_Birth(uint32_t services, uint32_t* granted);

/// Frees the tables of the granted services; the library is no longer alive. Returns the last
/// set-down's code, or what the host's report returns when the library is not alive.
int32_t M_Death();

/// Hands the library's state over: copies the globals to `out` and leaves this copy of the library
/// not alive. When it is not alive, `out` is untouched and the host's report is returned.
int32_t M_GetGlobals(M_Globals* out);

/// Takes over a state that M_GetGlobals() handed out. Refused with a report while this copy is
/// alive. A record that is not alive is copied in and then reported. Returns 0, or what the host's
/// report returns.
int32_t M_SetGlobals(const M_Globals* in);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup fast_tables Fast tables
/// Every output may be null. `ready` receives 1 when the tables handed out are valid, else 0. With
/// an outstanding prepare the tables stay where they are; without one the host may reclaim their
/// memory, and the next prepare makes them anew unless `noRebuild`. Tables that cannot be had: with
/// `reportIfUnavailable` the failure is reported, M_ERR_MEMORY returned and the tables are null;
/// without it 0 is returned, ready 0 and the data pointers as they are, one of them null at least.
/// While another prepare is outstanding nothing is looked at: ready is 1 also where that one got no
/// tables, so the pointers are what to test. Each prepare that does not return
/// M_ERR_UNREQUESTED_SERVICE raises the count and owes one unprepare.
///
/// A rebuild for which there is no memory leaves no tables: the service is gone for this life, and
/// both prepare and unprepare report M_ERR_UNREQUESTED_SERVICE. The count that the failed prepare
/// has raised can then not be lowered and survives into the next life, in which a first prepare
/// finds one outstanding: should the host have reclaimed the memory, nothing is made anew, ready is
/// 1 and a table null.
/// \par Example
/// \include fast_tables.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Lends the quarter-wave sine table: 256 floats, entry i = sin(i / 255 * pi / 2).
int32_t M_PrepareFTrig(bool reportIfUnavailable, bool noRebuild, unsigned char* ready,
                       const float** table);

/// Gives the sine table back. The count is not checked: one too many wraps it to 65535. Without the
/// service or its table M_ERR_UNREQUESTED_SERVICE is reported and returned.
int32_t M_UnprepareFTrig();

/// Lends the 256 x 256 byte tables. mul[a * 256 + b] = a * b / 255, div[a * 256 + b] = 255 * b / a
/// for b < a and else 255, both rounded to nearest.
int32_t M_PrepareFCMD(bool reportIfUnavailable, bool noRebuild, unsigned char* ready,
                      const unsigned char** mulTable, const unsigned char** divTable);

/// Gives the character tables back, as M_UnprepareFTrig() does the sine table.
int32_t M_UnprepareFCMD();

}  // extern "C"

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup fixed_point Fixed point
/// \par Example
/// \include fixed_point.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Signed 16.16: value x 65536. 0x80000000 is both -32768 and the error result.
typedef int32_t M_Fixed;

/// Signed 8.24: value x 16777216. 0x80000000 is both -128 and the error result.
typedef int32_t M_Fix24;

extern "C" {

/// a x b. Exact where the operands have 17 trailing zero bits between them; otherwise each first
/// loses its low 8 bits (towards minus infinity), so 1.0 x 0x00000001 is 0. A product of the wrong
/// sign gives 0x80000000; one that wraps to the right sign is returned. Never reports.
M_Fixed M_FixMul(M_Fixed a, M_Fixed b);

/// a / b, truncated; large dividends drop low bits of the divisor, which makes one of -32768 huge
/// and the quotient 0. A zero divisor (also after the drop) or a quotient of the wrong sign gives
/// 0x80000000. Never reports.
M_Fixed M_FixDiv(M_Fixed a, M_Fixed b);

/// a x b, halves away from zero. A product >= 128 or <= -129 reports M_ERR_OVERFLOW and gives
/// 0x80000000; one between -129 and -128, or that is rounded to 128, gives 0x80000000 without a
/// report.
M_Fix24 M_Fix24Mul(M_Fix24 a, M_Fix24 b);

/// num / den of two integers in any common scale, rounded and bounded as M_Fix24Mul(). den 0
/// reports M_ERR_DIVIDE_BY_ZERO and gives 0x80000000.
M_Fix24 M_Fix24Ratio(int32_t num, int32_t den);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup bits_and_powers_of_two Bits and powers of two
/// \par Example
/// \include bits_and_powers_of_two.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Leading zero bits, 32 for 0.
int16_t M_LeadingZeros(uint32_t x);

/// Trailing zero bits, 32 for 0.
int16_t M_TrailingZeros(uint32_t x);

/// Smallest power of two >= x; 0 for 0, and 0 above 0x80000000, where the doubling wraps.
uint32_t M_RoundUpToPowerOf2(uint32_t x);

/// Largest power of two <= x; 0 for 0.
uint32_t M_RoundDownToPowerOf2(uint32_t x);

/// Bits needed to write x; 0 for x <= 0.
int16_t M_BitsUsed(int32_t x);

/// Whether bits 31 and 30 are the same, so that x as a signed value can be doubled.
bool M_IsTopTwoBitsSame(uint32_t x);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup overflow_predictions Overflow predictions
/// \par Example
/// \include overflow_predictions.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Whether a + b leaves 32 bits. Exact.
bool M_AddWouldOverflow(int32_t a, int32_t b);

/// Whether a x b may leave 32 bits, judged by bit lengths: never false for a product that does not
/// fit, at times true for one that does (0x10000 x 0x7FFF).
bool M_MulWouldOverflow(int32_t a, int32_t b);

/// As M_MulWouldOverflow() for unsigned values (true for 0x10000 x 0xFFFF).
bool M_UMulWouldOverflow(uint32_t a, uint32_t b);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup divisors_and_multiples Divisors and multiples
/// The greatest common divisor and the least common multiple. All return 0.
/// \par Example
/// \include divisors_and_multiples.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// *out = gcd(|a|, |b|), but 1 when b is 0 (and |b| when a is 0). Positive, except that 2^31, the
/// gcd of -2^31 with itself or with a zero a, has the bit pattern of -2^31.
int32_t M_SignedGCD(int32_t a, int32_t b, int32_t* out);

/// *out = gcd(a, b), but 1 when b is 0 (and b when a is 0).
int32_t M_UnsignedGCD(uint32_t a, uint32_t b, uint32_t* out);

/// *out = (a x b, wrapped to 32 bits) / gcd, with the sign of the wrapped product; 0 when b is 0.
int32_t M_SignedLCM(int32_t a, int32_t b, int32_t* out);

/// *out = (a x b, wrapped to 32 bits) / gcd; 0 when b is 0.
int32_t M_UnsignedLCM(uint32_t a, uint32_t b, uint32_t* out);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup rounding Rounding
/// \par Example
/// \include rounding.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// The multiple of m (m > 0, or the behaviour is undefined) nearest to x, halves away from zero.
int32_t M_RoundToNearestMult(int32_t x, int32_t m);

/// d rounded by adding or subtracting 0.5 in double precision, halves towards plus infinity. What
/// does not fit, a NaN included, gives 0x80000000.
int32_t M_RoundDouble(double d);

/// As M_RoundDouble(), but what lies beyond either end gives 0x7FFFFFFF or 0x80000000.
int32_t M_RoundDoubleSafe(double d);

/// As M_RoundDouble() to 64 bits; what does not fit gives 0x8000000000000000.
int64_t M_RoundDouble64(double d);

/// The platform's fmod: x - n y with n truncated towards zero.
double M_fmod(double x, double y);

}  // extern "C"

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup ratios Ratios
/// Exact where the result fits. The `status` of M_AddRatio(), M_SubRatio(), M_MulRatio() and
/// M_DivRatio():
///
/// | status | what it does |
/// |---|---|
/// | null | an overflow is reported and its code returned |
/// | a byte with 2 in it | where the exact result does not fit, it may be approximated |
/// | a byte with 1 in it | M_DivRatio() may halve a divisor whose den is 2^31 or more |
/// | the byte afterwards | 0 exact, 1 overflow (not reported, the result is 0), 2 approximated |
/// | all bits set | `(unsigned char*)-1`, never dereferenced: approximates and halves unasked, |
/// | | and reports only if even that fails |
///
/// After every failure out is 0/0. out may be an operand. A zero denominator is always reported,
/// its code returned and the status byte left at 0 (but M_DivRatio() first finds a divisor that is
/// too large, and a halving stays in the byte). A b.num of -2^31 is its own negative where b is
/// subtracted, compared, or a limit.
/// \par Example
/// \include ratios.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// num / den. The sign is num's; den is unsigned and must not be 0. Not kept in lowest terms: a
/// result is reduced only where that avoids an overflow.
struct M_Ratio {
  int32_t num;   ///< Carries the sign.
  uint32_t den;  ///< Unsigned; 0 is invalid.
};
static_assert(sizeof(M_Ratio) == 8);
static_assert(offsetof(M_Ratio, num) == 0 && offsetof(M_Ratio, den) == 4);

extern "C" {

/// *out = in, in lowest terms; out may be in. `reduced` receives whether the gcd was not 1. A gcd
/// of 2^31 or more is left in place (but `reduced` is 1), so 0/n gives 0/1 for n below 2^31 only.
/// Always 0.
int32_t M_ReduceRatio(const M_Ratio* in, M_Ratio* out, unsigned char* reduced);

/// *out = a + b, over the least common denominator (not reduced), exact where it fits. What else
/// `status` tells, and permits: \ref ratios. Reports and returns M_ERR_OVERFLOW without a status,
/// M_ERR_ZERO_DENOMINATOR always.
int32_t M_AddRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status);

/// *out = a - b, with the status and the errors of M_AddRatio().
int32_t M_SubRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status);

/// *out = a x b, reduced only where it would not fit otherwise, with the status and the errors of
/// M_AddRatio(). Whether it fits is predicted by bit
/// lengths: a product of 2^30 or more in magnitude may be called an overflow although it fits, and
/// is for each |a.num| >= 2^30 times 1/1. An approximation is found as by M_FpLong2Ratio(), in
/// single precision and held to 2^30, so it may be half of the value: 2000000000/1 times 1/1 gives
/// 2^30/1.
int32_t M_MulRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status);

/// *out = a / b by multiplying with b's reciprocal, with the predictions and approximations of
/// M_MulRatio(): 2000000000/1 by 1/1 overflows, too. A negative b makes the reciprocal's den its
/// bit pattern, 2^31 or more. A zero b is a zero denominator; a b without denominator gives 0, or
/// where it is negative perhaps an overflow. A b.den of 2^31 or more needs permission to be halved,
/// and then 2 is ORed into the status byte; without it the result is an overflow, and 1 is ORed
/// into what the status byte holds.
int32_t M_DivRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status);

/// *out = 1 / in; out may be in. `exact` receives 1, or 0 when in.den is 2^31 or more and nothing
/// cancels, in which case both fields were halved. (-2^31 over 2^31 is its own reciprocal,
/// exactly.) A zero ratio gives 0/0. Always 0, no report.
int32_t M_RecipRatio(const M_Ratio* in, M_Ratio* out, unsigned char* exact);

/// *order < 0, = 0 or > 0 for a < b, a = b, a > b; only the sign counts. Where a den is 2^31 or
/// more and the difference overflows, products are compared in double precision, in which close
/// ratios may be equal. A zero denominator gives order 0 and is reported.
int32_t M_CompareRatio(const M_Ratio* a, const M_Ratio* b, int32_t* order);

/// *out = the smaller; a when they are equal. A zero denominator is reported and gives 0/0.
int32_t M_MinRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out);

/// *out = the greater; a when they are equal. A zero denominator is reported and gives 0/0.
int32_t M_MaxRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out);

/// *out = the best ratio near x, in lowest terms, found in single precision with num and den up to
/// 2^30. |x| <= 2^-31 gives 0/1. |x| >= 2^31 or a NaN sets `outOfRange` and gives 0/0. Always 0.
int32_t M_FpLong2Ratio(M_Ratio* out, unsigned char* outOfRange, double x);

/// *out = in over the denominator newDen, the numerator rounded as M_RoundDouble() does; out may be
/// in. `exact` receives whether nothing was lost, as double precision sees it. A numerator that
/// leaves 32 bits gives 0/0 and sets `overflow`, or is reported where that is null. A zero
/// denominator is reported, gives 0/0 and leaves `exact` untouched.
int32_t M_ConvRatio(const M_Ratio* in, uint32_t newDen, M_Ratio* out, unsigned char* exact,
                    unsigned char* overflow);

/// *out = num * toDen / fromDen, as M_ConvRatio(); failures give 0.
int32_t M_ShortConvRatio(int32_t num, uint32_t fromDen, uint32_t toDen, int32_t* out,
                         unsigned char* overflow);

/// *out = value held to [lo, hi]; out may be any operand. lo > hi is reported and leaves out
/// untouched, as does a zero denominator in lo or hi; one in value gives 0/0. Returns 0, the code
/// of a zero denominator, or for lo > hi what the host's report returns.
int32_t M_ClipRatio(const M_Ratio* value, const M_Ratio* lo, const M_Ratio* hi, M_Ratio* out);

/// *out = value held to [start, start + duration]; out may be any operand. Any failure is reported
/// and gives 0/0. The end is only formed when value > start.
int32_t M_ClipRatioToSpan(const M_Ratio* value, const M_Ratio* start, const M_Ratio* duration,
                          M_Ratio* out);

/// Clips span a to span b, [ start, start + duration ). The start is held to b; the end is b's own
/// end whenever a reaches into b, even where a ends before it. Outputs may be operands. Any failure
/// is reported and sets both outputs to 0/0.
int32_t M_ClipSpanToSpan(const M_Ratio* startA, const M_Ratio* durationA, const M_Ratio* startB,
                         const M_Ratio* durationB, M_Ratio* outStart, M_Ratio* outDuration);

}  // extern "C"

/// \}

#pragma GCC visibility pop

#endif  // M_UTILS_H
