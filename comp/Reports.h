/// \file
/// What the library reports while a sheet is made.
#ifndef COMP_REPORTS_H
#define COMP_REPORTS_H

#include <cstdint>
#include <string>
#include <vector>

namespace comp {

struct Report {
  std::string layer;  ///< The layer that was worked on; empty for the composition.
  uint32_t id;
  int32_t severity;
  std::string text;  ///< In the language of the environment.
};

/// Receives the library's reports for as long as it lives; then they go to standard error again.
class ReportCollector {
 public:
  ReportCollector();
  ~ReportCollector();
  ReportCollector(const ReportCollector&) = delete;
  ReportCollector& operator=(const ReportCollector&) = delete;

  /// Names the layer that the following reports are about.
  void SetLayer(const std::string& layer) { layer_ = layer; }

  const std::vector<Report>& Reports() const { return reports_; }

 private:
  std::string layer_;
  std::vector<Report> reports_;
};

}  // namespace comp

#endif  // COMP_REPORTS_H
