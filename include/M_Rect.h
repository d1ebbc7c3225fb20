/// \file
/// M_Rect.h: points and rectangles in four widths, and what matrices make of them.
///
/// Widths: Pt and Rect are 16-bit, LPt and LRect 32-bit, FixedPt and FixedRect 16.16 (the long
/// operation on the same bits), FloatRect double. Each operation is listed in its short form.
///
/// Conventions: h and x run to the right, v and y downwards. A rectangle covers
/// `[ left, right ) x [ top, bottom )` and is empty when right <= left or bottom <= top; nothing
/// normalises it. Integers wrap in the width of their field. Setters take the horizontal value
/// first, whatever the layout. What is described as always 0 is a status; predicates return 1 or 0.
/// Pointers must not be null unless their comment says so. An output may be one of the inputs of
/// its type. Everything may be called from any thread.

// Contents
//   Points                  M_SetPt M_CopyPt M_EqualPt M_AddPt M_DeltaPoint
//   Rectangles              M_SetRect M_SetWHRect M_CopyRect M_CopyWHRect M_EqualRect
//                           M_EqualWHRect M_EmptyRect M_InsetRect M_OffsetRect M_CenterRect
//                           M_TopLeft M_BottomRight
//   Points and rectangles   M_PtInRect M_Pt2Rect M_PtToAngle
//   Intersection and union  M_SectRect M_UnionRect M_RectCompare
//   Conversion              M_FixedRect2Rect M_FixedRect2RectIn M_FixedRect2RectOut
//                           M_Rect2FixedRect M_LRect2Rect
//   Transformed points      M_TransformFloatPoints M_TransformPoints M_TransformFixPoints
//                           M_TransformVector3 M_TransformVector4NoDivide M_TransformVector4
//                           M_Transform3DFloatPoints M_3DTransform2DPoints
//   Transformed rectangles  M_TransformRect M_TransformFloatRect M_TransformFixRect
//                           M_TransformBounds

#ifndef M_RECT_H
#define M_RECT_H

#include <cstddef>
#include <cstdint>

#include "M_Utils.h"

#pragma GCC visibility push(default)

struct M_Matrix3;
struct M_Matrix4;
template <class T>
struct M_Vector2T;
template <class T>
struct M_Vector3T;
template <class T>
struct M_Vector4T;

// ---------------------------------------------------------------------------------------------
/// \defgroup records Records
/// The short ones have the vertical value first, the others the horizontal.
/// \par Example
/// \include records.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// A 16-bit point. May alias, because M_TopLeft() and M_BottomRight() show halves of an M_Rect as
/// one.
struct [[gnu::may_alias]] M_Point {
  int16_t v;  ///< Downwards.
  int16_t h;  ///< To the right.
};
static_assert(sizeof(M_Point) == 4 && offsetof(M_Point, v) == 0 && offsetof(M_Point, h) == 2);

/// A 32-bit point.
struct M_LPoint {
  int32_t h;  ///< To the right.
  int32_t v;  ///< Downwards.
};
static_assert(sizeof(M_LPoint) == 8 && offsetof(M_LPoint, h) == 0 && offsetof(M_LPoint, v) == 4);

/// A 16.16 point.
struct M_FixedPoint {
  M_Fixed h;  ///< To the right.
  M_Fixed v;  ///< Downwards.
};
static_assert(sizeof(M_FixedPoint) == 8);
static_assert(offsetof(M_FixedPoint, h) == 0 && offsetof(M_FixedPoint, v) == 4);

/// A 16-bit rectangle: its top left point, then its bottom right one.
struct M_Rect {
  int16_t top;     ///< The first row inside.
  int16_t left;    ///< The first column inside.
  int16_t bottom;  ///< The first row beyond.
  int16_t right;   ///< The first column beyond.
};
static_assert(sizeof(M_Rect) == 8 && offsetof(M_Rect, top) == 0 && offsetof(M_Rect, left) == 2);
static_assert(offsetof(M_Rect, bottom) == 4 && offsetof(M_Rect, right) == 6);

