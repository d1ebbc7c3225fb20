"""What the library reports, as exceptions of the natural types."""


class Error(Exception):
    """A failure that the library has reported.

    ``code`` is the library's error code, ``place`` the number of the place that reported it (0 if
    nothing was reported), and the text that of the report, in the language of the process.
    """

    def __init__(self, text: str, code: int, place: int) -> None:
        super().__init__(text)
        self.code = code
        self.place = place

    def __reduce__(self) -> tuple:
        return type(self), (self.args[0], self.code, self.place)


class RangeError(Error, OverflowError):
    """A result does not fit."""


class DivisionError(Error, ZeroDivisionError):
    """A denominator, or a divisor, is zero."""


class OperandError(Error, ValueError):
    """The operation has no result for these operands."""


class NoMemoryError(Error, MemoryError):
    """There was no memory."""
