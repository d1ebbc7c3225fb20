#!/bin/sh
# Installs the libraries that the benchmarks compare with, builds, and prints the comparisons: the
# fastest of several repetitions of each line, and ours divided by the best peer's.
# Arguments go to the benchmark programs, such as --benchmark_filter=add.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages g++ cmake ninja-build gettext nlohmann-json3-dev libcli11-dev libgtest-dev librapidcheck-dev libbenchmark-dev pkg-config \
  libboost-dev libavutil-dev libimath-dev libglm-dev libeigen3-dev libcgal-dev libpolyclipping-dev
build_preset release
for program in scalar_bench space_bench polygon_bench; do
  build/release/bin/$program "$@"
done
