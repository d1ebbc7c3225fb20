"""The math library of a compositing application: exact time, rectangles, matrices, geometry.

Time is exact. A ``Ratio`` is a fraction of 32 bits, as the library keeps it; frames are found
without rounding:

>>> from m_math import *
>>> sum([Ratio(1001, 30000)] * 3, Ratio(0))
Ratio(3003, 30000)
>>> frame_at('3600', '30000/1001')
107892

Points are rows of NumPy arrays, and are changed in place:

>>> import numpy
>>> points = numpy.array([[0.0, 0.0], [4.0, 0.0], [1.0, 1.0], [0.0, 4.0]])
>>> transform(points, Matrix3().scale(2, 2).translate(1, 0))
>>> points[1].tolist()
[9.0, 0.0]
>>> convex_hull(points).tolist()
[[1.0, 0.0], [9.0, 0.0], [1.0, 8.0]]

Results are those of the C library, to the bit, on every machine. Errors are exceptions of the
natural type, all of them also ``Error``, which has the library's code and place:

>>> try:
...     Ratio(2**31 - 1) * 2
... except OverflowError as error:
...     print(error)
overflow in ratio multiply.

An array of another shape or dtype, one that is not contiguous or, if it is to be changed, not
writeable, is refused: nothing is copied behind one's back.
"""

import numbers as _numbers

from ._core import (
    FixedPoint,
    FixedRect,
    FloatPoint,
    FloatRect,
    LPoint,
    LRect,
    Matrix3,
    Matrix4,
    Point,
    Ratio,
    Rect,
    TransformPoly2D,
    TransformPoly3D,
    clip_polygon,
    convex_hull,
    frame_at,
    points_in_polygon,
    polygon_area,
    slerp,
    snap_to_frame,
    time_of_frame,
    transform,
)
from ._errors import DivisionError, Error, NoMemoryError, OperandError, RangeError
from ._types import Decomposition

_numbers.Rational.register(Ratio)

__all__ = [
    "Decomposition",
    "DivisionError",
    "Error",
    "FixedPoint",
    "FixedRect",
    "FloatPoint",
    "FloatRect",
    "LPoint",
    "LRect",
    "Matrix3",
    "Matrix4",
    "NoMemoryError",
    "OperandError",
    "Point",
    "RangeError",
    "Ratio",
    "Rect",
    "TransformPoly2D",
    "TransformPoly3D",
    "clip_polygon",
    "convex_hull",
    "frame_at",
    "points_in_polygon",
    "polygon_area",
    "slerp",
    "snap_to_frame",
    "time_of_frame",
    "transform",
]

for _name in set(__all__) - {"Ratio"}:
    globals()[_name].__module__ = __name__
