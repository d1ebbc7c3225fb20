#!/bin/sh
# Compares the names that libM exports, with their version nodes, with those that its headers declare.
# Usage: exports.sh LIBRARY SOURCE_FOLDER
set -eu
library=$1
source=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# The functions and objects that headers declare at the beginning of a line, in C.
declared() {
  sed -nE -e '/EqualMatrixWithinEpsilon|GetMatrix3DeterminantPlus|TransformPoint3DtoScreen/d' \
    -e '/IsFloatPointInConcavePoly|GetMinimumEdgeDistance|IsConvex|ComputeConvexHull/d' \
    -e 's/^[A-Za-z_][A-Za-z0-9_ *&]*[ *&](Mp?_[A-Za-z0-9_]+)\(.*/\1/p' \
    -e 's/^extern [A-Za-z0-9_ ]*[ *](Mp?_[A-Za-z0-9_]+)(\[[0-9]+\])?;.*/\1/p' "$@"
}

# Members and overloads, which the linker's script lists one by one, as they are written in C++.
declared_cxx() {
  sed -nE 's/^ +"(.+)";$/\1/p' "$source"/src/pkg/M/linux/M.map
}

{
  declared "$source"/include/*.h | sed 's/$/@@M_1/'
  declared "$source"/src/pkg/M/indep/Mp_*.h | sed 's/$/@@M_PRIVATE/'
  declared_cxx | sed 's/$/@@M_1/'
} | sort >"$work/declared"
# Instances of templates over iterators, whose names are the standard library's: how many of each.
declared_templates() {
  printf '%s\n' '6 bool M_IsConvex' '8 void M_ComputeConvexHull'
}

nm -DC --defined-only --with-symbol-versions "$library" | sed -E 's/^[0-9a-f]* //' |
  sed -n 's/^[^A] //p' | sort -u >"$work/all"
grep -v 'M_IsConvex\|M_ComputeConvexHull' "$work/all" >"$work/exported"
grep -o '^[a-z]* M_IsConvex\|^[a-z]* M_ComputeConvexHull' "$work/all" | uniq -c | sed 's/^ *//' >"$work/templates"
declared_templates | diff - "$work/templates" || { echo "< declared, > exported"; exit 1; }

[ "$(wc -l <"$work/declared")" -gt 60 ] || { echo "the headers could not be read"; exit 1; }
diff "$work/declared" "$work/exported" || { echo "< declared, > exported"; exit 1; }
readelf -d "$library" | grep -q 'SONAME.*\[libM\.so\.1\]' || { echo "the SONAME is not libM.so.1"; exit 1; }
