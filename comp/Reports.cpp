#include "Reports.h"

#include "U.h"

namespace comp {

ReportCollector::ReportCollector() {
  U_SetReportCallback(
      [](void* context, const U_Report* report) {
        auto* const collector = static_cast<ReportCollector*>(context);
        collector->reports_.push_back(
            {collector->layer_, report->id, report->severity, report->text});
      },
      this);
}

ReportCollector::~ReportCollector() { U_SetReportCallback(nullptr, nullptr); }

}  // namespace comp
