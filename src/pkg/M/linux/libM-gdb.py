"""Shows M's records in gdb as one would write them. gdb loads this with an installed libM by itself."""

import gdb
import gdb.printing

FIXED_TYPES = {"M_Fixed": 16, "M_Fix24": 24}


def text(value):
    """A number: a fixed one as its value, and doubles as short as they can be."""
    kind = value.type
    bits = FIXED_TYPES.get(kind.name)
    if bits:
        return repr(int(value) / (1 << bits)).removesuffix(".0")
    if kind.strip_typedefs().code == gdb.TYPE_CODE_FLT:
        return repr(float(value)).removesuffix(".0")
    return str(int(value))


def fields(record, names):
    return "(%s)" % ", ".join(text(record[name]) for name in names)


def ratio(r):
    num, den = int(r["num"]), int(r["den"])
    return "%d/%u" % (num, den) + (" = %.9g" % (num / den) if den else "")


def point(p):
    return fields(p, ("h", "v"))


def rectangle(r):
    return "%s to %s" % (fields(r, ("left", "top")), fields(r, ("right", "bottom")))


def values(r):
    return "(%s)" % ", ".join(text(r["values"][i]) for i in range(4))


def vector(v):
    return fields(v, [field.name for field in v.type.strip_typedefs().fields()])


def matrix(m):
    rows = m["m"]
    size = rows.type.range()[1] + 1
    return "[%s]" % "; ".join(", ".join(text(rows[i][j]) for j in range(size)) for i in range(size))


class Printer:
    """Shows a value as what a function makes of it."""

    def __init__(self, function, value):
        self.function = function
        self.value = value

    def to_string(self):
        return self.function(self.value)


RECORDS = {
    "M_Ratio": ratio,
    "M_Point": point,
    "M_LPoint": point,
    "M_FixedPoint": point,
    "M_Rect": rectangle,
    "M_LRect": rectangle,
    "M_FixedRect": rectangle,
    "M_FloatRect": rectangle,
    "M_WHRect": values,
    "M_Matrix3": matrix,
    "M_Matrix4": matrix,
    "M_PlaneEq": vector,
    "M_Shear": vector,
}


class Lookup(gdb.printing.PrettyPrinter):
    def __init__(self):
        super().__init__("M")

    def __call__(self, value):
        if value.type.name in FIXED_TYPES:
            return Printer(text, value)
        name = value.type.strip_typedefs().name or ""
        if name.startswith(("M_Vector2T<", "M_Vector3T<", "M_Vector4T<")):
            return Printer(vector, value)
        function = RECORDS.get(name)
        return Printer(function, value) if function else None


gdb.printing.register_pretty_printer(gdb.current_objfile(), Lookup(), replace=True)
