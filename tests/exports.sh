#!/bin/sh
# Compares the names that libM exports, with their version nodes, with those that its headers declare.
# Usage: exports.sh LIBRARY SOURCE_FOLDER
set -eu
source=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# The functions and objects that headers declare at the beginning of a line, in C; M_Ops.h has none.
declared() {
  sed -nE -e '/EqualMatrixWithinEpsilon|GetMatrix3DeterminantPlus|TransformPoint3DtoScreen/d' \
    -e '/IsFloatPointInConcavePoly|GetMinimumEdgeDistance|IsConvex|ComputeConvexHull/d' \
    -e 's/^[A-Za-z_][A-Za-z0-9_ *&]*[ *&](Mp?_[A-Za-z0-9_]+)\(.*/\1/p' \
    -e 's/^extern [A-Za-z0-9_ ]*[ *](Mp?_[A-Za-z0-9_]+)(\[[0-9]+\])?;.*/\1/p' "$@"
}
# Members and overloads are listed one by one in the linker's script, as they are written in C++;
# instances of templates over iterators have the standard library's names: how many of each.
{
  declared "$source"/include/M_[!O]*.h | sed 's/$/@@M_1/'
  declared "$source"/src/pkg/M/indep/Mp_*.h | sed 's/$/@@M_PRIVATE/'
  sed -nE 's/^ +"(.+)";$/\1@@M_1/p' "$source"/src/pkg/M/linux/M.map
  printf '%s\n' '6 bool M_IsConvex' '8 void M_ComputeConvexHull'
} | sort >"$work/declared"

template='^[a-z]* (M_IsConvex|M_ComputeConvexHull)'
nm -DC --defined-only --with-symbol-versions "$1" | sed -nE 's/^[0-9a-f]* [^A] //p' | sort -u >"$work/all"
{
  grep -vE "$template" "$work/all"
  grep -oE "$template" "$work/all" | uniq -c | sed 's/^ *//'
} | sort | diff "$work/declared" - || { echo "< declared, > exported"; exit 1; }
readelf -d "$1" | grep -q 'SONAME.*\[libM\.so\.1\]' || { echo "the SONAME is not libM.so.1"; exit 1; }
