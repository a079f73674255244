#!/usr/bin/env bash
# Installs every Debian package the project needs. Idempotent and quiet when
# everything is already there; prints what it installs otherwise.
set -euo pipefail

packages=(
  # build
  cmake ninja-build g++ ccache pkg-config
  # tests and benchmarks (GoogleTest is built from its source package so the
  # cross build gets an arm64 copy of it too)
  googletest libbenchmark-dev
  # the comparison benchmark (bench/compare_bench.cpp) and the SIMD row kernels
  libass-dev libhwy-dev
  # 64-bit Arm cross build, its tests run under emulation
  g++-aarch64-linux-gnu qemu-user
  # text stack (shaping, glyph coverage, the system's font list) and real fonts for its tests
  libharfbuzz-dev libfreetype-dev libfontconfig-dev fonts-dejavu-core fonts-noto-core fonts-noto-cjk
  fonts-noto-color-emoji
  # the Java bridge: JNI headers, javac and the JVM its tests run on
  openjdk-17-jdk-headless
  # the same libraries for the Arm build, installed beside the native ones
  libharfbuzz-dev:arm64 libfreetype-dev:arm64 libfontconfig-dev:arm64
  # the command-line renderer: PNG files, line breaking, JSON effect files
  libpng-dev libicu-dev nlohmann-json3-dev libpng-dev:arm64 libicu-dev:arm64
  # the thread-sanitizer and fuzz builds (clang with its sanitizer and libFuzzer
  # runtimes) and the memcheck runs of the renderer
  clang libclang-rt-14-dev valgrind
)

missing=()
for p in "${packages[@]}"; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed"; then
    missing+=("$p")
  fi
done

if ((${#missing[@]})); then
  echo "setup: installing ${missing[*]}"
  export DEBIAN_FRONTEND=noninteractive
  sudo_cmd=()
  [ "$(id -u)" -eq 0 ] || sudo_cmd=(sudo)
  dpkg --print-foreign-architectures | grep -qx arm64 || "${sudo_cmd[@]}" dpkg --add-architecture arm64
  "${sudo_cmd[@]}" apt-get update -qq
  "${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
fi
