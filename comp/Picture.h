/// \file
/// A composition as a viewer would show it, drawn as SVG, and what lies under a point of it.
#ifndef COMP_PICTURE_H
#define COMP_PICTURE_H

#include <optional>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Matrix.h"
#include "Reports.h"
#include "Stage.h"

namespace comp {

struct PictureOptions {
  std::optional<double> frame;              ///< The first frame, with every layer, if left out.
  std::optional<M_Vector2T<double>> point;  ///< The point that is asked for.
  double tolerance = 0;                     ///< Pixels.
  int grid = 0;                             ///< So many points a side, drawn with what they hit.
};

struct Picture {
  std::string svg;
  std::vector<Hit> hits;        ///< From front to back.
  std::vector<Report> reports;  ///< What the library reported on the way.
};

/// The picture of a composition with a size.
Picture Draw(const Composition& composition, const PictureOptions& options);

}  // namespace comp

#endif  // COMP_PICTURE_H
