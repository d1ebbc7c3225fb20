/// \file
/// Where the layers of a composition lie in its frame.
#ifndef COMP_LAYOUT_H
#define COMP_LAYOUT_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Matrix.h"
#include "Reports.h"

namespace comp {

/// What a layer has in common with one that lies below it.
struct Overlap {
  std::string name;
  M_LRect rect;
};

struct PlacedLayer {
  std::string name;
  Size size;
  uint32_t matrixType;  ///< As M_GetMatrixType tells it.
  bool isInvertible;    ///< Whether a point of the frame is a point of the layer.
  std::array<M_Vector2T<double>, 4> corners;  ///< Left top, right top, right bottom, left bottom.
  M_LRect bounds;                             ///< All pixels that the layer touches.
  M_LRect inFrame;
  std::vector<Overlap> overlaps;  ///< With those below it, from the top down, if asked for.
};

struct Layout {
  Size frame;
  std::vector<PlacedLayer> layers;  ///< From the top down.
  M_LRect all;                      ///< Encloses every layer.
};

/// From a layer to the frame.
M_Matrix3 MatrixOf(const Placement& placement);

/// Where a layer's corners lie in the frame: left top, right top, right bottom, left bottom.
std::array<M_Vector2T<double>, 4> CornersOf(const Placement& placement);

/// Nothing for a composition without a size.
std::optional<Layout> MakeLayout(const Composition& composition, bool withOverlaps,
                                 ReportCollector& collector);

}  // namespace comp

#endif  // COMP_LAYOUT_H
