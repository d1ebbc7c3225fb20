#!/bin/sh
# Installs what is missing, builds, and runs every test.
# --all: also with clang++, with the sanitizers, as a static library and unoptimised.
set -eu
cd "$(dirname "$0")"
. scripts/packages.sh

presets=release
case ${1-} in
  '') ;;
  --all) presets='release clang asan tsan static debug' ;;
  *)
    echo "usage: check.sh [--all]"
    exit 2
    ;;
esac

need_packages g++ cmake ninja-build gettext nlohmann-json3-dev libgtest-dev libbenchmark-dev pkg-config \
  binutils clang clang-format

echo "Checking the format ..."
find include src host examples tests bench -name '*.h' -o -name '*.cpp' | xargs clang-format --dry-run -Werror

for preset in $presets; do
  build_preset "$preset"
  echo "Testing ($preset) ..."
  ctest --preset "$preset" --progress
done
