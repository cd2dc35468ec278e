#!/usr/bin/env bash
# Cross compiler driver: zig's bundled clang for one target, called by CMake
# as a plain C/C++ compiler through a generated two-line wrapper:
#   zig-cxx.sh <target> <cc|c++> <compiler arguments...>
# Environment: ZUL_ZIG (the zig binary), ZIG_GLOBAL_CACHE_DIR (in the build tree).
# Compiling goes straight to zig. Linking the shared library is where zig's
# own linker falls short (no exported-symbols list on Mach-O, libunwind's
# exports on MinGW), so for those targets zig only links once to name its
# runtime archives, and the final link is redone with one export.
set -euo pipefail
target=$1 lang=$2
shift 2
zig=${ZUL_ZIG:?ZUL_ZIG must name the zig binary}
zig_lib=$(dirname "$zig")/lib
libc_inc=$zig_lib/libc/include
export_name=REALPluginMain

case $target in
  mac-x86_64) triple=x86_64-macos.10.13 sdk_triple=x86_64-macos.11.0 arch=x86_64 min_os=10.13 ;;
  mac-arm64) triple=aarch64-macos.11.0 sdk_triple=aarch64-macos.11.0 arch=arm64 min_os=11.0 ;;
  win-x86_64) triple=x86_64-windows-gnu ;;
  win-arm64) triple=aarch64-windows-gnu ;;
  linux-x86_64) triple=x86_64-linux-gnu.2.17 ;;
  linux-arm64) triple=aarch64-linux-gnu.2.17 ;;
  *) echo "zig-cxx.sh: unknown target $target" >&2; exit 2 ;;
esac

# zig ships macOS headers from 11 on; a 10.13 minimum uses them with the
# older deployment target, so clang's availability checks still apply.
extra=()
if [[ $target == mac-x86_64 ]]; then
  extra=(-isystem "$libc_inc/x86_64-macos.11-none" -isystem "$libc_inc/any-macos.11-any"
         -isystem "$libc_inc/any-macos-any" -Werror=unguarded-availability-new)
fi

# Flags CMake adds for GNU toolchains that zig's driver rejects; zig always
# links its C++ runtime statically, and version scripts hide it on ELF.
args=() objects=() archives_whole=() output="" linking=0 compiling=0 whole=0
expanded=()
for arg in "$@"; do  # CMake may hand objects over in a response file
  if [[ $arg == @* && -f ${arg#@} ]]; then
    read -r -a words <"${arg#@}"
    expanded+=("${words[@]}")
  else
    expanded+=("$arg")
  fi
done
set -- "${expanded[@]}"
while [[ $# -gt 0 ]]; do
  if [[ $1 == -Xlinker && $# -gt 1 ]]; then  # zig takes linker flags as -Wl, only
    shift
    set -- "-Wl,$1" "${@:2}"
  fi
  case $1 in
    -static-libstdc++|-static-libgcc|-Wl,--exclude-libs,ALL|-Wl,-headerpad_max_install_names|-Wl,-v) ;;
    -Wl,--exclude-libs) [[ ${2:-} == -Xlinker ]] && shift; shift ;;
    -shared|-dynamiclib) linking=1; args+=(-shared) ;;
    -install_name|-compatibility_version|-current_version) shift ;;
    -Wl,-install_name,*|-Wl,-compatibility_version,*|-Wl,-current_version,*) ;;
    -Wl,--major-image-version,*|-Wl,--minor-image-version,*|-Wl,--out-implib,*) ;;
    -o) output=$2; args+=(-o "$2"); shift ;;
    -c) compiling=1; args+=(-c) ;;
    *.o|*.obj) objects+=("$1"); args+=("$1") ;;
    # On Windows CMake hands the objects over as one archive to be linked whole.
    -Wl,--whole-archive) whole=1; args+=("$1") ;;
    -Wl,--no-whole-archive) whole=0; args+=("$1") ;;
    *.a) [[ $whole == 1 ]] && archives_whole+=("$(realpath "$1")"); args+=("$1") ;;
    *) args+=("$1") ;;
  esac
  shift
done

if [[ $compiling == 1 ]]; then
  exec "$zig" "$lang" -target "$triple" "${extra[@]}" "${args[@]}"
fi
if [[ $linking == 0 || $target == linux-* ]]; then
  # Executables (CMake's own probes) and ELF libraries link with zig itself;
  # its runtime for macOS is built against the 11.0 headers.
  # -O2 selects zig's optimised runtime build, the one the library links, so
  # the runtime is built once per target rather than once per mode.
  [[ $linking == 1 ]] && args+=(-s)
  exec "$zig" "$lang" -target "${sdk_triple:-$triple}" -O2 "${args[@]}"
fi

# Ask zig for its runtime archives (and, on Windows, its whole link line).
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
runtime_triple=${sdk_triple:-$triple}
if ! "$zig" build-lib -dynamic -O ReleaseFast -target "$runtime_triple" -lc++ -fstrip \
       "${objects[@]}" --verbose-link -femit-bin="$work/probe" >"$work/zig.log" 2>&1; then
  cat "$work/zig.log" >&2
  exit 1
fi
line=$(tail -n 1 "$work/zig.log")

case $target in
  mac-*)
    archives=()
    for word in $line; do
      case $word in */libc++.a|*/libc++abi.a|*/libcompiler_rt.a) archives+=("$word") ;; esac
    done
    [[ ${#archives[@]} == 3 ]] || { echo "zig-cxx.sh: runtime archives not found in: $line" >&2; exit 1; }
    echo "_$export_name" >"$work/exports.txt"
    if [[ $target == mac-x86_64 ]]; then
      "$zig" cc -target "$triple" "${extra[@]}" -O2 -c "$(dirname "$0")/macos_compat.c" -o "$work/compat.o"
      objects+=("$work/compat.o")
    fi
    force_load=()
    for archive in "${archives_whole[@]}"; do force_load+=(-force_load "$archive"); done
    # Objects from zig's runtime say 11.0; the library's own code was
    # compiled for min_os, so those notices are expected and dropped.
    ld64.lld-14 -dylib -arch "$arch" -platform_version macos "$min_os" 11.0 \
      -install_name "@rpath/$(basename "$output")" -exported_symbols_list "$work/exports.txt" \
      -dead_strip -o "$output" "${objects[@]}" "${force_load[@]}" "${archives[@]}" \
      "$zig_lib/libc/darwin/libSystem.11.tbd" 2> >(grep -v 'which is newer than target minimum' >&2)
    ;;
  win-*)
    # libunwind's objects carry export directives for its entry points;
    # a copy without them leaves the one dllexport of the library.
    new=()
    for word in $line; do
      case $word in
        */unwind.lib) llvm-objcopy-14 --remove-section=.drectve "$word" "$work/unwind.lib"
                      new+=("$work/unwind.lib") ;;
        -DEBUG|-PDB:*|-PDBALTPATH:*|-IMPLIB:*) ;;
        -OUT:*) new+=("-OUT:$output") ;;
        *) new+=("$word") ;;
      esac
    done
    for archive in "${archives_whole[@]}"; do new+=("-WHOLEARCHIVE:$archive"); done
    "$zig" "${new[@]}"
    ;;
esac
