#!/bin/sh
# Installs the library, moves the installed tree, and uses it as others would: by CMake and by
# pkg-config.
# Usage: install.sh BUILD_FOLDER SOURCE_FOLDER COMPILER LIBDIR
set -eu
build=$1
source=$2
compiler=$3
libdir=$4
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
flags='-std=c++17 -Wall -Wextra -Wpedantic -Werror'

fail() {
  echo "$*"
  exit 1
}

expect() {
  [ "$2" = "$1" ] || fail "expected: $1
got: $2"
}

cmake --install "$build" --prefix "$work/first" >/dev/null
mv "$work/first" "$work/moved"
export CMAKE_GENERATOR=Ninja
export PKG_CONFIG_PATH="$work/moved/$libdir/pkgconfig"
if [ -e "$work/moved/$libdir/libM.so" ]; then
  (cd "$work/moved" && find . -type f -o -type l) | sed "s:^\./$libdir:lib:; s:^\./::; s:MTargets-[a-z]*:MTargets-CONFIG:; s:\.so\.[0-9]\+\.[0-9.]*[0-9]:.so.VERSION:" | sort >"$work/files"
  [ -e "$work/moved/share/locale" ] || sed '/^share.locale/d' "$source/tests/installed_files.txt" >"$work/expected"
  [ -e "$work/expected" ] || cp "$source/tests/installed_files.txt" "$work/expected"
  diff "$work/expected" "$work/files" || fail "< should be installed, > is installed"
  [ "$(uname)" = Darwin ] || readelf -d "$work/moved/$libdir/libM.so" | grep -q 'RUNPATH.*\[\$ORIGIN\]' ||
    fail "libM.so looks for the host elsewhere than beside itself"
fi
! grep -rIlF -e "$source" -e "$work/first" "$work/moved" || fail "an installed file names a folder of the build"

plain='5/6
110010 overflow in ratio addition.'

cmake -S "$source/examples/minimal" -B "$work/cmake" -DCMAKE_PREFIX_PATH="$work/moved" \
  -DCMAKE_CXX_COMPILER="$compiler" -DCMAKE_CXX_FLAGS="$flags" >/dev/null
cmake --build "$work/cmake" >/dev/null
expect "$plain" "$("$work/cmake/minimal")"

"$compiler" $flags "$source/examples/minimal/main.cpp" $(pkg-config --cflags --libs --static M) \
  -Wl,-rpath,"$(pkg-config --variable=libdir M)" -o "$work/by_pkg_config"
expect "$plain" "$("$work/by_pkg_config")"
