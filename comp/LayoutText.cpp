#include "LayoutText.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

const char* Name(uint32_t matrixType) {
  switch (matrixType) {
    case M_MATRIX_IDENTITY:
      return "identity";
    case M_MATRIX_TRANSLATE:
      return "translation";
    case M_MATRIX_SCALE:
      return "scale";
    case M_MATRIX_SCALE_TRANSLATE:
      return "scale and translation";
    case M_MATRIX_AFFINE:
      return "rotation or skew";
    default:
      return "perspective";
  }
}

std::string ToText(const M_LRect& r) {
  if (M_EmptyLRect(&r)) return "nothing";
  char text[64];
  std::snprintf(text, sizeof text, "%d,%d to %d,%d", r.left, r.top, r.right, r.bottom);
  return text;
}

Json ToJson(const M_LRect& r) { return {r.left, r.top, r.right, r.bottom}; }
Json ToJson(const Size& size) { return {size.width, size.height}; }

}  // namespace

std::string ToTable(const Layout& layout) {
  std::string text = "Frame " + ToText(layout.frame) + ", layers from the top down\n";
  for (const PlacedLayer& layer : layout.layers) {
    text += "\nLayer \"" + Printable(layer.name) + "\", " + ToText(layer.size) + ", placed by " +
            Name(layer.matrixType) + (layer.isInvertible ? "\n" : ", which cannot be undone\n");
    std::string corners;
    for (const auto& corner : layer.corners) {
      corners.append(corners.empty() ? "" : " ").append(comp::ToText({corner.x, corner.y}));
    }
    text += Line("corners", corners);
    text += Line("pixels", ToText(layer.bounds));
    text += Line("in frame", ToText(layer.inFrame));
    for (const Overlap& overlap : layer.overlaps) {
      text += Line("over \"" + Printable(overlap.name) + "\"", ToText(overlap.rect));
    }
  }
  return text + "\nAll layers: " + ToText(layout.all) + "\n";
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
