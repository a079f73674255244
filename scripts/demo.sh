#!/usr/bin/env bash
# The demo: installs what is missing, builds the renderer in the default
# preset and renders the gallery of every effect to out/gallery.png.
# Extra arguments go to glimmer-render (e.g. --text "Hello" --font my.ttf).
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/setup.sh

build=${GLIMMER_BUILD_DIR:-build/default}
cmake --preset default -B "$build" >/dev/null
cmake --build "$build" -j "$(nproc)" --target glimmer-render
mkdir -p out
"$build/tools/glimmer-render/glimmer-render" --gallery -o out/gallery.png "$@"
