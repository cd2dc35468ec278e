#!/usr/bin/env bash
# Fails when a tracked C++ file differs from the repository's .clang-format.
# Uses clang-format 14 (Debian 12's), the version the tree is formatted with.
set -euo pipefail
cd "$(dirname "$0")/.."
fmt=$(command -v clang-format-14 || command -v clang-format)
git ls-files -z '*.cpp' '*.h' | xargs -0 "$fmt" --dry-run --Werror
echo "format: every C++ file matches .clang-format"
