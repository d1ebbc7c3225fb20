#!/bin/sh
# Builds the API reference in build/docs/html; a public name without a comment is an error.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages doxygen doxygen-awesome-css
rm -rf build/docs
mkdir -p build/docs
doxygen docs/Doxyfile >build/docs/doxygen.log 2>&1 || {
  cat build/docs/doxygen.log build/docs/warnings.log
  exit 1
}
# Doxygen does not miss the comment of an enumerator, nor a function that it has not understood.
{
  sed -nE 's/^ +(M_[A-Za-z0-9]+);$/\1/p' src/pkg/M/linux/M.map
  sed -nE 's/^  (M_[A-Z0-9_]+) = .*/\1/p' include/*.h
} | while read -r name; do
  grep -q "<name>$name</name>\|<enumvalue[^>]*>$name<" build/docs/M.tag || { echo "$name is not in the reference"; exit 1; }
done
echo "The reference is in build/docs/html/index.html."
