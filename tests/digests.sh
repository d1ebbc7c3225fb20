#!/bin/sh
# Whether the library gives the results whose digests are recorded, in many threads at once, too. With LIBRARY also
# whether the program that makes the digests calls every public function that the library exports.
# Usage: digests.sh PROGRAM RECORDED_DIGESTS [LIBRARY]
set -eu
program=$1
recorded=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

LC_ALL=C "$program" --threads 4 --compare "$recorded" >/dev/null

[ $# -gt 2 ] || exit 0
nm -DC --defined-only --with-symbol-versions "$3" | sed -nE 's/^[0-9a-f]* [A-Z] (.*)@@M_1$/\1/p' |
  grep -vE '^(M_1|typeinfo.*|vtable.*)$' | sort -u >"$work/exported"
nm -DC --undefined-only --with-symbol-versions "$program" | sed -nE 's/^ +U (.*)@M_1$/\1/p' | sort -u >"$work/called"
# Inline members, which a client has of its own, and what hands the library's life over.
cat >"$work/others" <<END
M_GetGlobals
M_Matrix3::AssignFromByDroppingZ(M_Matrix4 const&)
M_Matrix3::Transpose()
M_Matrix4::Transpose()
M_SetGlobals
END
comm -23 "$work/exported" "$work/called" | diff "$work/others" - || { echo "> exported, but in no digest"; exit 1; }
