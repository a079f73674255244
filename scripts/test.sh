#!/usr/bin/env bash
# Installs what is missing, then configures, builds and runs every test in each
# preset: the optimised build, the ASan+UBSan build, the ThreadSanitizer build
# (only the tests that start threads), the fuzz build (the fuzz targets only:
# their corpora, then a few seconds of fuzzing each) and the 64-bit Arm cross
# build under qemu. Pass preset names to run only those.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/setup.sh

presets=("$@")
((${#presets[@]})) || presets=(default asan tsan fuzz aarch64)

jobs=$(nproc)
for preset in "${presets[@]}"; do
  echo "== $preset"
  start=$SECONDS
  cmake --preset "$preset" >/dev/null
  cmake --build --preset "$preset" -j "$jobs"
  ctest --preset "$preset" -j "$jobs"
  echo "== $preset: $((SECONDS - start)) s"
done
