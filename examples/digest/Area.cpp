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

void Area::AddLastError() { Add(Up_GetThreadLastError()); }

const AreaEntry kAreas[] = {
    {"tables", RunTables, false, false},
    {"integers", RunIntegers, false, true},
    {"fixed point", RunFixed, false, true},
    {"ratios", RunRatios, false, true},
    {"rectangles", RunRectangles, false, true},
    {"matrices", RunMatrices, false, true},
    {"members", RunMembers, false, true},
    {"batches", RunBatches, false, true},
    {"lines and planes", RunLines, false, true},
    {"polygons", RunPolygons, false, true},
    {"hulls", RunHulls, false, true},
    {"screen", RunScreen, false, true},
    {"sine table (libm)", RunSineTable, true, false},
    {"rotations (libm)", RunRotations, true, true},
    {"bearings (libm)", RunBearings, true, true},
};
const size_t kAreaCount = sizeof kAreas / sizeof kAreas[0];

uint64_t DigestOf(const AreaEntry& entry) {
  U_SetReportCallback(TakeReport, nullptr);
  Area area(static_cast<uint64_t>(&entry - kAreas));
  current = &area;
  entry.run(area);
  current = nullptr;
  return area.Value();
}

}  // namespace digest
