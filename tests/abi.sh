#!/bin/sh
# Compares the ABI of the library, built for the debugger, with the one that is recorded, and says what changed; with
# --record records it.
# Usage: abi.sh LIBRARY SOURCE_FOLDER [--record]
set -eu
library=$1
recorded=$2/src/pkg/M/linux/M.abi
[ "$(uname -m)" = x86_64 ] && command -v abidw >/dev/null || { echo 'abidw is not there, or another processor is'; exit 77; }
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# The names of the private node are still listed, so they are taken out.
abidw --suppressions "$2/src/pkg/M/linux/M.abignore" --exported-interfaces-only --headers-dir "$2/include" \
  --headers-dir "$2/host/include" --drop-private-types --no-show-locs --no-corpus-path --no-comp-dir-path \
  --type-id-style hash --out-file "$work/all.abi" "$library"
sed "/version='M_PRIVATE'/d; s,path='$2/,path='," "$work/all.abi" >"$work/M.abi"
if [ "${3-}" = --record ]; then
  cp "$work/M.abi" "$recorded"
else
  abidiff "$recorded" "$work/M.abi"
fi
