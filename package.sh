#!/bin/sh
# Makes the Debian packages in build/packages and has lintian look at them.
# --try: as root, also installs them, builds and runs clients with what is installed, and removes them again.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages g++ cmake ninja-build gettext pkg-config debhelper lintian doxygen doxygen-awesome-css dh-python \
  pybind11-dev python3-dev python3-numpy libcli11-dev nlohmann-json3-dev
packages=build/packages
rm -rf $packages
mkdir -p $packages/source
echo "Building the packages ..."
git ls-files -z | xargs -0 cp --parents -t $packages/source
cp -r src/pkg/M/linux/debian $packages/source
(cd $packages/source && dpkg-buildpackage -b -us -uc) >$packages/log 2>&1 || {
  cat $packages/log
  echo "The packages cannot be built."
  exit 1
}
rm -rf $packages/source
ls $packages/*.deb
lintian --allow-root --fail-on error,warning $packages/*.changes

[ "${1-}" = --try ] || exit 0
need_packages gdb
work=$(mktemp -d)
export CMAKE_GENERATOR=Ninja
names=$(for package in $packages/*.deb; do dpkg-deb --field "$package" Package; done)
remove() {
  # The list is meant to be split into words.
  # shellcheck disable=SC2086
  dpkg --purge $names >>"$work/log" 2>&1
}
fail() {
  cat "$work/log"
  echo "$*"
  exit 1
}
trap 'remove; rm -rf "$work"' EXIT
dpkg --install $packages/*.deb >"$work/log" 2>&1 || fail "The packages cannot be installed."
# shellcheck disable=SC2086
dpkg -L $names | sort -u >"$work/files"
echo "A client by CMake:"
{ cmake -S examples/digest -B "$work/digest" && cmake --build "$work/digest"; } >"$work/log" 2>&1 || fail "It cannot be built."
"$work/digest/digest" --compare examples/digest/expected.txt >"$work/log" 2>&1 || fail "It does not give the recorded digests."
echo "the recorded digests"
echo "A client by pkg-config:"
sed -nE 's/^.*;  +\/\/ -> (.*)$/\1/p' examples/reference/ratios.cpp >"$work/expected"
# shellcheck disable=SC2046
g++ -g -std=c++17 examples/reference/ratios.cpp $(pkg-config --cflags --libs M) -o "$work/ratios" >"$work/log" 2>&1 ||
  fail "It cannot be built."
"$work/ratios" >"$work/printed" 2>"$work/log" || fail "It fails."
cat "$work/printed"
diff "$work/expected" "$work/printed" >"$work/log" || fail "It prints something else."
echo "In gdb, which loads the printers by itself, and knows the library's types:"
gdb -nx -batch -ex 'break M_AddRatio' -ex run -ex up -ex 'print frame' -ex 'print sizeof(M_TransformPoly3D)' "$work/ratios" >"$work/log" 2>&1 || true
grep -F '$1 = 1001/30000 = ' "$work/log" || fail "gdb does not show a ratio as one writes it."
grep -F '$2 = 240' "$work/log" || fail "gdb does not know M_TransformPoly3D."
[ -s /usr/share/doc/libm-math-dev/html/index.html ] && [ -s /usr/share/doc/libm-math-dev/README.md.gz ] || fail "The documents are not there."
echo "In Python:"
(cd "$work" && /usr/bin/python3 -c 'import m_math; print(m_math.frame_at(7200, "30000/1001"), m_math.__file__)') || fail "m_math does not work."
echo "The program:"
/usr/bin/comp --version || fail "comp does not work."
/usr/bin/comp --json comp/samples/harbour.otio >"$work/log" 2>&1 || fail "comp does not read a timeline."
remove || fail "The packages cannot be removed."
# What is left are folders that others have files in.
while read -r file; do [ ! -f "$file" ] || fail "$file is left."; done <"$work/files"
echo "Removed without a trace."
