#!/bin/sh
# Installs what is missing, builds the viewer as one page, build/viewer.html, and opens it where there is a desktop.
set -eu
cd "$(dirname "$0")"
. scripts/common.sh
. scripts/web.sh

build_viewer
echo "build/viewer.html ($(($(wc -c <build/viewer.html) / 1024)) KiB): open it in any browser, or send it to somebody."
if [ -n "${DISPLAY-}${WAYLAND_DISPLAY-}" ] && command -v xdg-open >/dev/null; then
  xdg-open build/viewer.html
fi
