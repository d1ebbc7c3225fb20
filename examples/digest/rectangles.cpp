// Points and rectangles.

#include "Area.h"

namespace digest {

void RunRectangles(Area& area) {
  area.Call<M_SetPt>();
  area.Call<M_SetLPt>();
  area.Call<M_SetFixedPt>();
  area.Call<M_CopyPt>();
  area.Call<M_CopyLPt>();
  area.Call<M_CopyFixedPt>();
  area.Call<M_EqualPt>();
  area.Call<M_EqualLPt>();
  area.Call<M_EqualFixedPt>();
  area.Call<M_AddPt>();
  area.Call<M_DeltaPoint>();
  area.Call<M_SetRect>();
  area.Call<M_SetLRect>();
  area.Call<M_SetFixedRect>();
  area.Call<M_SetWHRect>();
  area.Call<M_CopyRect>();
  area.Call<M_CopyLRect>();
  area.Call<M_CopyFixedRect>();
  area.Call<M_CopyWHRect>();
  area.Call<M_EqualRect>();
  area.Call<M_EqualLRect>();
  area.Call<M_EqualFixedRect>();
  area.Call<M_EqualWHRect>();
  area.Call<M_EmptyRect>();
  area.Call<M_EmptyLRect>();
  area.Call<M_EmptyFixedRect>();
  area.Call<M_InsetRect>();
  area.Call<M_InsetLRect>();
  area.Call<M_InsetFixedRect>();
  area.Call<M_OffsetRect>();
  area.Call<M_OffsetLRect>();
  area.Call<M_OffsetFixedRect>();
  area.Call<M_CenterRect>();
  area.Call<M_CenterLRect>();
  area.Call<M_CenterFixedRect>();
  area.Call(
      "M_TopLeft", +[](M_Rect r) { return M_TopLeft(r); });
  area.Call(
      "M_BottomRight", +[](M_Rect r) { return M_BottomRight(r); });
  area.Call<M_PtInRect>();
  area.Call<M_LPtInRect>();
  area.Call<M_FixedPtInRect>();
  area.Call<M_Pt2Rect>();
  area.Call<M_LPt2Rect>();
  area.Call<M_FixedPt2Rect>();
  area.Call<M_SectRect>(0b100);
  area.Call<M_SectLRect>(0b100);
  area.Call<M_SectFixedRect>(0b100);
  area.Call<M_SectFloatRect>(0b100);
  area.Call<M_UnionRect>();
  area.Call<M_UnionLRect>();
  area.Call<M_UnionFixedRect>();
  // There are ten relations.
  area.Call(
      "M_RectCompare", +[](uint32_t relation, const M_Rect* a, const M_Rect* b) {
        return M_RectCompare(relation % 12, a, b);
      });
  area.Call(
      "M_LRectCompare", +[](uint32_t relation, const M_LRect* a, const M_LRect* b) {
        return M_LRectCompare(relation % 12, a, b);
      });
  area.Call(
      "M_FixedRectCompare", +[](uint32_t relation, const M_FixedRect* a, const M_FixedRect* b) {
        return M_FixedRectCompare(relation % 12, a, b);
      });
  area.Call<M_FixedRect2Rect>();
  area.Call<M_FixedRect2LRect>();
  area.Call<M_FixedRect2RectIn>();
  area.Call<M_FixedRect2LRectIn>();
  area.Call<M_FixedRect2RectOut>();
  area.Call<M_FixedRect2LRectOut>();
  area.Call<M_Rect2FixedRect>();
  area.Call<M_LRect2FixedRect>();
  area.Call<M_LRect2Rect>();
  area.Call<M_TransformRect>(0b1100);
  area.Call<M_TransformFloatRect>(0b1100);
  area.Call<M_TransformFixRect>(0b1100);
  area.Call<M_TransformBounds>();
}

}  // namespace digest
