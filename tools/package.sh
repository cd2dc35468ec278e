#!/usr/bin/env bash
# Builds the plug-in for every desktop target, the help pages and the
# package build-cross/StringGlobalsZUL.<ext>, then inspects every artifact.
# The first run installs the pinned zig toolchain from npm into
# build-cross/toolchain. Extra arguments go to the configure step, e.g.
#   tools/package.sh -DZUL_PACKAGE_EXTENSION=<the host's plug-in extension>
set -euo pipefail
cd "$(dirname "$0")/.."

# Debian packages the cross build needs beyond a C++ machine: the Mach-O
# linker, lipo and the inspection tools of LLVM 14, and npm for the toolchain.
if command -v dpkg >/dev/null 2>&1; then
  need=()
  for pkg in lld-14 llvm-14 npm; do
    if [ "$pkg" = npm ] && command -v npm >/dev/null 2>&1; then continue; fi
    dpkg -s "$pkg" >/dev/null 2>&1 || need+=("$pkg")
  done
  if [ ${#need[@]} -gt 0 ]; then
    sudo=()
    [ "$(id -u)" -eq 0 ] || sudo=(sudo)
    "${sudo[@]}" apt-get update -qq
    "${sudo[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${need[@]}"
  fi
fi

cmake -S cross -B build-cross "$@"
cmake --build build-cross -j2
ctest --test-dir build-cross --output-on-failure
