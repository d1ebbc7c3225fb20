#!/bin/sh
# Installs what is missing, builds, and prints the sheets of the samples and draws three.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh

need_packages g++ cmake ninja-build gettext nlohmann-json3-dev libcli11-dev libgtest-dev librapidcheck-dev libbenchmark-dev pkg-config
build_preset release --target comp M_catalogues comp_catalogues
echo
build/release/bin/comp comp/samples/film.json comp/samples/broadcast.json \
  comp/samples/sound.json comp/samples/stage.json comp/samples/space.json comp/samples/harbour.otio

for sample in stage space; do
  build/release/bin/comp --svg build/$sample.svg --grid 24 comp/samples/$sample.json 2>/dev/null
done
build/release/bin/comp --svg build/harbour.svg --drop-frame comp/samples/harbour.otio
echo
echo "Drawn: build/stage.svg, build/space.svg, build/harbour.svg"
