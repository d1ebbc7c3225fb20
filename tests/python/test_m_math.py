"""The package m_math against Python's own numbers and NumPy."""

import copy
import doctest
import math
import pickle
import threading
from fractions import Fraction

import m_math
import numpy as np
import pytest
from hypothesis import given
from hypothesis import strategies as st
from hypothesis.extra import numpy as arrays
from m_math import Matrix3, Matrix4, Ratio

wholes = st.one_of(st.integers(-(2**31), 2**31 - 1), st.integers(-9, 9))
dens = st.one_of(st.integers(1, 2**32 - 1), st.integers(1, 9))
ratios = st.builds(Ratio, wholes, dens)
numbers = st.floats(-1e3, 1e3)


def matrices(size):
    return arrays.arrays(float, (size, size), elements=st.floats(-10, 10))


def points(*columns, dtype=float, elements=numbers):
    shape = st.tuples(st.integers(0, 40), st.sampled_from(columns))
    return arrays.arrays(dtype, shape, elements=elements)


def outcome(calculate):
    """A value as a Fraction, or the type of what is raised."""
    try:
        value = Fraction(calculate())
    except ArithmeticError as error:
        return ZeroDivisionError if isinstance(error, ZeroDivisionError) else OverflowError
    fits = -(2**31) <= value.numerator < 2**31 and value.denominator < 2**32
    return value if fits else OverflowError


@given(ratios, st.one_of(ratios, wholes, st.builds(Fraction, wholes, dens)))
def test_ratios_are_fractions(a, b):
    x, y = Fraction(a), Fraction(b)
    assert x == a.as_fraction() == a and Ratio(x) == a and eval(repr(a)) == a and Ratio(str(a)) == a
    assert hash(a) == hash(x) and float(a) == a.num / a.den and int(a) == int(x)
    assert (math.floor(a), math.ceil(a), bool(a)) == (math.floor(x), math.ceil(x), bool(x))
    assert outcome(lambda: a + b) == outcome(lambda: x + y)
    assert outcome(lambda: b - a) == outcome(lambda: y - x)
    assert outcome(lambda: a * b) == outcome(lambda: x * y)
    assert outcome(lambda: b / a) == outcome(lambda: y / x)
    assert outcome(lambda: -a) == outcome(lambda: -x) and outcome(lambda: abs(a)) == outcome(lambda: abs(x))
    assert (a < b, a <= b, a == b, b > a, b >= a, b != a) == (x < y, x <= y, x == y, y > x, y >= x, y != x)
    assert (a < 0.5, a == float(a)) == (x < 0.5, x == float(a)) and a < 2**99
    for same in (pickle.loads(pickle.dumps(a)), copy.deepcopy(a), a.reduced()):
        assert same == a


@given(ratios, ratios, st.integers(-(2**40), 2**40))
def test_frames(time, rate, frame):
    exact = Fraction(time) * Fraction(rate)
    assert m_math.frame_at(time, rate) == math.floor(exact)
    assert m_math.frame_at(time, rate, "ceiling") == math.ceil(exact)
    assert m_math.frame_at(time, rate, "nearest") == math.floor(exact + Fraction(1, 2))
    assert outcome(lambda: m_math.time_of_frame(frame, rate)) == outcome(lambda: frame / Fraction(rate))


@given(st.floats(-1e9, 1e9))
def test_approximations_say_whether_they_are_exact(x):
    ratio, is_exact = Ratio.approximate(x)
    assert is_exact == (Fraction(ratio) == Fraction(x)) and math.isclose(ratio, x, rel_tol=1e-6, abs_tol=1e-9)


@given(points(2, 3), matrices(3), matrices(3), points(3, 4), matrices(4))
def test_arrays_go_through_matrices(flat, a, b, space, c):
    m = Matrix3(a) @ Matrix3(b)
    assert np.allclose(m, a @ b) and np.shares_memory(np.asarray(m), np.asarray(m)) and eval(repr(m)) == m
    given_rows, size = flat.copy(), flat.shape[1]
    m_math.transform(flat, Matrix3(a))
    expected = given_rows @ a[:size, :size] + (a[2, :2] if size == 2 else 0)
    assert np.allclose(flat, expected)
    is_three = space.shape[1] == 3  # Points, which are divided.
    image = (np.c_[space, np.ones(len(space))] if is_three else space) @ c
    if is_three:
        w = np.where(np.abs(image[:, 3:]) < 1e-12, 1, image[:, 3:])
        image = image[:, :3] / w
    m_math.transform(space, Matrix4(c))
    sound = (np.abs(image) < 1e6).all(axis=1)
    assert np.allclose(space[sound], image[sound], rtol=1e-6, atol=1e-6)


@given(points(2, dtype=np.int16, elements=st.integers(-99, 99)), st.sampled_from([np.int16, np.int32]))
def test_whole_points_are_rounded(given_points, dtype):
    rows = given_points.astype(dtype)
    m_math.transform(rows, Matrix3([[0, 2, 0], [-3, 0, 0], [7, 5, 1]]))
    unit = 1 if dtype == np.int16 else 65536
    assert (rows == given_points.astype(int) @ [[0, 2], [-3, 0]] + np.array([7, 5]) * unit).all()


@given(points(2), st.sampled_from([float, np.float32]))
def test_hulls_and_polygons(some, dtype):
    some = np.round(some).astype(dtype)
    hull = m_math.convex_hull(some)
    assert hull.dtype == dtype and len(hull) <= len(some)
    if len(hull) > 2 and m_math.polygon_area(hull.astype(float)) > 1:
        assert m_math.points_in_polygon(some, hull, 0.5).all()
        assert len(m_math.clip_polygon(hull.astype(float), hull.astype(float) * 3 - hull.mean(0) * 2)) >= 3


