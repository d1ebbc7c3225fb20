/// \file
/// A composition as its file describes it.
#ifndef COMP_COMPOSITION_H
#define COMP_COMPOSITION_H

#include <array>
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "M_Matrix.h"
#include "M_Utils.h"

namespace comp {

/// A file that cannot be used. The text is a sentence that names the file, the layer and the field.
class InputError : public std::runtime_error {
 public:
  explicit InputError(const std::string& sentence, size_t lineOfFile = 0, size_t columnOfFile = 0)
      : std::runtime_error(sentence), line(lineOfFile), column(columnOfFile) {}

  size_t line, column;  ///< Of the file, from 1; 0 where they are not known.
};

/// A ratio of the file. Decimals are approximated; `given` is then the decimal, else empty.
struct GivenRatio {
  M_Ratio ratio;
  std::string given;
};

/// Whole pixels.
struct Size {
  int32_t width;
  int32_t height;
};

/// How a layer is placed in the frame. Pixels, to the right and downwards.
struct Placement {
  Size size;
  M_Vector2T<double> anchor;    ///< In the layer: the point that is placed.
  M_Vector2T<double> position;  ///< In the frame: where it is placed.
  M_Vector2T<double> scale;
  double rotation;  ///< Degrees, clockwise.
};

/// How something is turned in space. Degrees.
struct Orientation {
  enum class Kind {
    kAngles,      ///< About x, then about y and z as they have been turned by then.
    kAxis,        ///< An axis and an angle.
    kQuaternion,  ///< x, y, z, w.
  };
  Kind kind;
  std::array<double, 4> values;
};

struct OrientationKey {
  int32_t frame;
  Orientation orientation;
};

/// How a layer is placed in space. Pixels, to the right, downwards and away from the viewer.
struct SpacePlacement {
  Size size;
  M_Vector3T<double> anchor;
  M_Vector3T<double> position;
  M_Vector3T<double> scale;
  Orientation orientation;
  std::vector<OrientationKey> keys;  ///< By frame; instead of the orientation, if there are any.
};

struct Camera {
  M_Vector3T<double> eye;
  M_Vector3T<double> target;
  M_Vector3T<double> up;
  double zoom;  ///< How far from the eye a pixel is a pixel.
};

struct Layer {
  std::string name;
  bool hasSourceRate;                   ///< The time base is the frames of a source rate.
  GivenRatio timeBase;                  ///< Seconds a unit, or with a source rate units a second.
  int32_t in;                           ///< First unit.
  int32_t out;                          ///< The unit behind the last.
  GivenRatio stretch;                   ///< Seconds on screen a second of the source.
  std::optional<Placement> placement;   ///< In the frame, or
  std::optional<SpacePlacement> space;  ///< in space, or neither for what is not seen.
};

struct Composition {
  std::string name;
  GivenRatio frameRate;  ///< Frames a second.
  int32_t start;         ///< First frame.
  int32_t duration;      ///< Frames.
  std::optional<Size> size;
  std::optional<Camera> camera;  ///< Where there is a size.
  std::vector<Layer> layers;
};

/// The composition of a file (JSON). Throws InputError.
Composition ReadComposition(const std::string& text, const std::string& fileName);

}  // namespace comp

#endif  // COMP_COMPOSITION_H
