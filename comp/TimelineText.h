/// \file
/// Timelines as people and programs read them.
#ifndef COMP_TIMELINETEXT_H
#define COMP_TIMELINETEXT_H

#include <string>
#include <vector>

#include "Timeline.h"

namespace comp {

/// A table for each timeline. With dropped frames where its rate may have them.
std::string ToTable(const std::vector<Timeline>& timelines, bool mayDrop);

/// A line of comma-separated values for each item, after one of their names. Times are exact
/// seconds, and timecode.
std::string ToCsv(const std::vector<Timeline>& timelines, bool mayDrop);

/// {"timelines": [...]}
std::string ToJson(const std::vector<Timeline>& timelines, bool mayDrop);

}  // namespace comp

#endif  // COMP_TIMELINETEXT_H
