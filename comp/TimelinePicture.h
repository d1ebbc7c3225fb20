/// \file
/// A timeline drawn: tracks as lanes, clips as bars.
#ifndef COMP_TIMELINEPICTURE_H
#define COMP_TIMELINEPICTURE_H

#include <string>

#include "Timeline.h"

namespace comp {

/// An SVG. Timecode drops frames where the rate may and that is asked for.
std::string Draw(const Timeline& timeline, bool mayDrop);

}  // namespace comp

#endif  // COMP_TIMELINEPICTURE_H