def test_matrices_come_apart_and_together():
    m = Matrix4().rotate((1, 2, 3), 0.7).translate(4, 5, 6)
    parts = m.decompose()
    again = Matrix4().rotate_xyz(*parts.rotate).translate(*parts.translate)
    assert np.allclose(again, m) and np.allclose(parts.scale, 1) and m.decompose("zyx") != parts
    assert np.allclose(Matrix4.from_quaternion(m.quaternion()).translate(4, 5, 6), m)
    assert m_math.slerp((0, 0, 0, 1), (0, 0, 1, 0), 0.5)[2] == pytest.approx(math.sqrt(0.5))
    assert np.allclose(m @ m.inverse(), np.eye(4)) and Matrix3().scale(2, 2).kind == "scale"
    target = np.array([[4.0, 6, 15]])
    look = Matrix4.look_at((1, 2, 3), target[0], (0, 1, 0))
    m_math.transform(target, Matrix4().translate(-1, -2, -3) @ look.transposed())
    assert np.allclose(target, [0, 0, 13]) and not np.asarray(look).flags.writeable
    quad = m_math.TransformPoly3D(np.array([[-1.0, -1, 0], [1, -1, 0], [1, 1, 0], [-1, 1, 0]]))
    quad.to_eye(Matrix4().translate(0, 0, 5))
    quad.to_screen(Matrix4([[9, 0, 0, 0], [0, 9, 0, 0], [0, 0, 1, 1], [0, 0, 0, 0]]))
    assert quad.is_visible and len(quad.outline) == 4 and quad.is_point_inside((0, 0)) and quad.corner(0)
    assert quad.minimum_edge_distance((0.0, 0.0)) == pytest.approx(1.8)


def test_rectangles():
    r = m_math.Rect(0, 0, 4, 4)
    assert r & m_math.Rect(2, 2, 9, 9) == eval(repr(m_math.Rect(2, 2, 4, 4)), vars(m_math))
    assert list(r | m_math.Rect(5, 5, 6, 6)) == [0, 0, 6, 6] and m_math.Point(4, 0) not in r
    assert r.to_fixed().to_lrect("out") == r.to_lrect() and m_math.LRect(3, 3, 3, 9).is_empty
    with pytest.raises(OverflowError):
        m_math.LRect(0, 0, 40000, 1).to_rect()


@pytest.mark.parametrize(
    "call, error, text",
    [
        (lambda: Ratio(1, 0), ZeroDivisionError, "zero denominator in ratio multiply."),
        (lambda: Ratio(2**31), OverflowError, "overflow in ratio multiply."),
        (lambda: Ratio("1/2/3"), ValueError, "no ratio of 32 bits: '1/2/3'"),
        (lambda: Ratio(0.5), TypeError, "a Ratio, int, Fraction or str is needed"),
        (lambda: Ratio(1) + 0.5, TypeError, "unsupported operand"),
        (lambda: Ratio(1).num.__class__ and setattr(Ratio(1), "num", 2), AttributeError, "not writable"),
        (lambda: Matrix3(np.zeros((3, 3))).inverse(), ValueError, "unable to invert matrix."),
        (lambda: Matrix4(np.zeros((4, 3))), ValueError, "rows of 4 numbers are needed"),
        (lambda: m_math.transform(np.zeros((3, 2), "f"), Matrix3()), TypeError, "dtype float64, not float32"),
        (lambda: m_math.transform(np.zeros((3, 5)), Matrix3()), ValueError, "of the shape"),
        (lambda: m_math.transform(np.zeros((3, 4))[:, ::2], Matrix3()), ValueError, "contiguous"),
        (lambda: m_math.transform(np.broadcast_to(0.0, (3, 2)), Matrix3()), ValueError, "contiguous"),
        (lambda: m_math.transform(np.frombuffer(b"\0" * 32).reshape(2, 2), Matrix3()), ValueError, "writeable"),
        (lambda: m_math.transform(np.array([[32767, 0]], np.int16), Matrix3()), OverflowError, "point transformation"),
        (lambda: m_math.frame_at(1, 24, "up"), ValueError, "rounding must be"),
    ],
)
def test_what_is_wrong_is_said(call, error, text):
    with pytest.raises(error, match=text.replace("(", r"\(")) as raised:
        call()
    if isinstance(raised.value, m_math.Error):
        assert raised.value.code > 0 and raised.value.place > 0


def test_threads_have_arrays_and_errors_of_their_own():
    failures = []

    def work(angle):
        rows, expected = np.ones((20000, 2)), np.ones((20000, 2))
        for _ in range(20):
            m_math.transform(rows, Matrix3().rotate(angle))
        m_math.transform(expected, Matrix3().rotate(angle * 20))
        failures.append(not np.allclose(rows, expected))

    threads = [threading.Thread(target=work, args=(i,)) for i in range(4)]
    [thread.start() for thread in threads]
    [thread.join() for thread in threads]
    assert failures == [False] * 4


def test_examples_in_the_manual():
    names = [getattr(m_math, name) for name in m_math.__all__]
    things = [m_math, *names, *(getattr(c, k) for c in names if isinstance(c, type) for k in dir(c))]
    runner = doctest.DocTestRunner()
    for text in {thing.__doc__ for thing in things if ">>>" in (getattr(thing, "__doc__", "") or "")}:
        runner.run(doctest.DocTestParser().get_doctest(text, dict(vars(m_math)), "doc", None, 0))
    assert runner.summarize().attempted >= 20 and runner.failures == 0
