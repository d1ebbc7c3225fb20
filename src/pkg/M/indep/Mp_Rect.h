/// \file
/// What the areas that deal in rectangles share.
#ifndef MP_RECT_H
#define MP_RECT_H

namespace Mp {

template <class Rect>
constexpr bool IsEmpty(const Rect& r) {
  return r.right <= r.left || r.bottom <= r.top;
}

}  // namespace Mp

#endif  // MP_RECT_H
