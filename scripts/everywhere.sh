# Sourced by check.sh: whether every compiler, optimisation, vector path and kind of library gives the same bits,
# and other processors do.

# Builds the digest program in build/everywhere/NAME and compares with what is recorded.
#   everywhere_one NAME COMPILER FLAGS RUNNER CMAKE-ARGUMENTS...
everywhere_one() {
  name=$1
  compiler=$2
  flags=$3
  runner=$4
  shift 4
  folder=build/everywhere/$name
  log=build/everywhere/$name.log
  mkdir -p build/everywhere
  {
    cmake -S . -B "$folder" -G Ninja -DCMAKE_BUILD_TYPE=None -DCMAKE_CXX_COMPILER="$compiler" \
      -DCMAKE_CXX_FLAGS="$flags" -DM_BUILD_COMP=OFF -DM_BUILD_TESTS=OFF -DM_BUILD_BENCH=OFF "$@" &&
      cmake --build "$folder" -j 2
  } >"$log" 2>&1 || {
    cat "$log"
    echo "The build of $name failed."
    return 1
  }
  program=$folder/bin/digest
  [ -e "$program" ] || program=$program.js
  if LC_ALL=C $runner "$program" --compare examples/digest/expected.txt >"$folder.digests" 2>"$folder.differences"; then
    result='the same'
  else
    result=DIFFERENT
    everywhere_failures=$((everywhere_failures + 1))
  fi
  # With one C library, what goes through it is the same, too.
  if [ -z "$runner" ]; then
    [ -e build/everywhere/native.digests ] || cp "$folder.digests" build/everywhere/native.digests
    cmp -s "$folder.digests" build/everywhere/native.digests || {
      result=DIFFERENT
      everywhere_failures=$((everywhere_failures + 1))
    }
  fi
  libm=$(grep -c 'as it may' "$folder.differences" || true)
  printf '%-32s %s' "$name" "$result"
  if [ "$libm" -gt 0 ]; then printf ', but for %s libm functions' "$libm"; fi
  echo
  grep -v 'as it may' "$folder.differences" || true
}

everywhere() {
  [ "$(uname -m)" = x86_64 ] || { echo 'The other processors are emulated on 64-bit x86.'; return 2; }
  need_packages g++ clang cmake ninja-build gettext
  everywhere_failures=0
  rm -f build/everywhere/native.digests
  for compiler in g++ clang++; do
    for optimised in -O0 -O2 -O3; do
      flags=$optimised
      [ $optimised != -O3 ] || flags='-O3 -march=native'
      for shared in ON OFF; do
        for baseline in OFF ON; do
          name=$compiler$optimised
          [ $optimised != -O3 ] || name=$name-native
          [ $shared = ON ] && name=$name-shared || name=$name-static
          [ $baseline = ON ] && name=$name-baseline || name=$name-widest
          everywhere_one "$name" $compiler "$flags" '' \
            -DBUILD_SHARED_LIBS=$shared -DM_BASELINE_VECTORS=$baseline
        done
      done
    done
  done
  need_packages qemu-user g++-aarch64-linux-gnu g++-s390x-linux-gnu g++-i686-linux-gnu
  for optimised in -O0 -O2 -O3; do
    for machine in aarch64 s390x i686; do
      emulator=qemu-$machine
      [ $machine != i686 ] || emulator=qemu-i386
      everywhere_one $machine$optimised $machine-linux-gnu-g++ "$optimised" "$emulator -L /usr/$machine-linux-gnu" \
        -DCMAKE_SYSTEM_NAME=Linux -DCMAKE_SYSTEM_PROCESSOR=$machine
    done
  done
  need_packages emscripten node-acorn nodejs
  for optimised in -O0 -O2 '-O3 -msimd128'; do
    everywhere_one "wasm${optimised% *}" em++ "$optimised" node -DCMAKE_TOOLCHAIN_FILE=cmake/Emscripten.cmake
  done
  if [ "$everywhere_failures" -gt 0 ]; then
    echo "$everywhere_failures builds give other bits."
    return 1
  fi
}
