#!/bin/sh
# Makes the Debian packages in build/packages and has lintian look at them.
# --try: as root, also installs them, builds and runs clients with what is installed, and removes them again.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages g++ cmake ninja-build gettext pkg-config file dpkg-dev lintian
build_preset package
rm -rf build/packages
gzip -9nc src/pkg/M/linux/changelog >build/package/changelog.gz
(cd build/package && cpack -B ../packages) >build/cpack.log 2>&1 || { cat build/cpack.log; exit 1; }
ls build/packages/*.deb
lintian --fail-on error build/packages/*.deb

[ "${1-}" = --try ] || exit 0
need_packages gdb
work=$(mktemp -d)
export CMAKE_GENERATOR=Ninja
remove() {
  dpkg --purge libm-math-dev libm-math1 >/dev/null 2>&1
  rm -rf "$work"
}
trap remove EXIT
dpkg --install build/packages/*.deb >/dev/null
dpkg -L libm-math1 libm-math-dev | sort -u >"$work/files"
echo "A client by CMake:"
cmake -S examples/digest -B "$work/digest" >/dev/null
cmake --build "$work/digest" >/dev/null
"$work/digest/digest" --compare examples/digest/expected.txt >/dev/null
echo "the recorded digests"
echo "A client by pkg-config:"
# shellcheck disable=SC2046
g++ -g -std=c++17 examples/reference/ratios.cpp $(pkg-config --cflags --libs M) -o "$work/ratios" | tee "$work/printed"
sed -nE 's/^.*;  +\/\/ -> (.*)$/\1/p' examples/reference/ratios.cpp | diff - "$work/printed"
"$work/ratios"
echo "In gdb, which loads the printers by itself:"
gdb -nx -batch -ex 'break M_AddRatio' -ex run -ex up -ex 'print frame' "$work/ratios" 2>/dev/null | grep -F '$1 = 1001/30000 = '
dpkg --purge libm-math-dev libm-math1 >/dev/null
# What is left are folders that others have files in.
while read -r file; do [ ! -f "$file" ] || { echo "$file is left"; exit 1; }; done <"$work/files"
echo "Removed without a trace."
