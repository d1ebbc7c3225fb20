# Sourced by check.sh: the fuzz targets, two at a time. What they find besides stays in build/fuzz/corpus.

#   fuzz SECONDS
fuzz() {
  need_packages clang libclang-rt-dev cmake ninja-build gettext nlohmann-json3-dev libcli11-dev
  build_preset fuzz
  mkdir -p build/fuzz/found
  export seconds="$1"
  for source in fuzz/*.cpp; do basename "$source" .cpp; done | xargs -P 2 -I NAME sh -c '
    mkdir -p build/fuzz/corpus/NAME
    seeds=fuzz/corpus/NAME
    if [ NAME = composition ]; then
      seeds=
      cp comp/samples/*.json comp/samples/*.otio build/fuzz/corpus/NAME
    fi
    if build/fuzz/bin/fuzz_NAME -max_total_time="$seconds" -timeout=20 -max_len=4096 -print_final_stats=1 \
      -artifact_prefix=build/fuzz/found/NAME- build/fuzz/corpus/NAME $seeds >build/fuzz/NAME.log 2>&1; then
      echo "NAME: $(sed -n "s/^stat::number_of_executed_units: *//p" build/fuzz/NAME.log) inputs, nothing found"
    else
      tail -n 25 build/fuzz/NAME.log
      echo "NAME: something was found"
      exit 1
    fi'
}
