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
  # The list is meant to be split into words.
  # shellcheck disable=SC2086
  {
    $as_root apt-get update -q &&
      $as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y -q -o Dpkg::Use-Pty=0 --no-install-recommends $missing ||
      echo 'E: apt-get has failed.'
  } 2>&1 | show_progress
}

# A line for each tenth of what apt-get does, and what goes wrong.
show_progress() {
  awk '/^E: |^dpkg: error/ { print; bad = 1 }
    / newly installed/ { all = 2 * ($1 + $3) }
    /^Unpacking |^Setting up / && all { part = int(10 * ++done / all); if (part > shown) { shown = part; print "  " 10 * shown "%"; fflush() } }
    END { exit bad }'
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
