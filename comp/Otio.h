/// \file
/// Timelines of OpenTimelineIO (.otio, JSON).
#ifndef COMP_OTIO_H
#define COMP_OTIO_H

#include <string>
#include <vector>

#include "Timeline.h"

namespace comp {

/// Whether a text looks like a file of OpenTimelineIO.
bool IsOtio(const std::string& text);

/// Reads a file of OpenTimelineIO: its timeline, or each of its collection's. Throws InputError.
std::vector<Timeline> ReadOtio(const std::string& text, const std::string& fileName);

}  // namespace comp

#endif  // COMP_OTIO_H
