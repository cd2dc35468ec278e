#!/usr/bin/env bash
# Installs what running the tests on other platforms needs, from Debian:
# qemu-user and the arm64 C library (multiarch, with its iconv modules) for
# Linux arm64, wine64 for Windows x86-64, and GoogleTest's sources, which the
# cross builds compile for each target. Does nothing when all are present.
set -euo pipefail

sudo=()
[ "$(id -u)" -eq 0 ] || sudo=(sudo)
if ! dpkg --print-foreign-architectures | grep -qx arm64; then
  "${sudo[@]}" dpkg --add-architecture arm64
fi
need=()
for pkg in qemu-user libc6:arm64 wine64 googletest lld-14 llvm-14; do
  dpkg -s "$pkg" >/dev/null 2>&1 || need+=("$pkg")
done
command -v npm >/dev/null 2>&1 || need+=(npm)
if [ ${#need[@]} -gt 0 ]; then
  "${sudo[@]}" apt-get update -qq
  "${sudo[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${need[@]}"
fi