/// A 32-bit rectangle.
struct M_LRect {
  int32_t left;    ///< The first column inside.
  int32_t top;     ///< The first row inside.
  int32_t right;   ///< The first column beyond.
  int32_t bottom;  ///< The first row beyond.
};
static_assert(sizeof(M_LRect) == 16 && offsetof(M_LRect, left) == 0 && offsetof(M_LRect, top) == 4);
static_assert(offsetof(M_LRect, right) == 8 && offsetof(M_LRect, bottom) == 12);

/// A 16.16 rectangle.
struct M_FixedRect {
  M_Fixed left;    ///< The edge inside.
  M_Fixed top;     ///< The edge inside.
  M_Fixed right;   ///< The edge that is not.
  M_Fixed bottom;  ///< The edge that is not.
};
static_assert(sizeof(M_FixedRect) == 16);
static_assert(offsetof(M_FixedRect, left) == 0 && offsetof(M_FixedRect, top) == 4);
static_assert(offsetof(M_FixedRect, right) == 8 && offsetof(M_FixedRect, bottom) == 12);

/// A rectangle of doubles.
struct M_FloatRect {
  double left;    ///< The edge inside.
  double top;     ///< The edge inside.
  double right;   ///< The edge that is not.
  double bottom;  ///< The edge that is not.
};
static_assert(sizeof(M_FloatRect) == 32);
static_assert(offsetof(M_FloatRect, left) == 0 && offsetof(M_FloatRect, top) == 8);
static_assert(offsetof(M_FloatRect, right) == 16 && offsetof(M_FloatRect, bottom) == 24);

/// Four 16-bit values that clients agree on; the library sets, copies and compares them.
struct M_WHRect {
  int16_t values[4];  ///< In the order of M_SetWHRect().
};
static_assert(sizeof(M_WHRect) == 8);

/// What M_LRect2Rect() returns for a rectangle that does not fit. Not an error code, not reported.
enum : int32_t { M_RECT_OUT_OF_RANGE = 10 };

