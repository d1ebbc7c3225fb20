#!/bin/sh
# Whether gdb shows records as they are written, with the script that is installed for it.
# Usage: gdb.sh SOURCE_FOLDER LIBRARY_FOLDER COMPILER
set -eu
command -v gdb >/dev/null || { echo 'gdb is not there'; exit 77; }
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cat >"$work/program.cpp" <<'END'
#include "M_Matrix.h"
int main() {
  const M_Ratio ratio = {1001, 30000}, broken = {1, 0};
  const M_Fixed fixed = -0x18000, large = 0x30392B85;
  const M_WHRect pair = {{1, 2, 3, 4}};
  const M_Fix24 fraction = 0x800000;
  const M_Point point = {2, 1};
  const M_FixedPoint fixedPoint = {0x8000, 0x10000};
  const M_Rect rect = {2, 1, 4, 3};
  const M_FloatRect floatRect = {0.5, 0, 1e300, 3};
  const M_Vector3T<double> vector = {1, 0.1, -2};
  const M_Matrix3 matrix = {{{1, 0, 0}, {0, 1, 0}, {5, 6.5, 1}}};
  const M_Vector2T<double> points[2] = {{1, 2}, {3, 4}};
  return M_SetIdentityMatrix(const_cast<M_Matrix3*>(&matrix));
}
END
"$3" -g -O0 -std=c++17 -I "$1/include" -I "$1/host/include" "$work/program.cpp" -o "$work/program" \
  -L"$2" -Wl,-rpath,"$2" -lM -lMHost
gdb -nx -batch -ex 'set width 0' -ex "source $1/src/pkg/M/linux/libM-gdb.py" -ex 'break M_SetIdentityMatrix' -ex run -ex up \
  -ex 'info locals' -ex 'print points' "$work/program" >"$work/log" 2>&1
sed -n '/^ratio = /,$p' "$work/log" | sort >"$work/shown"
sort >"$work/expected" <<'END'
$1 = {(1, 2), (3, 4)}
broken = 1/0
fixed = -1.5
fixedPoint = (0.5, 1)
floatRect = (0.5, 0) to (1e+300, 3)
fraction = 0.5
large = 12345.169998168945
matrix = [1, 0, 0; 0, 1, 0; 5, 6.5, 1]
pair = (1, 2, 3, 4)
point = (1, 2)
points = {(1, 2), (3, 4)}
ratio = 1001/30000 = 0.0333666667
rect = (1, 2) to (3, 4)
vector = (1, 0.1, -2)
END
diff "$work/expected" "$work/shown" || { cat "$work/log"; exit 1; }
