"""Records that functions give."""

from typing import NamedTuple, Tuple

Triple = Tuple[float, float, float]


class Decomposition(NamedTuple):
    """What a matrix is made of: scaled, sheared, turned and moved, in this order."""

    translate: Triple
    scale: Triple
    shear: Triple  #: xy, xz, yz
    rotate: Triple  #: About x, y and z, in radians.
