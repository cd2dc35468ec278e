#!/usr/bin/env bash
# Builds the plug-in for every desktop target, the help pages and the
# package build-cross/StringGlobalsZUL.<ext>, then inspects every artifact.
# The first run installs the pinned zig toolchain from npm into
# build-cross/toolchain. Extra arguments go to the configure step, e.g.
#   tools/package.sh -DZUL_PACKAGE_EXTENSION=<the host's plug-in extension>
set -euo pipefail
cd "$(dirname "$0")/.."
cmake -S cross -B build-cross "$@"
cmake --build build-cross -j2
ctest --test-dir build-cross --output-on-failure
