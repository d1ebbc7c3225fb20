#include "LayoutText.h"

#include <nlohmann/json.hpp>

#include "Language.h"
#include "Text.h"
#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

const char* Name(uint32_t matrixType) {
  switch (matrixType) {
    case M_MATRIX_IDENTITY:
      return Later("identity");
    case M_MATRIX_TRANSLATE:
      return Later("translation");
    case M_MATRIX_SCALE:
      return Later("scale");
    case M_MATRIX_SCALE_TRANSLATE:
      return Later("scale and translation");
    case M_MATRIX_AFFINE:
      return Later("rotation or skew");
    default:
      return Later("perspective");
  }
}

std::string ToText(const M_LRect& r) {
  if (M_EmptyLRect(&r)) return Tr("nothing");
  const auto point = [](int32_t x, int32_t y) {
    return std::to_string(x).append(",").append(std::to_string(y));
  };
  return Tr("{0} to {1}", {point(r.left, r.top), point(r.right, r.bottom)});
}

Json ToJson(const M_LRect& r) { return {r.left, r.top, r.right, r.bottom}; }
Json ToJson(const Size& size) { return {size.width, size.height}; }

}  // namespace

std::string ToTable(const Layout& layout) {
  std::string text = Tr("Frame {0}, layers from the top down", {ToText(layout.frame)}) + "\n";
  for (const PlacedLayer& layer : layout.layers) {
    text += '\n';
    text += Tr("Layer \"{0}\", {1}, placed by {2}",
               {Printable(layer.name), ToText(layer.size), Tr(Name(layer.matrixType))});
    text.append(layer.isInvertible ? "" : Tr(", which cannot be undone")).append("\n");
    std::vector<std::string> corners;
    for (const auto& corner : layer.corners) corners.push_back(comp::ToText({corner.x, corner.y}));
    text += Line(Tr("corners"), corners);
    text += Line(Tr("pixels"), {ToText(layer.bounds)});
    text += Line(Tr("in frame"), {ToText(layer.inFrame)});
    for (const Overlap& overlap : layer.overlaps) {
      text += Line(Tr("over \"{0}\"", {Printable(overlap.name)}), {ToText(overlap.rect)});
    }
  }
  return text.append("\n").append(Tr("All layers: {0}", {ToText(layout.all)})).append("\n");
}

nlohmann::ordered_json ToJson(const Layout& layout) {
  Json json = {
      {"frame", ToJson(layout.frame)}, {"layers", Json::array()}, {"all", ToJson(layout.all)}};
  for (const PlacedLayer& layer : layout.layers) {
    Json corners = Json::array();
    for (const auto& corner : layer.corners) corners.push_back({corner.x, corner.y});
    Json overlaps = Json::array();
    for (const Overlap& overlap : layer.overlaps) {
      overlaps.push_back({{"name", overlap.name}, {"rect", ToJson(overlap.rect)}});
    }
    json["layers"].push_back({{"name", layer.name},
                              {"size", ToJson(layer.size)},
                              {"matrix", Name(layer.matrixType)},
                              {"isInvertible", layer.isInvertible},
                              {"corners", corners},
                              {"bounds", ToJson(layer.bounds)},
                              {"inFrame", ToJson(layer.inFrame)},
                              {"overlaps", overlaps}});
  }
  return json;
}

}  // namespace comp
