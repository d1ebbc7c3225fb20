#include "Layout.h"

#include <algorithm>
#include <numeric>
#include <set>
#include <utility>

namespace comp {
namespace {

M_LRect ToRect(const Size& size) { return {0, 0, size.width, size.height}; }

PlacedLayer Place(const Layer& layer, const Size& frame) {
  PlacedLayer placed = {};
  placed.name = layer.name;
  placed.size = layer.placement->size;
  const M_Matrix3 m = MatrixOf(*layer.placement);
  M_GetMatrixType(&m, &placed.matrixType);
  // Asked in space: the inversion in the plane takes a last pivot of 0 for no failure.
  M_Matrix4 inverse;
  M_Matrix3ToMatrix4(&m, &inverse);
  placed.isInvertible = M_InverseMatrix4(&inverse, &inverse) == 0;
  const M_LRect own = ToRect(placed.size);
  placed.corners = CornersOf(*layer.placement);
  placed.bounds = M_TransformBounds(m, own);
  const M_LRect whole = ToRect(frame);
  M_SectLRect(&placed.bounds, &whole, &placed.inFrame);
  return placed;
}

// By a sweep from left to right, with those that are open by their top: few others are compared.
void FindOverlaps(std::vector<PlacedLayer>* layers) {
  std::vector<size_t> order(layers->size());
  std::iota(order.begin(), order.end(), 0);
  const auto bounds = [&](size_t i) -> const M_LRect& { return (*layers)[i].bounds; };
  std::stable_sort(order.begin(), order.end(),
                   [&](size_t i, size_t j) { return bounds(i).left < bounds(j).left; });
  std::set<std::pair<int64_t, size_t>> byTop, byRight;
  int64_t tallest = 0;
  std::vector<std::vector<size_t>> below(layers->size());
  for (const size_t i : order) {
    const M_LRect& own = bounds(i);
    while (!byRight.empty() && byRight.begin()->first <= own.left) {
      const size_t gone = byRight.begin()->second;
      byRight.erase(byRight.begin());
      byTop.erase({bounds(gone).top, gone});
    }
    const auto end = byTop.lower_bound({own.bottom, 0});
    for (auto other = byTop.lower_bound({own.top - tallest, 0}); other != end; ++other) {
      const size_t j = other->second;
      if (M_LRectCompare(7, &own, &bounds(j))) below[std::min(i, j)].push_back(std::max(i, j));
    }
    byTop.insert({own.top, i});
    byRight.insert({own.right, i});
    tallest = std::max(tallest, int64_t{own.bottom} - own.top);
  }
  for (size_t i = 0; i < layers->size(); ++i) {
    std::sort(below[i].begin(), below[i].end());
    for (const size_t other : below[i]) {
      M_LRect common;
      M_SectLRect(&bounds(i), &bounds(other), &common);
      (*layers)[i].overlaps.push_back({(*layers)[other].name, common});
    }
  }
}

}  // namespace

M_Matrix3 MatrixOf(const Placement& placement) {
  // The anchor comes to lie at the position; about it the layer is scaled, then rotated.
  M_Matrix3 m;
  M_SetIdentityMatrix(&m);
  M_TranslateMatrix(&m, -placement.anchor.x, -placement.anchor.y);
  M_ScaleMatrix(&m, placement.scale.x, placement.scale.y, 0, 0);
  M_RotateMatrix(&m, placement.rotation, 0, 0);
  M_TranslateMatrix(&m, placement.position.x, placement.position.y);
  return m;
}

std::array<M_Vector2T<double>, 4> CornersOf(const Placement& placement) {
  const M_Matrix3 m = MatrixOf(placement);
  std::array<M_Vector2T<double>, 4> corners;
  M_FloatRect rect = {0, 0, static_cast<double>(placement.size.width),
                      static_cast<double>(placement.size.height)};
  M_TransformFloatRect(&m, &rect, corners.data(), nullptr);
  return corners;
}

std::optional<Layout> MakeLayout(const Composition& composition, bool withOverlaps,
                                 ReportCollector& collector) {
  if (!composition.size) return {};
  Layout layout = {*composition.size, {}, {}};
  for (const Layer& layer : composition.layers) {
    if (!layer.placement) continue;
    collector.SetLayer(layer.name);
    layout.layers.push_back(Place(layer, layout.frame));
  }
  if (withOverlaps) FindOverlaps(&layout.layers);
  for (const PlacedLayer& layer : layout.layers) {
    M_UnionLRect(&layout.all, &layer.bounds, &layout.all);
  }
  return layout;
}

}  // namespace comp
