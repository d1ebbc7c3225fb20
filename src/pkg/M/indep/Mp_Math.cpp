// The fast lookup tables: made at birth, lent out by prepare, made anew when the host has reclaimed
// their memory.

#include <cmath>
#include <cstddef>
#include <numbers>

#include "M_Utils.h"
#include "Mp_Err.h"
#include "Mp_Life.h"
#include "Mp_Out.h"
#include "U.h"

namespace {

constexpr size_t kTrigEntries = 256;
constexpr size_t kTrigBytes = kTrigEntries * sizeof(float);
constexpr unsigned kChars = 256;
constexpr size_t kCharTableBytes = size_t{kChars} * kChars;

// A host that is short of memory may reclaim a block as soon as it has given it, or to give the
// next one. Only what is there is filled; the rest is for the next prepare. Returns whether all is
// there.
bool FillTrig() {
  float* const table = static_cast<float*>(*Mp_G.trigTable);
  for (size_t i = 0; table && i < kTrigEntries; ++i) {
    const double angle = (static_cast<double>(i) / 255.0) * (std::numbers::pi / 2);
    table[i] = static_cast<float>(std::sin(angle));
  }
  return table;
}

bool FillCharTables() {
  auto* const multiply = static_cast<unsigned char*>(*Mp_G.fcmTable);
  auto* const divide = static_cast<unsigned char*>(*Mp_G.fcdTable);
  for (unsigned a = 0; a < kChars; ++a) {
    for (unsigned b = 0; b < kChars; ++b) {
      const unsigned at = a * kChars + b;
      if (multiply) multiply[at] = static_cast<unsigned char>((a * b + 127) / 255);
      if (divide) divide[at] = static_cast<unsigned char>(b < a ? (255 * b + a / 2) / a : 255);
    }
  }
  return multiply && divide;
}

void Free(U_Handle* handle) {
  if (*handle) U_FreeHandle(*handle);
  *handle = nullptr;
}

void FreeCharTables() {
  Free(&Mp_G.fcmTable);
  Free(&Mp_G.fcdTable);
}

bool RebuildTrig() {
  Free(&Mp_G.trigTable);
  Mp_G.trigTable = U_AllocateHandleQuiet(kTrigBytes);
  return Mp_G.trigTable && FillTrig();
}

bool RebuildCharTables() {
  FreeCharTables();
  Mp_G.fcmTable = U_AllocateHandleQuiet(kCharTableBytes);
  Mp_G.fcdTable = U_AllocateHandleQuiet(kCharTableBytes);
  if (!Mp_G.fcmTable || !Mp_G.fcdTable) {
    FreeCharTables();
    return false;
  }
  return FillCharTables();
}

bool HasTrig() { return (Mp_G.services & M_SERVICE_TRIG) && Mp_G.trigTable; }

bool HasCharTables() { return (Mp_G.services & M_SERVICE_FCMD) && Mp_G.fcmTable && Mp_G.fcdTable; }

// The data a handle lends; a rebuild that failed has left no handle.
template <class T>
const T* Data(U_Handle handle) {
  return handle ? static_cast<const T*>(*handle) : nullptr;
}

// What a prepare does once the service is known to be there: raises the count, rebuilds what was
// reclaimed. Returns whether the tables are there.
bool Prepare(uint16_t* count, bool reclaimed, bool noRebuild, bool (*rebuild)()) {
  // While somebody holds the tables they are handed out as they are.
  const bool ready = *count != 0 || !reclaimed || (!noRebuild && rebuild());
  ++*count;
  return ready;
}

}  // namespace

