# Sourced by the commands that build or try the viewer.

build_viewer() {
  need_packages emscripten node-acorn nodejs esbuild cmake ninja-build gettext nlohmann-json3-dev
  build_preset web --target viewer
  esbuild web/main.js --bundle --minify --format=esm --platform=browser --target=chrome110,firefox115,safari16 \
    --alias:viewer=./build/web/bin/viewer.js --loader:.json=text --loader:.otio=text --loader:.txt=text \
    --log-level=warning --outfile=build/web/main.js
  node web/bundle.mjs web/index.html build/web/main.js build/viewer.html
}
