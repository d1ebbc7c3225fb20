#!/bin/sh
# Builds the API reference in build/docs/html; a public name without a comment is an error.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages doxygen perl
mkdir -p build/docs
# Doxygen does not notice when its filter fails.
for header in include/*.h host/include/*.h; do perl docs/filter.pl "$header" >/dev/null; done
doxygen docs/Doxyfile >build/docs/doxygen.log 2>&1 || {
  cat build/docs/doxygen.log build/docs/warnings.log
  exit 1
}
echo "The reference is in build/docs/html/index.html."
