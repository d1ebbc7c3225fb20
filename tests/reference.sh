#!/bin/sh
# Compiles and runs the examples of the reference: each prints what its comments with an arrow say, and returns 0.
# Usage: reference.sh SOURCE_FOLDER LIBRARY_FOLDER COMPILER
set -eu
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
flags='-std=c++20 -Wall -Wextra -Wpedantic -Werror'
# What the headers need of the standard library is read once for all of them.
printf '#include <%s>\n' algorithm cstddef cstdint exception functional iostream iterator optional span utility vector >"$work/std.h"
"$3" $flags -x c++-header "$work/std.h" -o "$work/std.h.gch"
for example in "$1"/examples/reference/*.cpp; do
  "$3" $flags -include "$work/std.h" -isystem "$1/include" -isystem "$1/host/include" "$example" -o "$work/example" \
    -L"$2" -Wl,-rpath,"$2" -lM -lMHost
  sed -nE 's/^.*;  +\/\/ -> (.*)$/\1/p' "$example" >"$work/expected"
  "$work/example" >"$work/printed" 2>/dev/null || { echo "$example fails"; exit 1; }
  diff "$work/expected" "$work/printed" || { echo "$example: < expected, > printed"; failed=1; }
done
[ -z "${failed-}" ]
