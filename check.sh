#!/bin/sh
# Installs what is missing, builds, and runs every test.
# --all: also with clang++ and clang-tidy, with the sanitizers, as a static library with baseline vectors
# only, and unoptimised; makes the reference, tries the Python package and the viewer, fuzzes for a moment, and tries the
# packages.
# --everywhere: instead, whether all builds on all processors give the same bits.
# --fuzz SECONDS: instead, the fuzz targets, each for so long.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

presets=release
case ${1-} in
  '') ;;
  --all) presets='release clang asan tsan static debug' ;;
  --everywhere)
    . scripts/everywhere.sh
    everywhere
    exit
    ;;
  --fuzz)
    case ${2-} in
      '' | 0* | *[!0-9]*)
        echo 'check.sh --fuzz takes a number of seconds'
        exit 2
        ;;
    esac
    . scripts/fuzz.sh
    fuzz "$2"
    exit
    ;;
  *)
    echo "usage: check.sh [--all | --everywhere | --fuzz SECONDS]"
    exit 2
    ;;
esac

need_packages g++ cmake ninja-build gettext nlohmann-json3-dev libcli11-dev libgtest-dev librapidcheck-dev libbenchmark-dev pkg-config \
  binutils clang clang-format clang-tidy abigail-tools gdb perl python3 locales

echo "Checking the format ..."
find include src host comp examples tests bench fuzz python web -name '*.h' -o -name '*.cpp' | xargs clang-format --dry-run -Werror

for preset in $presets; do
  build_preset "$preset"
  echo "Testing ($preset) ..."
  ctest --preset "$preset" --progress
  if [ "$preset" = clang ]; then
    echo "Reading with clang-tidy ..."
    find src host -name '*.cpp' | xargs -n 1 -P 2 \
      clang-tidy --quiet --warnings-as-errors='*' -p "build/$preset" 2>/dev/null
    # Following every path through a reader of JSON takes longer than all else.
    find comp examples/digest -name '*.cpp' | xargs -n 1 -P 2 \
      clang-tidy --quiet --warnings-as-errors='*' --checks='-clang-analyzer-*' -p "build/$preset" 2>/dev/null
  fi
done

if [ "$presets" != release ]; then
  ./docs.sh
  . scripts/python.sh
  python_package
  . scripts/web.sh
  try_viewer
  . scripts/fuzz.sh
  fuzz 8
  ./package.sh --try
fi
