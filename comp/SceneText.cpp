#include "SceneText.h"

#include <nlohmann/json.hpp>
#include <numbers>

#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

constexpr double kDegreesPerRadian = 180 / std::numbers::pi;

M_Vector3T<double> InDegrees(const M_Vector3T<double>& radians) {
  return {radians.x * kDegreesPerRadian, radians.y * kDegreesPerRadian,
          radians.z * kDegreesPerRadian};
}

template <class Points>
std::string ListText(const Points& points) {
  std::string text;
  for (const auto& point : points) text.append(text.empty() ? "" : " ").append(ToText(point));
  return text;
}

Json VectorJson(const M_Vector3T<double>& v) { return {v.x, v.y, v.z}; }

template <class Points>
Json ListJson(const Points& points) {
  Json json = Json::array();
  for (const auto& point : points) json.push_back(VectorJson(point));
  return json;
}

}  // namespace

std::string ToTable(const Scene& scene) {
  const Camera& camera = scene.camera;
  std::string text = "Space, seen from " + ToText(camera.eye) + " towards " +
                     ToText(camera.target) + ", zoom " + ToText(camera.zoom) + "\n";
  for (const SpaceLayer& layer : scene.layers) {
    const M_Matrix4Decomp& d = layer.decomp;
    text += "\nLayer \"" + Printable(layer.name) + "\", " + ToText(layer.size) +
            (layer.isDecomposable ? "" : ", cannot be taken apart") + "\n";
    text += Line("moved by", ToText(d.translate));
    text += Line("scaled by", ToText(d.scale));
    text += Line("sheared by", ToText({d.shear.xy, d.shear.xz, d.shear.yz}));
    text += Line("turned by", ToText(InDegrees(d.rotate)).append(" about x, y, z"));
    text += Line("", ToText(InDegrees(layer.anglesZYX)).append(" in the other order"));
    text += Line("from the eye", ListText(layer.corners));
    if (!layer.crossings.empty()) text += Line("cut at", ListText(layer.crossings));
    for (const OrientationSample& sample : layer.samples) {
      text += Line("frame " + ToText(sample.frame), ToText(sample.angles));
    }
  }
  return text;
}

nlohmann::ordered_json ToJson(const Scene& scene) {
  const Camera& camera = scene.camera;
  Json json = {{"camera",
                {{"eye", VectorJson(camera.eye)},
                 {"target", VectorJson(camera.target)},
                 {"up", VectorJson(camera.up)},
                 {"zoom", camera.zoom}}},
               {"layers", Json::array()}};
  for (const SpaceLayer& layer : scene.layers) {
    const M_Matrix4Decomp& d = layer.decomp;
    Json samples = Json::array();
    for (const OrientationSample& sample : layer.samples) {
      samples.push_back({{"frame", sample.frame},
                         {"quaternion", sample.quaternion},
                         {"angles", VectorJson(sample.angles)}});
    }
    json["layers"].push_back({{"name", layer.name},
                              {"size", {layer.size.width, layer.size.height}},
                              {"isDecomposable", layer.isDecomposable},
                              {"translate", VectorJson(d.translate)},
                              {"scale", VectorJson(d.scale)},
                              {"shear", {d.shear.xy, d.shear.xz, d.shear.yz}},
                              {"angles", VectorJson(InDegrees(d.rotate))},
                              {"anglesZYX", VectorJson(InDegrees(layer.anglesZYX))},
                              {"cornersFromEye", ListJson(layer.corners)},
                              {"crossings", ListJson(layer.crossings)},
                              {"samples", samples}});
  }
  return json;
}

}  // namespace comp
