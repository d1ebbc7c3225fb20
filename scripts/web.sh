# Sourced by the commands that build or try the viewer.

build_viewer() {
  need_packages emscripten node-acorn nodejs esbuild cmake ninja-build gettext nlohmann-json3-dev
  build_preset web --target viewer
  esbuild web/main.js --bundle --minify --format=esm --platform=browser --target=chrome110,firefox115,safari16 \
    --alias:viewer=./build/web/bin/viewer.js --loader:.json=text --loader:.otio=text --loader:.txt=text \
    --log-level=warning --outfile=build/web/main.js
  node web/bundle.mjs web/index.html build/web/main.js build/viewer.html
}

# In a real browser, beside the native program. Its pictures are in build/web/test.
try_viewer() {
  need_packages chromium
  command -v npm >/dev/null || need_packages npm
  build_viewer
  build_preset release --target comp
  echo "Testing (viewer) ..."
  mkdir -p build/web/test
  cp web/package.json build/web/test
  npm install --prefix build/web/test --no-package-lock --no-audit --no-fund --silent
  node tests/viewer_test.mjs build/viewer.html build/release/bin/comp comp/samples build/web/test
}