extern "C" {

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup points Points
/// \par Example
/// \include points.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// *pt = (h, v). Always 0.
int32_t M_SetPt(M_Point* pt, int16_t h, int16_t v);
/// \copydoc M_SetPt
int32_t M_SetLPt(M_LPoint* pt, int32_t h, int32_t v);
/// \copydoc M_SetPt
int32_t M_SetFixedPt(M_FixedPoint* pt, M_Fixed h, M_Fixed v);

/// *to = *from. Always 0.
int32_t M_CopyPt(const M_Point* from, M_Point* to);
/// \copydoc M_CopyPt
int32_t M_CopyLPt(const M_LPoint* from, M_LPoint* to);
/// \copydoc M_CopyPt
int32_t M_CopyFixedPt(const M_FixedPoint* from, M_FixedPoint* to);

/// Whether both coordinates are equal.
int32_t M_EqualPt(const M_Point* a, const M_Point* b);
/// \copydoc M_EqualPt
int32_t M_EqualLPt(const M_LPoint* a, const M_LPoint* b);
/// \copydoc M_EqualPt
int32_t M_EqualFixedPt(const M_FixedPoint* a, const M_FixedPoint* b);

/// *to += from. Always 0.
int32_t M_AddPt(M_Point from, M_Point* to);

/// ((a.v - b.v) << 16) | (a.h - b.h), in 32 bits. The horizontal difference is not cut to 16 bits:
/// a negative one sets all bits of the upper half.
int32_t M_DeltaPoint(const M_Point& a, const M_Point& b);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup rectangles Rectangles
/// \par Example
/// \include rectangles.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Stores the four edges. Always 0.
int32_t M_SetRect(M_Rect* r, int16_t left, int16_t top, int16_t right, int16_t bottom);
/// \copydoc M_SetRect
int32_t M_SetLRect(M_LRect* r, int32_t left, int32_t top, int32_t right, int32_t bottom);
/// \copydoc M_SetRect
int32_t M_SetFixedRect(M_FixedRect* r, M_Fixed left, M_Fixed top, M_Fixed right, M_Fixed bottom);

/// Stores the four values in the order given. Always 0.
int32_t M_SetWHRect(M_WHRect* r, int16_t first, int16_t second, int16_t third, int16_t fourth);

/// *to = *from. Always 0.
int32_t M_CopyRect(const M_Rect* from, M_Rect* to);
/// \copydoc M_CopyRect
int32_t M_CopyLRect(const M_LRect* from, M_LRect* to);
/// \copydoc M_CopyRect
int32_t M_CopyFixedRect(const M_FixedRect* from, M_FixedRect* to);
/// \copydoc M_CopyRect
int32_t M_CopyWHRect(const M_WHRect* from, M_WHRect* to);

/// Whether all edges are equal, or both rectangles are empty.
int32_t M_EqualRect(const M_Rect* a, const M_Rect* b);
/// \copydoc M_EqualRect
int32_t M_EqualLRect(const M_LRect* a, const M_LRect* b);
/// \copydoc M_EqualRect
int32_t M_EqualFixedRect(const M_FixedRect* a, const M_FixedRect* b);

/// Whether all four values are equal.
int32_t M_EqualWHRect(const M_WHRect* a, const M_WHRect* b);

/// Whether right <= left or bottom <= top.
int32_t M_EmptyRect(const M_Rect* r);
/// \copydoc M_EmptyRect
int32_t M_EmptyLRect(const M_LRect* r);
/// \copydoc M_EmptyRect
int32_t M_EmptyFixedRect(const M_FixedRect* r);

/// Moves each vertical edge inwards by dh and each horizontal one by dv; may turn r inside out.
/// Always 0.
int32_t M_InsetRect(M_Rect* r, int16_t dh, int16_t dv);
/// \copydoc M_InsetRect
int32_t M_InsetLRect(M_LRect* r, int32_t dh, int32_t dv);
/// \copydoc M_InsetRect
int32_t M_InsetFixedRect(M_FixedRect* r, M_Fixed dh, M_Fixed dv);

/// Moves r by dh to the right and dv downwards. Always 0.
int32_t M_OffsetRect(M_Rect* r, int16_t dh, int16_t dv);
/// \copydoc M_OffsetRect
int32_t M_OffsetLRect(M_LRect* r, int32_t dh, int32_t dv);
/// \copydoc M_OffsetRect
int32_t M_OffsetFixedRect(M_FixedRect* r, M_Fixed dh, M_Fixed dv);

/// Moves r, keeping its size, to the centre of the container. Half of the spare width is truncated
/// towards zero: an odd unit falls to the right and to the bottom. Always 0.
int32_t M_CenterRect(const M_Rect* container, M_Rect* r);
/// \copydoc M_CenterRect
int32_t M_CenterLRect(const M_LRect* container, M_LRect* r);
/// \copydoc M_CenterRect
int32_t M_CenterFixedRect(const M_FixedRect* container, M_FixedRect* r);

// No C program could call these two, and none is meant to.
#ifdef __clang__
#pragma clang diagnostic push
#pragma clang diagnostic ignored "-Wreturn-type-c-linkage"
#endif
/// The first half of r, in place: writing to the point writes to r.
M_Point& M_TopLeft(M_Rect& r);
/// The second half of r, in place: writing to the point writes to r.
M_Point& M_BottomRight(M_Rect& r);
#ifdef __clang__
#pragma clang diagnostic pop
#endif

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup points_and_rectangles Points and rectangles
/// \par Example
/// \include points_and_rectangles.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Whether left <= h < right and top <= v < bottom.
int32_t M_PtInRect(const M_Point* pt, const M_Rect* r);
/// \copydoc M_PtInRect
int32_t M_LPtInRect(const M_LPoint* pt, const M_LRect* r);
/// \copydoc M_PtInRect
int32_t M_FixedPtInRect(const M_FixedPoint* pt, const M_FixedRect* r);

/// The rectangle that two opposite corners span; the points may be halves of it. Always 0.
int32_t M_Pt2Rect(const M_Point* a, const M_Point* b, M_Rect* r);
/// \copydoc M_Pt2Rect
int32_t M_LPt2Rect(const M_LPoint* a, const M_LPoint* b, M_LRect* r);
/// \copydoc M_Pt2Rect
int32_t M_FixedPt2Rect(const M_FixedPoint* a, const M_FixedPoint* b, M_FixedRect* r);

/// *angle = the direction of pt from the centre of r in whole degrees, clockwise: 0 (just right of
/// straight up), 90 right, 180 down, 270 left, 360 straight up. The centre itself gives 90. It is
/// truncated, and 3.1416 stands for pi, so that a direction of exactly 135 degrees gives 134.
/// Always 0.
int32_t M_PtToAngle(const M_Rect* r, M_Point pt, int16_t* angle);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup intersection_union_comparison Intersection, union, comparison
/// \par Example
/// \include intersection_union_comparison.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Whether a and b overlap; touching edges do not. *out = the intersection, or all zeros. out may
/// be null. A NaN makes no M_FloatRect empty; the edge of b is taken where a's is NaN.
int32_t M_SectRect(const M_Rect* a, const M_Rect* b, M_Rect* out);
/// \copydoc M_SectRect
int32_t M_SectLRect(const M_LRect* a, const M_LRect* b, M_LRect* out);
/// \copydoc M_SectRect
int32_t M_SectFixedRect(const M_FixedRect* a, const M_FixedRect* b, M_FixedRect* out);
/// \copydoc M_SectRect
int32_t M_SectFloatRect(const M_FloatRect* a, const M_FloatRect* b, M_FloatRect* out);

/// *out = the smallest rectangle around both; of an empty and another one, the other; of two empty
/// ones a, but b when out is b. Always 0.
int32_t M_UnionRect(const M_Rect* a, const M_Rect* b, M_Rect* out);
/// \copydoc M_UnionRect
int32_t M_UnionLRect(const M_LRect* a, const M_LRect* b, M_LRect* out);
/// \copydoc M_UnionRect
int32_t M_UnionFixedRect(const M_FixedRect* a, const M_FixedRect* b, M_FixedRect* out);

/// Whether a and b are in the relation. 0 for every other relation. Widths and heights wrap.
///
/// | relation | a and b |
/// |---|---|
/// | 0 | all four edges are equal (M_RectCompare()); left and top are (the long and fixed forms) |
/// | 1 | a is wider and higher than b |
/// | 2 | a is at least as wide and as high |
/// | 3 | b is wider and higher than a |
/// | 4 | b is at least as wide and as high |
/// | 5 | a encloses b, with no edge in common |
/// | 6 | a encloses b |
/// | 7 | they overlap, as in M_SectRect() |
/// | 8 | they overlap or touch, emptiness ignored |
int32_t M_RectCompare(uint32_t relation, const M_Rect* a, const M_Rect* b);
/// \copydoc M_RectCompare
int32_t M_LRectCompare(uint32_t relation, const M_LRect* a, const M_LRect* b);
/// \copydoc M_RectCompare
int32_t M_FixedRectCompare(uint32_t relation, const M_FixedRect* a, const M_FixedRect* b);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup conversion Conversion
/// The short forms keep the low 16 bits, unchecked where nothing else is said.
/// \par Example
/// \include conversion.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Each edge rounded, halves towards plus infinity. Always 0.
int32_t M_FixedRect2Rect(const M_FixedRect* from, M_Rect* to);
/// \copydoc M_FixedRect2Rect
int32_t M_FixedRect2LRect(const M_FixedRect* from, M_LRect* to);

/// The largest whole rectangle inside: left and top up, right and bottom down. Always 0.
int32_t M_FixedRect2RectIn(const M_FixedRect* from, M_Rect* to);
/// \copydoc M_FixedRect2RectIn
int32_t M_FixedRect2LRectIn(const M_FixedRect* from, M_LRect* to);

/// The smallest whole rectangle around: left and top down, right and bottom up. Always 0.
int32_t M_FixedRect2RectOut(const M_FixedRect* from, M_Rect* to);
/// \copydoc M_FixedRect2RectOut
int32_t M_FixedRect2LRectOut(const M_FixedRect* from, M_LRect* to);

/// Each edge x 65536. Always 0.
int32_t M_Rect2FixedRect(const M_Rect* from, M_FixedRect* to);
/// \copydoc M_Rect2FixedRect
int32_t M_LRect2FixedRect(const M_LRect* from, M_FixedRect* to);

/// *to = from, or M_RECT_OUT_OF_RANGE with *to untouched when left or top lies below -32768 or
/// right or bottom above 32767. The other side of each edge is not checked but cut to 16 bits.
int32_t M_LRect2Rect(const M_LRect* from, M_Rect* to);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup transformed_points_and_vectors Transformed points and vectors
/// In place. Row vectors, translation in the last row. A count below 1 does nothing. The matrix
/// must not lie among the points.
///
/// The same bits come out whether points are given one by one or many at once, NaNs included, and
/// on every processor, where only the sign of a NaN may be another.
/// \par Example
/// \include transformed_points_and_vectors.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// (x, y) := (m00 x + m10 y + m20, m01 x + m11 y + m21). The third column is not used. Always 0.
int32_t M_TransformFloatPoints(const M_Matrix3* m, int32_t count, M_Vector2T<double>* points);

/// As M_TransformFloatPoints(), with h for x and v for y, rounded as M_RoundDouble() does. A result
/// >= 32767 or <= -32768 is reported as M_ERR_OVERFLOW: points before it are transformed, those
/// behind it untouched, and where v is at fault h is already written. A NaN gives 0.
int32_t M_TransformPoints(const M_Matrix3* m, int32_t count, M_Point* points);

/// As M_TransformPoints() for 16.16 points, with the translation in whole units. Results >=
/// 2147483647 or <= -2147483648, as raw fixed values, are out of range. A NaN gives 0x80000000.
int32_t M_TransformFixPoints(const M_Matrix3* m, int32_t count, M_FixedPoint* points);

/// (x, y, z) := (x, y, z) x m. Always 0.
int32_t M_TransformVector3(const M_Matrix3* m, int32_t count, M_Vector3T<double>* vectors);

/// (x, y, z, w) := (x, y, z, w) x m. Always 0.
int32_t M_TransformVector4NoDivide(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors);

/// As M_TransformVector4NoDivide(), then multiplied by 1 / w, with w set to 1; where w lies within
/// 1e-12 of 0, nothing is divided and w is kept. Always 0.
int32_t M_TransformVector4(const M_Matrix4* m, int32_t count, M_Vector4T<double>* vectors);

/// As M_TransformVector4() for (x, y, z, 1), of which w is not kept. Always 0.
int32_t M_Transform3DFloatPoints(const M_Matrix4* m, int32_t count, M_Vector3T<double>* points);

/// As M_Transform3DFloatPoints() for (h, v, 0); z is not kept. h and v are held to -32767 and 32766
/// and truncated towards zero. A NaN gives 0. Always 0.
int32_t M_3DTransform2DPoints(const M_Matrix4* m, int32_t count, M_Point* points);

/// \}

// ---------------------------------------------------------------------------------------------
/// \defgroup transformed_rectangles Transformed rectangles
/// The bounding box of the transformed corners.
///
/// `corners` may be null; it receives the transformed corners left top, right top, right bottom,
/// left bottom. `isBoundingBox` may be null; it receives 1 when m rotates, skews or projects
/// (M_GetMatrixType() 4 or 5), so that the corners need not be those of the result, else 0.
/// \par Example
/// \include transformed_rectangles.cpp
/// \{
// ---------------------------------------------------------------------------------------------

/// Edges are held to -32767 and 32766, then rounded as M_RoundDouble() does. Always 0.
int32_t M_TransformRect(const M_Matrix3* m, M_Rect* r, M_Vector2T<double>* corners,
                        unsigned char* isBoundingBox);

/// Nothing is rounded. Always 0.
int32_t M_TransformFloatRect(const M_Matrix3* m, M_FloatRect* r, M_Vector2T<double>* corners,
                             unsigned char* isBoundingBox);

/// The corners go through M_TransformFixPoints(); if that fails its code is returned, r and
/// isBoundingBox are untouched, and `corners` holds what was done so far.
int32_t M_TransformFixRect(const M_Matrix3* m, M_FixedRect* r, M_FixedPoint* corners,
                           unsigned char* isBoundingBox);

/// The bounding box in whole units, rounded outwards; edges are held to 32 bits on their own side
/// (left and top below, right and bottom above). An empty r gives {0, 0, 0, 0}.
M_LRect M_TransformBounds(const M_Matrix3& m, const M_LRect& r);

}  // extern "C"

/// \}

#pragma GCC visibility pop

#endif  // M_RECT_H
