#include "Area.h"

#include "U.h"

namespace digest {
namespace {

// The area that runs in this thread.
thread_local Area* current = nullptr;

void TakeReport(void* /*context*/, const U_Report* report) {
  if (current) current->AddReport(report->id, report->severity, report->text);
}

}  // namespace

void Area::AddReport(uint32_t id, int32_t severity, const char* text) {
  Add(id);
  Add(severity);
  for (; *text != 0; ++text) Add(static_cast<int32_t>(*text));
  hasReported_ = true;
}

void Area::Begin(const std::string& name) {
  uint64_t seed = 0xCBF29CE484222325;  // FNV-1a
  for (const char c : name) seed = (seed ^ static_cast<unsigned char>(c)) * 0x100000001B3;
  operands_ = Operands(seed);
  digests_.emplace_back(name, 0x6D);
}

void Area::AddLastError() { Add(Up_GetThreadLastError()); }

const AreaEntry kAreas[] = {
    {RunTables, false, false},   {RunIntegers, false, true},   {RunFixed, false, true},
    {RunRatios, false, true},    {RunRectangles, false, true}, {RunMatrices, false, true},
    {RunMembers, false, true},   {RunBatches, false, true},    {RunLines, false, true},
    {RunPolygons, false, true},  {RunHulls, false, true},      {RunScreen, false, true},
    {RunSineTable, true, false}, {RunRotations, true, true},   {RunBearings, true, true},
};
const size_t kAreaCount = sizeof kAreas / sizeof kAreas[0];

Digests DigestsOf(const AreaEntry& entry) {
  U_SetReportCallback(TakeReport, nullptr);
  Area area;
  current = &area;
  entry.run(area);
  current = nullptr;
  return area.Values();
}

}  // namespace digest
