# Sourced by the commands of this project.

# Installs those of the named Debian packages that are missing.
need_packages() {
  missing=
  for package in "$@"; do
    dpkg-query -W -f '${Status}' "$package" 2>/dev/null | grep -q '^install ok installed$' ||
      missing="$missing $package"
  done
  [ -n "$missing" ] || return 0
  echo "Installing from Debian:$missing"
  as_root=
  [ "$(id -u)" = 0 ] || as_root=sudo
  $as_root apt-get update -qq
  # The list is meant to be split into words.
  # shellcheck disable=SC2086
  $as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends $missing >/dev/null
}

# Configures and builds a preset, quietly unless something is wrong.
build_preset() {
  preset=$1
  shift
  echo "Building ($preset) ..."
  mkdir -p build
  log=build/$preset.log
  { cmake --preset "$preset" && cmake --build --preset "$preset" "$@"; } >"$log" 2>&1 || {
    cat "$log"
    echo "The build of $preset failed."
    return 1
  }
}
