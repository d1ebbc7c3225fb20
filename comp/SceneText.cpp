#include "SceneText.h"

#include <nlohmann/json.hpp>
#include <numbers>

#include "Language.h"
#include "Text.h"
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
std::vector<std::string> ListText(const Points& points) {
  std::vector<std::string> texts;
  texts.reserve(points.size());
  for (const auto& point : points) texts.push_back(ToText(point));
  return texts;
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
  std::string text = Tr("Space, seen from {0} towards {1}, zoom {2}",
                        {ToText(camera.eye), ToText(camera.target), ToText(camera.zoom)}) +
                     "\n";
  for (const SpaceLayer& layer : scene.layers) {
    const M_Matrix4Decomp& d = layer.decomp;
    text += '\n';
    text += Tr("Layer \"{0}\", {1}", {Printable(layer.name), ToText(layer.size)}) +
            (layer.isDecomposable ? "" : Tr(", cannot be taken apart")) + "\n";
    text += Line(Tr("moved by"), {ToText(d.translate)});
    text += Line(Tr("scaled by"), {ToText(d.scale)});
    text += Line(Tr("sheared by"), {ToText({d.shear.xy, d.shear.xz, d.shear.yz})});
    text += Line(Tr("turned by"), {ToText(InDegrees(d.rotate)), Tr("about x, y, z")});
    text += Line("", {ToText(InDegrees(layer.anglesZYX)), Tr("in the other order")});
    text += Line(Tr("from the eye"), ListText(layer.corners));
    if (!layer.crossings.empty()) text += Line(Tr("cut at"), ListText(layer.crossings));
    for (const OrientationSample& sample : layer.samples) {
      text += Line(Tr("frame {0}", {ToText(sample.frame)}), {ToText(sample.angles)});
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