extern "C" {

int32_t Mp_SetupTrig() {
  // Kept on purpose: the trig table, too, is allocated under the name of the character tables.
  Mp_G.trigTable = U_AllocateHandle(Mp_ID_TRIG_TABLE, Mp::Text(Mp_STR_FCMD_TABLE), kTrigBytes);
  if (!Mp_G.trigTable) return M_ERR_MEMORY;
  FillTrig();
  return 0;
}

int32_t Mp_SetdownTrig() {
  Free(&Mp_G.trigTable);
  return 0;
}

int32_t Mp_SetupFCM() {
  const char* const name = Mp::Text(Mp_STR_FCMD_TABLE);
  Mp_G.fcmTable = U_AllocateHandle(Mp_ID_FCMD_TABLES, name, kCharTableBytes);
  if (!Mp_G.fcmTable) return M_ERR_MEMORY;
  Mp_G.fcdTable = U_AllocateHandle(Mp_ID_FCMD_TABLES, name, kCharTableBytes);
  if (!Mp_G.fcdTable) {
    Free(&Mp_G.fcmTable);
    return M_ERR_MEMORY;
  }
  FillCharTables();
  return 0;
}

int32_t Mp_SetdownFCM() {
  FreeCharTables();
  return 0;
}

int32_t Mp_SetupGauss() {
  return Up_ReportVarkErrString(Mp_ID_SETUP_GAUSS, Mp_SEVERITY_ERROR, Mp_HOST_NOT_AVAILABLE,
                                Mp::Text(Mp_STR_GAUSSIAN_TABLE_INITIALIZATION));
}

int32_t Mp_SetdownGauss() {
  return Up_ReportVarkErrString(Mp_ID_SETDOWN_GAUSS, Mp_SEVERITY_ERROR, Mp_HOST_NOT_AVAILABLE,
                                Mp::Text(Mp_STR_GAUSSIAN_TABLE_INITIALIZATION));
}

int32_t M_PrepareFTrig(bool reportIfUnavailable, bool noRebuild, unsigned char* ready,
                       const float** table) {
  Mp::Store(table, nullptr);
  Mp::Store(ready, 0);
  if (!HasTrig()) {
    return Mp_ReportErr(Mp_PLACE_FTRIG, M_ERR_UNREQUESTED_SERVICE, Mp_STR_IN_FAST_TRIG);
  }
  const bool reclaimed = !*Mp_G.trigTable;
  const bool there = Prepare(&Mp_G.ftrigPrepareCount, reclaimed, noRebuild, RebuildTrig);
  if (!there && reportIfUnavailable) {
    Up_ReportErrString(Mp_ID_FTRIG_UNAVAILABLE, Mp_SEVERITY_ERROR,
                       Mp::Text(Mp_STR_FTRIG_UNAVAILABLE));
    return M_ERR_MEMORY;
  }
  Mp::Store(table, Data<float>(Mp_G.trigTable));
  Mp::Store(ready, there);
  return 0;
}

int32_t M_UnprepareFTrig() {
  if (!HasTrig()) {
    return Mp_ReportErr(Mp_PLACE_FTRIG, M_ERR_UNREQUESTED_SERVICE, Mp_STR_IN_FAST_TRIG);
  }
  --Mp_G.ftrigPrepareCount;
  return 0;
}

int32_t M_PrepareFCMD(bool reportIfUnavailable, bool noRebuild, unsigned char* ready,
                      const unsigned char** mulTable, const unsigned char** divTable) {
  Mp::Store(mulTable, nullptr);
  Mp::Store(divTable, nullptr);
  Mp::Store(ready, 0);
  if (!HasCharTables()) {
    return Mp_ReportErr(Mp_PLACE_PREPARE_FCMD, M_ERR_UNREQUESTED_SERVICE, Mp_STR_IN_FAST_CHAR_MATH);
  }
  const bool reclaimed = !*Mp_G.fcmTable || !*Mp_G.fcdTable;
  const bool there = Prepare(&Mp_G.fcmdPrepareCount, reclaimed, noRebuild, RebuildCharTables);
  if (!there && reportIfUnavailable) {
    Up_ReportErrString(Mp_ID_FCMD_UNAVAILABLE, Mp_SEVERITY_ERROR,
                       Mp::Text(Mp_STR_FCMD_UNAVAILABLE));
    return M_ERR_MEMORY;
  }
  Mp::Store(mulTable, Data<unsigned char>(Mp_G.fcmTable));
  Mp::Store(divTable, Data<unsigned char>(Mp_G.fcdTable));
  Mp::Store(ready, there);
  return 0;
}

int32_t M_UnprepareFCMD() {
  if (!HasCharTables()) {
    return Mp_ReportErr(Mp_PLACE_UNPREPARE_FCMD, M_ERR_UNREQUESTED_SERVICE,
                        Mp_STR_IN_FAST_CHAR_MATH);
  }
  --Mp_G.fcmdPrepareCount;
  return 0;
}

}  // extern "C"
