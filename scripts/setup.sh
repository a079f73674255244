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
  # 64-bit Arm cross build, its tests run under emulation
  g++-aarch64-linux-gnu qemu-user
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
  "${sudo_cmd[@]}" apt-get update -qq
  "${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
fi
